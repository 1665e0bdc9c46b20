package com.tavir.slideshow;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** All native methods on a real VM. */
class SlideShowJNITest {
    private static final int[] WRONG = {Integer.MIN_VALUE, -1, 2, 99, 100, 101, Integer.MAX_VALUE};

    @TempDir Path folder;
    private Path file;
    private byte[] red;
    private String blueFile;
    private final byte[] text = new byte[256];

    @BeforeEach
    void setUp() throws Exception {
        file = folder.resolve("show.vss");
        red = Samples.jpeg(60, 30, Samples.RED);
        blueFile = Samples.file(folder.resolve("blue.jpg"), Samples.jpeg(20, 40, Samples.BLUE));
    }

    @AfterEach
    void tearDown() {
        SlideShowJNI.DestroyShowHandler();
        assertEquals(0, SlideShowJNI.GetNumFrames(0));
    }

    private int addRed(int handle) {
        return SlideShowJNI.AddImageToBuffer(handle, red, red.length, "red");
    }

    private String text(int length) {
        assertEquals(0, text[length]);
        return new String(text, 0, length, StandardCharsets.UTF_8);
    }

    @Test
    void aContainerFromCreatingToReopening() throws Exception {
        assertEquals(0, SlideShowJNI.CreateShow(file.toString()));
        assertEquals(1, addRed(0));
        assertEquals(1, SlideShowJNI.AddImageToFile(0, blueFile, "blue"));
        assertEquals(1, SlideShowJNI.InsertImageToFile(0, blueFile, null, 0));
        assertEquals(1, SlideShowJNI.InsertImageToBuffer(0, red, red.length, null, 1));
        assertEquals(4, SlideShowJNI.GetNumFrames(0));
        assertEquals(60, SlideShowJNI.GetBitmapWidth(0, 1));
        assertEquals(40, SlideShowJNI.GetBitmapHeight(0, 0));
        String tune = Samples.file(folder.resolve("tune"), new byte[1000]);
        assertEquals(1, SlideShowJNI.AddMusic(0, tune));
        assertEquals(1000, SlideShowJNI.GetMusicSize(0));
        assertEquals(tune, text(SlideShowJNI.GetMusicFilename(0, text)));
        assertEquals(file.toString(), text(SlideShowJNI.GetLastInformation(0, text)));

        assertEquals(1, SlideShowJNI.RemoveImage(0, 1));
        assertEquals(1, SlideShowJNI.GetImageState(0, 1));
        assertEquals(1, SlideShowJNI.RemoveCache(0));

        SlideShowJNI.SetInterval(0, 7);
        SlideShowJNI.SetEffectType(0, -3);
        SlideShowJNI.SetShuffleMode(0, true);
        SlideShowJNI.SetLoopMode(0, false);
        SlideShowJNI.SetScreenDirection(0, true);
        assertEquals(1, SlideShowJNI.DeleteShow(0));
        assertEquals(0, SlideShowJNI.OpenShow(file.toString()));
        assertEquals(7, SlideShowJNI.GetInterval(0));
        assertEquals(-3, SlideShowJNI.GetEffectType(0));
        assertTrue(SlideShowJNI.GetShuffleMode(0));
        assertFalse(SlideShowJNI.GetLoopMode(0));
        assertTrue(SlideShowJNI.GetScreenDirection(0));
        assertEquals(2, SlideShowJNI.GetImageState(0, 1));
        assertEquals(1, SlideShowJNI.RemoveMusic(0));
        assertEquals(0, SlideShowJNI.GetMusicSize(0));
        assertEquals(3, SlideShowJNI.GetNumFrames(0));

        Path moved = folder.resolve("moved.vss");
        Files.move(file, moved);
        assertEquals(1, SlideShowJNI.SetPathName(0, moved.toString()));
        assertEquals(1, addRed(0));
        assertEquals(4, SlideShowJNI.GetNumFrames(0));
    }

