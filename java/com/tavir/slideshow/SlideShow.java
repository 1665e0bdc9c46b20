package com.tavir.slideshow;

/**
 * A slide show: up to 20 pictures with settings and music in one container file, or up to 1024 pictures that
 * are only noted in memory and drawn from their sources.
 *
 * <p>Every change is written to the container before its method returns. One that cannot be made throws and
 * leaves the show as it was; only for the settings the library does not tell whether they were written. One
 * thread at a time may use the shows of a process.
 */
public final class SlideShow implements AutoCloseable {
    private static final int CLOSED = -1;

    private int handle;

    private SlideShow(int handle) {
        this.handle = handle;
    }

    // ---- shows ----

    /** A new show in a container, which replaces a file at that path. */
    public static SlideShow create(String path) throws SlideShowException {
        return new SlideShow(OpenShows.create(Text.requirePath(path)));
    }

    /** A new show in memory. */
    public static SlideShow createInMemory() throws SlideShowException {
        return new SlideShow(OpenShows.create(null));
    }

    /**
     * The show in a container. A container records its own path, and an opened show works on the recorded one:
     * after a file was moved or copied, {@link #setPath} tells the show. Two objects of one container share it.
     */
    public static SlideShow open(String path) throws SlideShowException {
        return new SlideShow(OpenShows.open(Text.requirePath(path)));
    }

    /** Ends the use of the show; the container stays. */
    @Override
    public void close() {
        if (handle == CLOSED) return;
        OpenShows.close(handle);
        handle = CLOSED;
    }

    /** Works on the existing container at another path from now on, and records that path in it. */
    public void setPath(String path) throws SlideShowException {
        SlideShowException.check(
                SlideShowJNI.SetPathName(handle(), Text.requirePath(path)), "set the path " + path);
    }

    /** The path of the container; of a show in memory that of the picture drawn last, or "". */
    public String path() {
        byte[] bytes = new byte[Text.ROOM];
        return Text.decode(bytes, SlideShowJNI.GetLastInformation(handle(), bytes));
    }

    // ---- pictures ----

    /** How many pictures there are. */
    public int size() {
        return SlideShowJNI.GetNumFrames(handle());
    }

    /** Adds a picture file at the end; {@code name} may be null. */
    public void add(String imagePath, String name) throws SlideShowException {
        SlideShowException.check(
                SlideShowJNI.AddImageToFile(handle(), Text.requirePath(imagePath), name), "add " + imagePath);
    }

    /** Adds a picture given by its encoded bytes at the end; {@code name} may be null. */
    public void add(byte[] image, String name) throws SlideShowException {
        SlideShowException.check(
                SlideShowJNI.AddImageToBuffer(handle(), image.clone(), image.length, name), "add a picture");
    }

    /** Inserts a picture file in front of the picture at {@code position}. */
    public void insert(int position, String imagePath, String name) throws SlideShowException {
        requireWithin(position, size() + 1);
        SlideShowException.check(
                SlideShowJNI.InsertImageToFile(handle(), Text.requirePath(imagePath), name, position),
                "insert " + imagePath);
    }

    /** Inserts a picture given by its encoded bytes in front of the picture at {@code position}. */
    public void insert(int position, byte[] image, String name) throws SlideShowException {
        requireWithin(position, size() + 1);
        SlideShowException.check(
                SlideShowJNI.InsertImageToBuffer(handle(), image.clone(), image.length, name, position),
                "insert a picture");
    }

    /** Marks a picture of a container: the next {@link #compact} removes it. */
    public void markForRemoval(int index) throws SlideShowException {
        requireWithin(index, size());
        SlideShowException.check(SlideShowJNI.RemoveImage(handle(), index), "mark picture " + index);
    }

    public ImageState state(int index) {
        requireWithin(index, size());
        return ImageState.of(SlideShowJNI.GetImageState(handle(), index));
    }

    /** Removes the marked pictures from the container; those behind them move up. */
    public void compact() throws SlideShowException {
        SlideShowException.check(SlideShowJNI.RemoveCache(handle()), "remove the marked pictures");
    }

    // ---- drawing: 0xAARRGGBB values, row after row ----

