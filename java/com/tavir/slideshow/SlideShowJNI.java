package com.tavir.slideshow;

/**
 * The native methods as the library offers them; {@link SlideShow} is the comfortable way to them.
 *
 * <p>A show is known by a handle, 0 to 99. A handle is valid from 0 to one less than the number of open
 * shows: deleting a show in front of others makes the last handle invalid until a new show has taken the
 * free place. Methods answer 0, or do nothing, for a handle that is not valid. Arrays are written without a
 * look at their length: one that is too short lets the library write beyond it. Texts are modified UTF-8 of
 * at most 255 bytes. One thread at a time.
 */
public final class SlideShowJNI {
    /** General failure: bad arguments, no memory, a file that is missing, damaged or cannot be written. */
    public static final int GENERAL_FAILURE = 0x80000001;

    /** {@link #DeleteShow} of a handle that names no show. */
    public static final int BAD_HANDLE = 0x80000002;

    /** The file is no slide show, or a new one without a picture. */
    public static final int NOT_A_SHOW = 0x80000003;

    /** The file is a slide show of another version. */
    public static final int WRONG_VERSION = 0x80000004;

    static {
        System.loadLibrary("TavirSlideShow");
    }

    private SlideShowJNI() {}

    // ---- shows ----

    /**
     * Starts a show for pictures of at most 480 x 480 pixels.
     *
     * @param path of the container, which replaces a file that is there; null for a show in memory only
     * @return the handle; 0 for a path that is empty or longer than 255 bytes; {@link #GENERAL_FAILURE}, also
     *     when 100 shows are open
     */
    public static native int CreateShow(String path);

    /**
     * Opens a container. A path that an open show records gives that show's handle again.
     *
     * @param path of the container
     * @return the handle, or {@link #GENERAL_FAILURE}, {@link #NOT_A_SHOW}, {@link #WRONG_VERSION}
     */
    public static native int OpenShow(String path);

    /**
     * Ends a show; its container stays. Also takes the handle equal to the number of open shows.
     *
     * @return 1 or {@link #BAD_HANDLE}
     */
    public static native int DeleteShow(int handle);

    /** Ends all shows and releases the table of shows. */
    public static native void DestroyShowHandler();

    // ---- adding pictures ----

    /**
     * Adds a picture at the end.
     *
     * @param imagePath 1 to 255 bytes
     * @param name that the show keeps with it, or null
     * @return 1; 0 when the show is full, or the picture cannot be read or stored
     */
    public static native int AddImageToFile(int handle, String imagePath, String name);

    /**
     * Adds a picture at the end.
     *
     * @param bytes the picture in any format that the library reads; a decoder may rework them
     * @param length how many of them
     * @param name that the show keeps with it, or null
     * @return 1 or 0
     */
    public static native int AddImageToBuffer(int handle, byte[] bytes, int length, String name);

    /** As {@link #AddImageToFile}, in front of the picture at {@code position}; the count appends. */
    public static native int InsertImageToFile(int handle, String imagePath, String name, int position);

    /** As {@link #AddImageToBuffer}, in front of the picture at {@code position}; the count appends. */
    public static native int InsertImageToBuffer(
            int handle, byte[] bytes, int length, String name, int position);

    // ---- music ----

    /**
     * Takes a music file into the show. A container receives its bytes, a show in memory notes path and size.
     *
     * @return 1; 0 when there is music already, or the file is missing, empty or too large
     */
    public static native int AddMusic(int handle, String musicPath);

    /**
     * Takes the music out again.
     *
     * @return 1; 0 when there is none, or the container cannot be written
     */
    public static native int RemoveMusic(int handle);

    // ---- removing pictures ----

    /**
     * Marks a picture of a container for removal; it can still be drawn.
     *
     * @return 1 or 0
     */
    public static native int RemoveImage(int handle, int index);

    /**
     * Takes the marked pictures out of the container. Indices change.
     *
     * @return 1, or 0 when the container cannot be written
     */
    public static native int RemoveCache(int handle);

    /**
     * The state of a picture of a container.
     *
     * @return 0 added, 2 loaded, 1 more when marked for removal; 0 for a show in memory
     */
    public static native int GetImageState(int handle, int index);

    // ---- drawing ----

    /**
     * Draws a picture at its display size.
     *
     * @param pixels receives 0xAARRGGBB values, row after row: {@link #GetBitmapWidth} x {@link
     *     #GetBitmapHeight}
     * @return 1 or 0
     */
    public static native int GetBitmap(int handle, int index, int[] pixels);

    /**
     * Draws a picture of a show in memory from its bytes, at the display size of picture {@code index}.
     *
     * @param length how many of {@code bytes}
     * @param pixels as for {@link #GetBitmap}
     * @return 1 or 0
     */
    public static native int GetBitmapToBuffer(int handle, int index, byte[] bytes, int length, int[] pixels);

    /**
     * Draws a picture fitted into {@code width} x {@code height} pixels and centred on transparent black.
     *
     * @param pixels receives width x height values
     * @return 1 or 0
     */
    public static native int GetThumbnail(int handle, int index, int width, int height, int[] pixels);

    /** Display width of a picture in pixels; 0 for a bad index. */
    public static native int GetBitmapWidth(int handle, int index);

    /** Display height of a picture in pixels; 0 for a bad index. */
    public static native int GetBitmapHeight(int handle, int index);

    // ---- facts and settings; a free place among the open shows answers -2 or true ----

    /** Number of pictures. */
    public static native int GetNumFrames(int handle);

    /** Whether the pictures come in random order. */
    public static native boolean GetShuffleMode(int handle);

    /** The transition between pictures; the application's code. */
    public static native int GetEffectType(int handle);

    /** The time between pictures, in the application's units. */
    public static native int GetInterval(int handle);

    /** The direction of the screen; its meaning is the application's. */
    public static native boolean GetScreenDirection(int handle);

    /** Whether the show starts over at its end. */
    public static native boolean GetLoopMode(int handle);

    /**
     * The path of the music.
     *
     * @param bytes at least 256; receives the path and a zero byte
     * @return the path's length in bytes, 0 without music
     */
    public static native int GetMusicFilename(int handle, byte[] bytes);

    /** Bytes of music, 0 without. */
    public static native int GetMusicSize(int handle);

    /** Sets the time between pictures and writes it into the container. */
    public static native void SetInterval(int handle, int interval);

    /** Sets the transition and writes it into the container. */
    public static native void SetEffectType(int handle, int effectType);

    /** Sets random order and writes it into the container. */
    public static native void SetShuffleMode(int handle, boolean shuffle);

    /** Sets starting over and writes it into the container. */
    public static native void SetLoopMode(int handle, boolean loop);

    /** Sets the direction of the screen and writes it into the container. */
    public static native void SetScreenDirection(int handle, boolean direction);

    /**
     * Makes the show work on the existing container at another path, and records that path in it.
     *
     * @param path 1 to 255 bytes; stays set even when the container cannot be written
     * @return 1 or 0
     */
    public static native int SetPathName(int handle, String path);

    /**
     * The path of the container, or in memory that of the picture drawn last.
     *
     * @param bytes at least 256; receives the path and a zero byte
     * @return the path's length in bytes, 0 when there is none
     */
    public static native int GetLastInformation(int handle, byte[] bytes);
}