    @Test
    void drawing() throws Exception {
        assertEquals(0, SlideShowJNI.CreateShow(file.toString()));
        assertEquals(1, addRed(0));
        assertEquals(1, SlideShowJNI.AddImageToFile(0, blueFile, null));
        int[] pixels = new int[60 * 30];
        assertEquals(1, SlideShowJNI.GetBitmap(0, 0, pixels));
        for (int pixel : pixels) assertTrue(Samples.shows(pixel, Samples.RED), Integer.toHexString(pixel));
        int[] square = new int[40 * 40];
        Arrays.fill(square, 7);
        assertEquals(1, SlideShowJNI.GetThumbnail(0, 1, 40, 40, square));
        for (int x = 0; x < 40; ++x) {
            assertEquals(x >= 10 && x < 30, Samples.shows(square[20 * 40 + x], Samples.BLUE), "x " + x);
        }
        // Sizes without an array that could hold them.
        Arrays.fill(pixels, 7);
        for (int[] size : new int[][] {{0, 5}, {5, -1}, {65536, 65536}, {46341, 46341}, {-46341, -46341}}) {
            assertEquals(0, SlideShowJNI.GetThumbnail(0, 0, size[0], size[1], pixels));
        }
        assertEquals(0, SlideShowJNI.GetBitmap(0, 2, pixels));
        assertEquals(0, SlideShowJNI.GetBitmapToBuffer(0, 0, red, red.length, pixels));
        assertEquals(7, pixels[0]);
    }

    @Test
    void aShowInMemory() throws Exception {
        assertEquals(0, SlideShowJNI.CreateShow(null));
        assertEquals(1, addRed(0));
        assertEquals(1, SlideShowJNI.AddImageToFile(0, blueFile, ""));
        int[] pixels = new int[60 * 30];
        assertEquals(0, SlideShowJNI.GetBitmap(0, 0, pixels));
        assertEquals(1, SlideShowJNI.GetBitmapToBuffer(0, 0, red, red.length, pixels));
        assertTrue(Samples.shows(pixels[0], Samples.RED));
        assertEquals(1, SlideShowJNI.GetBitmap(0, 1, pixels));
        assertTrue(Samples.shows(pixels[0], Samples.BLUE));
        assertEquals(blueFile, text(SlideShowJNI.GetLastInformation(0, text)));
        assertEquals(0, SlideShowJNI.RemoveImage(0, 0));
        assertEquals(0, SlideShowJNI.RemoveCache(0));
        assertFalse(Files.exists(file));
    }

    /** Two shows are open, so handles from 2 on are wrong; every method has to notice. */
    @Test
    void wrongHandles() throws Exception {
        assertEquals(0, SlideShowJNI.CreateShow(file.toString()));
        assertEquals(1, SlideShowJNI.CreateShow(null));
        assertEquals(1, addRed(0));
        byte[] before = Files.readAllBytes(file);
        int[] pixels = new int[60 * 30];
        for (int handle : WRONG) {
            assertEquals(SlideShowJNI.BAD_HANDLE, SlideShowJNI.DeleteShow(handle));
            assertEquals(0, addRed(handle));
            assertEquals(0, SlideShowJNI.AddImageToFile(handle, blueFile, "x"));
            assertEquals(0, SlideShowJNI.InsertImageToFile(handle, blueFile, "x", 0));
            assertEquals(0, SlideShowJNI.InsertImageToBuffer(handle, red, red.length, "x", 0));
            assertEquals(0, SlideShowJNI.AddMusic(handle, blueFile));
            assertEquals(0, SlideShowJNI.RemoveMusic(handle));
            assertEquals(0, SlideShowJNI.RemoveImage(handle, 0));
            assertEquals(0, SlideShowJNI.RemoveCache(handle));
            assertEquals(0, SlideShowJNI.GetImageState(handle, 0));
            assertEquals(0, SlideShowJNI.GetBitmap(handle, 0, pixels));
            assertEquals(0, SlideShowJNI.GetBitmapToBuffer(handle, 0, red, red.length, pixels));
            assertEquals(0, SlideShowJNI.GetThumbnail(handle, 0, 2, 2, pixels));
            assertEquals(0, SlideShowJNI.GetBitmapWidth(handle, 0));
            assertEquals(0, SlideShowJNI.GetBitmapHeight(handle, 0));
            assertEquals(0, SlideShowJNI.GetNumFrames(handle));
            assertFalse(SlideShowJNI.GetShuffleMode(handle));
            assertEquals(0, SlideShowJNI.GetEffectType(handle));
            assertEquals(0, SlideShowJNI.GetInterval(handle));
            assertFalse(SlideShowJNI.GetScreenDirection(handle));
            assertFalse(SlideShowJNI.GetLoopMode(handle));
            assertEquals(0, SlideShowJNI.GetMusicFilename(handle, text));
            assertEquals(0, SlideShowJNI.GetMusicSize(handle));
            SlideShowJNI.SetInterval(handle, 9);
            SlideShowJNI.SetEffectType(handle, 9);
            SlideShowJNI.SetShuffleMode(handle, true);
            SlideShowJNI.SetLoopMode(handle, true);
            SlideShowJNI.SetScreenDirection(handle, true);
            assertEquals(0, SlideShowJNI.SetPathName(handle, blueFile));
            assertEquals(0, SlideShowJNI.GetLastInformation(handle, text));
        }
        assertArrayEquals(before, Files.readAllBytes(file));
        assertArrayEquals(new byte[256], text);
    }