    /** Display width of a picture in pixels. */
    public int width(int index) {
        requireWithin(index, size());
        return SlideShowJNI.GetBitmapWidth(handle(), index);
    }

    /** Display height of a picture in pixels. */
    public int height(int index) {
        requireWithin(index, size());
        return SlideShowJNI.GetBitmapHeight(handle(), index);
    }

    /** Draws a picture at its display size into at least width x height values. */
    public void draw(int index, int[] pixels) throws SlideShowException {
        requireRoom(pixels, width(index), height(index));
        SlideShowException.check(SlideShowJNI.GetBitmap(handle(), index, pixels), "draw picture " + index);
    }

    /** Draws a picture of a show in memory from its encoded bytes, at the display size of {@code index}. */
    public void draw(int index, byte[] image, int[] pixels) throws SlideShowException {
        requireRoom(pixels, width(index), height(index));
        SlideShowException.check(
                SlideShowJNI.GetBitmapToBuffer(handle(), index, image.clone(), image.length, pixels),
                "draw picture " + index + " from its bytes");
    }

    /** Draws a picture fitted into width x height pixels and centred on transparent black. */
    public void thumbnail(int index, int width, int height, int[] pixels) throws SlideShowException {
        requireWithin(index, size());
        requireRoom(pixels, width, height);
        SlideShowException.check(
                SlideShowJNI.GetThumbnail(handle(), index, width, height, pixels),
                "draw picture " + index + " at " + width + " x " + height);
    }

    // ---- music ----

    /** Takes in a music file; there is none yet. */
    public void addMusic(String musicPath) throws SlideShowException {
        SlideShowException.check(
                SlideShowJNI.AddMusic(handle(), Text.requirePath(musicPath)), "add the music " + musicPath);
    }

    /** Takes the music out. */
    public void removeMusic() throws SlideShowException {
        SlideShowException.check(SlideShowJNI.RemoveMusic(handle()), "remove the music");
    }

    /** Bytes of music, 0 without. */
    public int musicSize() {
        return SlideShowJNI.GetMusicSize(handle());
    }

    /** Where the music came from; "" without. */
    public String musicPath() {
        byte[] bytes = new byte[Text.ROOM];
        return Text.decode(bytes, SlideShowJNI.GetMusicFilename(handle(), bytes));
    }

    // ---- settings ----

    /** The time between pictures, in the application's units. */
    public int interval() {
        return SlideShowJNI.GetInterval(handle());
    }

    public void setInterval(int interval) {
        SlideShowJNI.SetInterval(handle(), interval);
    }

    /** The transition between pictures, the application's code. */
    public int effect() {
        return SlideShowJNI.GetEffectType(handle());
    }

    public void setEffect(int effect) {
        SlideShowJNI.SetEffectType(handle(), effect);
    }

    public Order order() {
        return SlideShowJNI.GetShuffleMode(handle()) ? Order.SHUFFLED : Order.SEQUENTIAL;
    }

    public void setOrder(Order order) {
        SlideShowJNI.SetShuffleMode(handle(), order == Order.SHUFFLED);
    }

    public Ending ending() {
        return SlideShowJNI.GetLoopMode(handle()) ? Ending.START_OVER : Ending.STOP;
    }

    public void setEnding(Ending ending) {
        SlideShowJNI.SetLoopMode(handle(), ending == Ending.START_OVER);
    }

    public ScreenDirection screenDirection() {
        return SlideShowJNI.GetScreenDirection(handle()) ? ScreenDirection.TURNED : ScreenDirection.NORMAL;
    }

    public void setScreenDirection(ScreenDirection direction) {
        SlideShowJNI.SetScreenDirection(handle(), direction == ScreenDirection.TURNED);
    }

    // ---- checks ----

    private int handle() {
        if (handle == CLOSED) throw new IllegalStateException("the show is closed");
        return handle;
    }

    private static void requireWithin(int index, int count) {
        if (index < 0 || index >= count) {
            throw new IndexOutOfBoundsException("index " + index + " of " + count);
        }
    }

    private static void requireRoom(int[] pixels, int width, int height) {
        if (width < 0 || height < 0 || (long) width * height > pixels.length) {
            throw new IllegalArgumentException(
                    width + " x " + height + " pixels do not fit into " + pixels.length);
        }
    }
}
