package android.graphics;

/**
 * Pixels as a bitmap of ARGB_8888 stores them: bytes red, green, blue, alpha, read as an int of
 * little endian; against colours, {@code 0xAARRGGBB} and not premultiplied. With premultiplication
 * a stored channel is {@code c * alpha / 255}, a colour's {@code min(255, c * 255 / alpha)}, both
 * rounded to nearest, a half upwards; alpha 0 gives colour 0. A stored pixel survives the way to a
 * colour and back.
 */
final class StoredPixels {
    private StoredPixels() {}

    /** Unpremultiplied channels by alpha times 256 plus channel. */
    private static final class Table {
        static final byte[] CHANNELS = new byte[1 << 16];

        static {
            for (int alpha = 1; alpha < 256; ++alpha) {
                for (int channel = 0; channel < 256; ++channel) {
                    CHANNELS[alpha << 8 | channel] =
                            (byte) Math.min(255, (channel * 510 + alpha) / (2 * alpha));
                }
            }
        }
    }

    // In place, over whole arrays: such loops become vectors.

    /** Makes stored pixels of a row of colours. */
    static void fromColors(int[] row, boolean premultiplied) {
        boolean multiply = premultiplied && !opaque(row);
        swapRedAndBlue(row);
        if (multiply) {
            for (int i = 0; i < row.length; ++i) {
                row[i] = premultiply(row[i]);
            }
        }
    }

    /** Makes colours of a row of stored pixels. */
    static void toColors(int[] row, boolean premultiplied) {
        boolean divide = premultiplied && !opaque(row);
        swapRedAndBlue(row);
        if (divide) {
            for (int i = 0; i < row.length; ++i) {
                row[i] = unpremultiply(row[i]);
            }
        }
    }

    private static boolean opaque(int[] row) {
        int all = -1;
        for (int i = 0; i < row.length; ++i) {
            all &= row[i];
        }
        return all >>> 24 == 255;
    }

    private static void swapRedAndBlue(int[] row) {
        for (int i = 0; i < row.length; ++i) {
            int pixel = row[i];
            row[i] = pixel & 0xFF00FF00 | pixel << 16 & 0xFF0000 | pixel >>> 16 & 0xFF;
        }
    }

    private static int premultiply(int pixel) {
        int alpha = pixel >>> 24;
        // (x + (x >> 8)) >> 8 with x = c * alpha + 128 is the rounded quotient by 255.
        int outer = (pixel & 0xFF00FF) * alpha + 0x800080;
        int green = (pixel >>> 8 & 0xFF) * alpha + 0x80;
        outer = outer + (outer >>> 8 & 0xFF00FF) >>> 8 & 0xFF00FF;
        green = green + (green >>> 8) & 0xFF00;
        return alpha << 24 | outer | green;
    }

    private static int unpremultiply(int pixel) {
        int row = pixel >>> 24 << 8;
        if (row == 255 << 8) {
            return pixel;
        }
        byte[] table = Table.CHANNELS;
        return pixel & 0xFF000000 | (table[row | pixel >>> 16 & 0xFF] & 0xFF) << 16
                | (table[row | pixel >>> 8 & 0xFF] & 0xFF) << 8
                | table[row | pixel & 0xFF] & 0xFF;
    }
}
