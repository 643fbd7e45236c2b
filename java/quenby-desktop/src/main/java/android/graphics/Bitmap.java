package android.graphics;

import java.nio.Buffer;
import java.nio.ByteBuffer;

/**
 * A bitmap for machines that are no Android device, with the part of Android's interface that photo
 * code needs. Its pixels live outside the Java heap, where natives reach them without a copy; they
 * are freed some time after the bitmap is recycled or unreachable. Colours are packed as on
 * Android, {@code 0xAARRGGBB}, not premultiplied. Any thread may call; pixels are not locked.
 */
public final class Bitmap {
    /** How a pixel is stored. Only {@link #ARGB_8888} can be enhanced. */
    public enum Config {
        /** One byte of alpha. */
        ALPHA_8(8, 1),
        /** Two bytes without alpha. */
        RGB_565(4, 2),
        /** Two bytes with alpha. */
        ARGB_4444(7, 2),
        /** Four bytes: red, green, blue, alpha. */
        ARGB_8888(1, 4);

        final int format;
        final int bytesPerPixel;

        Config(int format, int bytesPerPixel) {
            this.format = format;
            this.bytesPerPixel = bytesPerPixel;
        }
    }

    // The native bitmap library reads these by name.
    private final int width;
    private final int height;
    private final int stride;
    private final int format;

    private final Config config;
    private ByteBuffer pixels;
    private boolean recycled;
    private int locks;
    private int timesLocked;

    private Bitmap(int width, int height, Config config, int stride) {
        if (width < 0 || height < 0) {
            throw new IllegalArgumentException("a side is negative: " + width + " x " + height);
        }
        if (stride < (long) width * config.bytesPerPixel) {
            throw new IllegalArgumentException(
                    "a row of " + width + " pixels is longer than " + stride + " bytes");
        }
        if ((long) stride * height > Integer.MAX_VALUE) {
            throw new IllegalArgumentException("over 2 GiB: " + width + " x " + height);
        }
        this.width = width;
        this.height = height;
        this.stride = stride;
        this.format = config.format;
        this.config = config;
        this.pixels = ByteBuffer.allocateDirect(stride * height);
    }

    /**
     * Makes a transparent black bitmap whose rows stand back to back.
     *
     * @param width  pixels in a row, 0 or more
     * @param height rows, 0 or more
     * @param config how pixels are stored
     * @return the bitmap
     * @throws IllegalArgumentException for a negative side or over 2 GiB
     */
    public static Bitmap createBitmap(int width, int height, Config config) {
        long stride = (long) Math.max(0, width) * config.bytesPerPixel;
        return new Bitmap(width, height, config, (int) Math.min(Integer.MAX_VALUE, stride));
    }

    /**
     * Makes a transparent black bitmap with padded rows. Only here: Android chooses by itself.
     *
     * @param width  pixels in a row, 0 or more
     * @param height rows, 0 or more
     * @param config how pixels are stored
     * @param stride bytes from one row to the next, at least those of a row
     * @return the bitmap
     * @throws IllegalArgumentException for a negative side, a stride too small or over 2 GiB
     */
    public static Bitmap createBitmap(int width, int height, Config config, int stride) {
        return new Bitmap(width, height, config, stride);
    }

    /**
     * Tells the number of pixels in a row.
     *
     * @return the width
     */
    public int getWidth() {
        return width;
    }

    /**
     * Tells the number of rows.
     *
     * @return the height
     */
    public int getHeight() {
        return height;
    }

    /**
     * Tells the number of bytes from one row to the next.
     *
     * @return the stride
     */
    public int getRowBytes() {
        return stride;
    }

    /**
     * Tells the number of bytes of all rows.
     *
     * @return rows times stride
     */
    public int getByteCount() {
        return stride * height;
    }

    /**
     * Tells how pixels are stored.
     *
     * @return the configuration
     */
    public Config getConfig() {
        return config;
    }

    /**
     * Gives the pixels up. Those who hold a lock on them keep them until they unlock; nobody else
     * reaches them any more.
     */
    public synchronized void recycle() {
        recycled = true;
        if (locks == 0) {
            pixels = null;
        }
    }

