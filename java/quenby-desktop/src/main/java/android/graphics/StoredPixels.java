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

    // In place and over the first `count` of an array: such loops become vectors.

    /** Makes stored pixels of colours. */
    static void fromColors(int[] pixels, int count, boolean premultiplied) {
        swapRedAndBlue(pixels, count);
        if (premultiplied) { // opaque ones too: looking for others takes longer
            for (int i = 0; i < count; ++i) {
                pixels[i] = premultiply(pixels[i]);
            }
        }
    }

    /** Makes colours of stored pixels. */
    static void toColors(int[] pixels, int count, boolean premultiplied) {
        swapRedAndBlue(pixels, count);
        if (premultiplied && sumOfAlphas(pixels, count) < 255 * count) {
            for (int i = 0; i < count; ++i) {
                pixels[i] = unpremultiply(pixels[i]);
            }
        }
    }

    static void makeOpaque(int[] pixels, int count) {
        for (int i = 0; i < count; ++i) {
            pixels[i] |= 0xFF000000;
        }
    }

    private static int sumOfAlphas(int[] pixels, int count) {
        int sum = 0;
        for (int i = 0; i < count; ++i) {
            sum += pixels[i] >>> 24;
        }
        return sum;
    }

    private static void swapRedAndBlue(int[] pixels, int count) {
        for (int i = 0; i < count; ++i) {
            int pixel = pixels[i];
            pixels[i] = pixel & 0xFF00FF00 | pixel << 16 & 0xFF0000 | pixel >>> 16 & 0xFF;
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
