package com.tavir.slideshow;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.awt.image.BufferedImage;
import java.nio.file.Files;
import java.nio.file.Path;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;
import org.junit.jupiter.api.io.TempDir;

/** The comfortable class: checks, exceptions, settings, and handles that stay good. */
class SlideShowTest {
    @TempDir Path folder;
    private String path;
    private byte[] red;
    private byte[] blue;

    @BeforeEach
    void setUp() throws Exception {
        path = folder.resolve("show.vss").toString();
        red = Samples.jpeg(60, 30, Samples.RED);
        blue = Samples.jpeg(20, 40, Samples.BLUE);
    }

    private static void refused(SlideShowException.Reason reason, Executable request) {
        SlideShowException failure = assertThrows(SlideShowException.class, request);
        assertEquals(reason, failure.reason());
        assertTrue(failure.getMessage().length() > 20, failure.getMessage());
    }

    @Test
    void aShowIsMadeAndReopened() throws Exception {
        String tune = Samples.file(folder.resolve("caf\u00e9 \u266b"), new byte[3000]);
        try (SlideShow show = SlideShow.create(path)) {
            show.add(red, "red");
            show.insert(0, blue, null);
            show.add(Samples.file(folder.resolve("red.jpg"), red), "again");
            show.setInterval(12);
            show.setOrder(Order.SHUFFLED);
            show.setEnding(Ending.START_OVER);
            show.setScreenDirection(ScreenDirection.TURNED);
            show.addMusic(tune);
        }
        try (SlideShow show = SlideShow.open(path)) {
            assertEquals(3, show.size());
            assertEquals(path, show.path());
            assertEquals(12, show.interval());
            assertEquals(Order.SHUFFLED, show.order());
            assertEquals(Ending.START_OVER, show.ending());
            assertEquals(ScreenDirection.TURNED, show.screenDirection());
            assertEquals(3000, show.musicSize());
            assertEquals(tune, show.musicPath());
            show.markForRemoval(1);
            assertEquals(ImageState.MARKED_AFTER_LOADING, show.state(1));
            show.compact();
            show.removeMusic();
            assertEquals(2, show.size());
            BufferedImage image = SlideShowImages.draw(show, 1);
            assertEquals(60, image.getWidth());
            assertTrue(Samples.shows(image.getRGB(59, 29), Samples.RED));
            image = SlideShowImages.thumbnail(show, 0, 30, 10);
            assertEquals(0, image.getRGB(0, 5));
            assertTrue(Samples.shows(image.getRGB(15, 5), Samples.BLUE));
        }
    }

    @Test
    void reasonsAreGiven() throws Exception {
        String file = Samples.file(folder.resolve("blue.jpg"), blue);
        refused(SlideShowException.Reason.NOT_A_SHOW, () -> SlideShow.open(file));
        refused(SlideShowException.Reason.GENERAL_FAILURE, () -> SlideShow.open(folder + "/none"));
        assertThrows(IllegalArgumentException.class, () -> SlideShow.create(""));
        assertThrows(IllegalArgumentException.class, () -> SlideShow.open("\u20ac".repeat(86)));
        SlideShow show = SlideShow.create(path);
        refused(SlideShowException.Reason.REFUSED, () -> show.add(new byte[] {1, 2, 3}, "x"));
        refused(SlideShowException.Reason.REFUSED, show::removeMusic);
        show.add(red, "red");
        assertThrows(IndexOutOfBoundsException.class, () -> show.insert(2, red, "x"));
        assertThrows(IndexOutOfBoundsException.class, () -> show.markForRemoval(1));
        assertThrows(IndexOutOfBoundsException.class, () -> show.width(-1));
        show.close();
        show.close();
        assertThrows(IllegalStateException.class, show::size);
    }

    @Test
    void arraysThatAreTooShortNeverReachTheLibrary() throws Exception {
        try (SlideShow show = SlideShow.createInMemory()) {
            show.add(red, "red");
            int[] small = new int[60 * 30 - 1];
            assertThrows(IllegalArgumentException.class, () -> show.draw(0, small));
            assertThrows(IllegalArgumentException.class, () -> show.draw(0, red, small));
            assertThrows(IllegalArgumentException.class, () -> show.thumbnail(0, 65536, 65536, small));
            assertArrayEquals(new int[small.length], small);
            int[] exact = new int[60 * 30];
            show.draw(0, red, exact);
            assertTrue(Samples.shows(exact[exact.length - 1], Samples.RED));
        }
    }

    /** The library would refuse the later handles once an earlier show is deleted. */
    @Test
    void closingAShowDoesNotCutOffLaterOnes() throws Exception {
        String other = folder.resolve("other.vss").toString();
        SlideShow first = SlideShow.create(path);
        first.add(red, "red");
        SlideShow second = SlideShow.create(other);
        SlideShow third = SlideShow.createInMemory();
        SlideShow sharing = SlideShow.open(path);
        first.close();
        assertEquals(1, sharing.size());
        sharing.close();
        second.add(blue, "blue");
        second.close();
        third.add(red, "red");
        assertEquals(1, third.size());
        // Open again while the old places are kept.
        try (SlideShow again = SlideShow.open(path)) {
            third.close();
            assertEquals(1, again.size());
        }
        // All places are free again.
        assertEquals(0, SlideShowJNI.CreateShow(null));
        assertEquals(1, SlideShowJNI.DeleteShow(0));
        assertTrue(Files.size(Path.of(other)) > 628);
    }
}
