package com.tavir.slideshow;

import java.awt.image.BufferedImage;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import javax.imageio.ImageIO;

/** Pictures and music for the tests, and a look into containers. */
final class Samples {
    static final int RED = 0xC81E1E;
    static final int BLUE = 0x1E1EC8;

    private Samples() {}

    /** A JPEG of one colour. */
    static byte[] jpeg(int width, int height, int colour) throws IOException {
        BufferedImage image = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) image.setRGB(x, y, colour);
        }
        ByteArrayOutputStream out = new ByteArrayOutputStream();
        if (!ImageIO.write(image, "jpeg", out)) throw new IOException("no JPEG writer");
        return out.toByteArray();
    }

    static String file(Path path, byte[] bytes) throws IOException {
        Files.write(path, bytes);
        return path.toString();
    }

    /** Opaque, and near the colour. */
    static boolean shows(int pixel, int colour) {
        boolean near = pixel >>> 24 == 0xFF;
        for (int shift = 0; shift < 24; shift += 8) {
            near &= Math.abs((pixel >> shift & 0xFF) - (colour >> shift & 0xFF)) < 8;
        }
        return near;
    }

    /** The text of the 256-byte field at an offset of a file, a char for each byte. */
    static String field(Path file, int offset) throws IOException {
        String text = new String(Files.readAllBytes(file), offset, 256, StandardCharsets.ISO_8859_1);
        return text.substring(0, text.indexOf(0));
    }
}
