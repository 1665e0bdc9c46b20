package com.tavir.slideshow;

import java.awt.image.BufferedImage;
import java.awt.image.DataBufferInt;

/** Pictures of a show as images of the desktop; stands apart because Android has none. */
public final class SlideShowImages {
    private SlideShowImages() {}

    /** A picture at its display size. */
    public static BufferedImage draw(SlideShow show, int index) throws SlideShowException {
        BufferedImage image = canvas(show.width(index), show.height(index));
        show.draw(index, pixelsOf(image));
        return image;
    }

    /** A picture fitted into width x height pixels and centred on transparent black. */
    public static BufferedImage thumbnail(SlideShow show, int index, int width, int height)
            throws SlideShowException {
        BufferedImage image = canvas(width, height);
        show.thumbnail(index, width, height, pixelsOf(image));
        return image;
    }

    private static BufferedImage canvas(int width, int height) {
        return new BufferedImage(width, height, BufferedImage.TYPE_INT_ARGB);
    }

    private static int[] pixelsOf(BufferedImage image) {
        return ((DataBufferInt) image.getRaster().getDataBuffer()).getData();
    }
}