    /**
     * Tells whether the pixels were given up.
     *
     * @return true after {@link #recycle}
     */
    public synchronized boolean isRecycled() {
        return recycled;
    }

    /**
     * Reads a pixel of an {@link Config#ARGB_8888} bitmap.
     *
     * @param x its column
     * @param y its row
     * @return its colour
     * @throws IllegalArgumentException outside the bitmap
     * @throws IllegalStateException    when recycled or of another configuration
     */
    public int getPixel(int x, int y) {
        ByteBuffer bytes = bytes();
        int offset = offsetOf(x, y);
        return bytes.get(offset + 3) << 24 | (bytes.get(offset) & 0xFF) << 16
                | (bytes.get(offset + 1) & 0xFF) << 8 | bytes.get(offset + 2) & 0xFF;
    }

    /**
     * Writes a pixel of an {@link Config#ARGB_8888} bitmap.
     *
     * @param x     its column
     * @param y     its row
     * @param color its colour
     * @throws IllegalArgumentException outside the bitmap
     * @throws IllegalStateException    when recycled or of another configuration
     */
    public void setPixel(int x, int y, int color) {
        ByteBuffer bytes = bytes();
        int offset = offsetOf(x, y);
        bytes.put(offset, (byte) (color >> 16));
        bytes.put(offset + 1, (byte) (color >> 8));
        bytes.put(offset + 2, (byte) color);
        bytes.put(offset + 3, (byte) (color >> 24));
    }

    /**
     * Writes all pixels of an {@link Config#ARGB_8888} bitmap.
     *
     * @param color their colour
     * @throws IllegalStateException when recycled or of another configuration
     */
    public void eraseColor(int color) {
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                setPixel(x, y, color);
            }
        }
    }

    /**
     * Copies all bytes, padding included, into {@code target} from its position on.
     *
     * @param target holds {@link #getByteCount} bytes or more
     * @throws IllegalStateException when recycled
     */
    public void copyPixelsToBuffer(Buffer target) {
        ((ByteBuffer) target).put(all());
    }

    /**
     * Copies all bytes, padding included, from {@code source} from its position on.
     *
     * @param source holds {@link #getByteCount} bytes or more
     * @throws IllegalStateException when recycled
     */
    public void copyPixelsFromBuffer(Buffer source) {
        ByteBuffer part = ((ByteBuffer) source).duplicate();
        part.limit(part.position() + getByteCount());
        all().put(part);
    }

    /**
     * Tells how many natives hold the pixels right now. Only here.
     *
     * @return locks less unlocks
     */
    public synchronized int getLockCount() {
        return locks;
    }

    /**
     * Tells how often the pixels were locked. Only here.
     *
     * @return the number of locks so far
     */
    public synchronized int getTimesLocked() {
        return timesLocked;
    }

    // Called by the native bitmap library. Null when recycled.
    @SuppressWarnings("unused")
    private synchronized ByteBuffer lockPixels() {
        if (recycled) {
            return null;
        }
        ++locks;
        ++timesLocked;
        return pixels;
    }

    // Called by the native bitmap library.
    @SuppressWarnings("unused")
    private synchronized void unlockPixels() {
        if (locks == 0) {
            throw new IllegalStateException("the pixels are not locked");
        }
        --locks;
        if (recycled && locks == 0) {
            pixels = null;
        }
    }

    private synchronized ByteBuffer all() {
        if (recycled) {
            throw new IllegalStateException("the bitmap is recycled");
        }
        return pixels.duplicate();
    }

    private ByteBuffer bytes() {
        if (config != Config.ARGB_8888) {
            throw new IllegalStateException("pixels of " + config + " cannot be told");
        }
        return all();
    }

    private int offsetOf(int x, int y) {
        if (x < 0 || x >= width || y < 0 || y >= height) {
            throw new IllegalArgumentException("no pixel at " + x + ", " + y);
        }
        return y * stride + x * 4;
    }
}
