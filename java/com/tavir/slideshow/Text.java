package com.tavir.slideshow;

import java.io.ByteArrayInputStream;
import java.io.DataInputStream;
import java.io.IOException;
import java.nio.charset.StandardCharsets;

/** Texts as the library keeps them: modified UTF-8, at most 255 bytes. */
final class Text {
    /** Room for a text and its zero byte. */
    static final int ROOM = 256;

    private Text() {}

    static int encodedLength(String text) {
        int length = 0;
        for (int i = 0; i < text.length(); ++i) {
            char c = text.charAt(i);
            length += c != 0 && c < 0x80 ? 1 : c < 0x800 ? 2 : 3;
        }
        return length;
    }

    /** A path that the library takes. */
    static String requirePath(String path) {
        int length = encodedLength(path);
        if (length < 1 || length >= ROOM) {
            throw new IllegalArgumentException("a path has 1 to 255 bytes, not " + length);
        }
        return path;
    }

    /** The first {@code length} of the bytes. Those of a foreign file need not be modified UTF-8. */
    static String decode(byte[] bytes, int length) {
        byte[] prefixed = new byte[2 + length];
        prefixed[0] = (byte) (length >> 8);
        prefixed[1] = (byte) length;
        System.arraycopy(bytes, 0, prefixed, 2, length);
        try {
            return new DataInputStream(new ByteArrayInputStream(prefixed)).readUTF();
        } catch (IOException malformed) {
            return new String(bytes, 0, length, StandardCharsets.UTF_8);
        }
    }
}