    @Test
    void nulls() throws Exception {
        assertEquals(SlideShowJNI.GENERAL_FAILURE, SlideShowJNI.OpenShow(null));
        assertEquals(0, SlideShowJNI.CreateShow(file.toString()));
        assertEquals(1, SlideShowJNI.CreateShow(null));
        assertEquals(1, addRed(0));
        assertEquals(1, addRed(1));
        byte[] before = Files.readAllBytes(file);
        for (int handle : new int[] {0, 1}) {
            assertEquals(0, SlideShowJNI.AddImageToFile(handle, null, "x"));
            assertEquals(0, SlideShowJNI.AddImageToBuffer(handle, null, 10, "x"));
            assertEquals(0, SlideShowJNI.InsertImageToFile(handle, null, null, 0));
            assertEquals(0, SlideShowJNI.InsertImageToBuffer(handle, null, 10, null, 0));
            assertEquals(0, SlideShowJNI.AddMusic(handle, null));
            assertEquals(0, SlideShowJNI.GetBitmap(handle, 0, null));
            assertEquals(0, SlideShowJNI.GetThumbnail(handle, 0, 2, 2, null));
            assertEquals(0, SlideShowJNI.GetBitmapToBuffer(handle, 0, null, 10, new int[60 * 30]));
            assertEquals(0, SlideShowJNI.GetBitmapToBuffer(handle, 0, red, red.length, null));
            assertEquals(0, SlideShowJNI.GetMusicFilename(handle, null));
            assertEquals(0, SlideShowJNI.GetLastInformation(handle, null));
            assertEquals(0, SlideShowJNI.SetPathName(handle, null));
        }
        assertArrayEquals(before, Files.readAllBytes(file));
    }

    /** U+0000 becomes two bytes, é two, and a character beyond U+FFFF six. */
    @Test
    void names() throws Exception {
        String odd = "a\0b\u00e9\uD83D\uDE00";
        assertEquals(0, SlideShowJNI.CreateShow(file.toString()));
        assertEquals(1, SlideShowJNI.AddImageToBuffer(0, red, red.length, odd));
        assertEquals("a\u00C0\u0080b\u00C3\u00A9\u00ED\u00A0\u00BD\u00ED\u00B8\u0080", Samples.field(file, 628));
        assertEquals(1, SlideShowJNI.InsertImageToFile(0, blueFile, "", 0));
        assertEquals("", Samples.field(file, 628));
        assertEquals(blueFile, Samples.field(file, 628 + 256));

        Path accented = folder.resolve("caf\u00e9.vss");
        assertEquals(1, SlideShowJNI.CreateShow(accented.toString()));
        assertTrue(Files.exists(accented));
        assertEquals(accented.toString(), text(SlideShowJNI.GetLastInformation(1, text)));
    }

    @Test
    void pathsThatAreRefused() throws Exception {
        assertEquals(0, SlideShowJNI.CreateShow(""));
        assertEquals(SlideShowJNI.GENERAL_FAILURE, SlideShowJNI.OpenShow(""));
        assertEquals(0, SlideShowJNI.CreateShow("x".repeat(256)));
        assertEquals(0, SlideShowJNI.CreateShow("\u00e9".repeat(128)));
        assertEquals(SlideShowJNI.GENERAL_FAILURE, SlideShowJNI.CreateShow(folder + "/none/show.vss"));
        assertEquals(SlideShowJNI.GENERAL_FAILURE, SlideShowJNI.OpenShow(folder.toString()));
        assertEquals(0, SlideShowJNI.CreateShow(null));
        assertEquals(0, SlideShowJNI.AddImageToFile(0, "", null));
        assertEquals(0, SlideShowJNI.AddMusic(0, ""));
        assertEquals(SlideShowJNI.NOT_A_SHOW, SlideShowJNI.OpenShow(blueFile));
        assertEquals(1, SlideShowJNI.CreateShow(file.toString()));
        assertEquals(1, addRed(1));
        byte[] bytes = Files.readAllBytes(file);
        bytes[bytes.length - 8] ^= 1;
        Files.write(file, bytes);
        SlideShowJNI.DestroyShowHandler();
        assertEquals(SlideShowJNI.WRONG_VERSION, SlideShowJNI.OpenShow(file.toString()));
    }
}
