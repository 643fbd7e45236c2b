package android.graphics;

import java.nio.Buffer;
import java.nio.ByteBuffer;
import java.nio.ByteOrder;
import java.nio.IntBuffer;
import java.nio.ShortBuffer;
import java.util.Arrays;

/**
 * A bitmap for machines that are no Android device, with the part of Android's interface that photo
 * code needs. Its pixels live outside the Java heap, where natives reach them without a copy; they
 * are freed some time after the bitmap is recycled or unreachable. Colours are packed as on
 * Android, {@code 0xAARRGGBB}, not premultiplied; pixels are stored premultiplied, unless
 * {@link #setPremultiplied} says otherwise. A stored channel is {@code c * alpha / 255}, one read
 * is {@code min(255, c * 255 / alpha)}, both rounded to nearest: translucent colours lose a little,
 * once. Any thread may call; pixels are not locked.
 *
 * <p>What differs from a device: <ul>
 * <li>Colours of single pixels are those of {@link Config#ARGB_8888} only; bitmaps of another
 *     configuration refuse {@link #getPixel} and its like. {@link #copy} converts between
 *     {@code ARGB_8888} and {@code HARDWARE} only.
 * <li>Devices round translucent colours in ways of their own, off by one at times.
 * <li>{@link Config#RGBA_F16} cannot be locked by natives; on a device it can, as another format.
 * <li>{@link #copyPixelsFromBuffer} refuses immutable bitmaps; Android does not say what it does.
 * <li>There is no display, so the density is {@value #DENSITY_DEFAULT} at first.
 * <li>Rows may be padded on request, locks are counted, and sides of a bitmap can make at most
 *     2 GiB.
 * <li>Colour spaces, gain maps, drawing, scaling, parcels, reconfiguration and compression are
 *     missing.
 * </ul>
 */
public final class Bitmap {
    /** The density of a bitmap that is drawn as it is, whatever the display's. */
    public static final int DENSITY_NONE = 0;

    private static final int DENSITY_DEFAULT = 160;
    /** Pixels that are converted at a time, few enough for the nearest cache. */
    private static final int PART = 1024;

    /** How a pixel is stored. Only {@link #ARGB_8888} can be enhanced. */
    public enum Config {
        /** One byte of alpha. */
        ALPHA_8(8, 1),
        /** Two bytes without alpha. */
        RGB_565(4, 2),
        /** Two bytes with alpha. */
        ARGB_4444(7, 2),
        /** Four bytes: red, green, blue, alpha. */
        ARGB_8888(1, 4),
        /** Eight bytes: red, green, blue, alpha in half precision. Natives cannot lock it. */
        RGBA_F16(9, 8),
        /**
         * In the graphics processor's memory: immutable, made by {@link Bitmap#copy} only. Neither
         * natives nor methods reach its pixels, except to copy it back.
         */
        HARDWARE(1, 4);

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
    private boolean mutable = true;
    private boolean hasAlpha;
    private boolean premultiplied = true;
    private int density = DENSITY_DEFAULT;
    private boolean recycled;
    private int locks;
    private int timesLocked;

    private Bitmap(int width, int height, Config config, int stride) {
        if (width <= 0 || height <= 0) {
            throw new IllegalArgumentException("no pixels: " + width + " x " + height);
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
        this.hasAlpha = config != Config.RGB_565;
        this.pixels = ByteBuffer.allocateDirect(stride * height).order(ByteOrder.LITTLE_ENDIAN);
    }

    /**
     * Makes a mutable, transparent black bitmap whose rows stand back to back.
     *
     * @param width  pixels in a row, 1 or more
     * @param height rows, 1 or more
     * @param config how pixels are stored; not {@link Config#HARDWARE}
     * @return the bitmap
     * @throws IllegalArgumentException for a side below 1, {@code HARDWARE} or over 2 GiB
     */
    public static Bitmap createBitmap(int width, int height, Config config) {
        long stride = (long) Math.max(0, width) * config.bytesPerPixel;
        return createBitmap(width, height, config, (int) Math.min(Integer.MAX_VALUE, stride));
    }

    /**
     * Makes a mutable bitmap, transparent or opaque black, whose rows stand back to back.
     *
     * @param width    pixels in a row, 1 or more
     * @param height   rows, 1 or more
     * @param config   how pixels are stored; not {@link Config#HARDWARE}
     * @param hasAlpha false makes an {@code ARGB_8888} bitmap opaque, see {@link #setHasAlpha}
     * @return the bitmap
     * @throws IllegalArgumentException for a side below 1, {@code HARDWARE} or over 2 GiB
     */
    public static Bitmap createBitmap(int width, int height, Config config, boolean hasAlpha) {
        Bitmap bitmap = createBitmap(width, height, config);
        if (!hasAlpha && config == Config.ARGB_8888) {
            bitmap.eraseColor(0xFF000000);
            bitmap.setHasAlpha(false);
        }
        return bitmap;
    }

    /**
     * Makes a mutable, transparent black bitmap with padded rows. Only here: Android chooses by
     * itself.
     *
     * @param width  pixels in a row, 1 or more
     * @param height rows, 1 or more
     * @param config how pixels are stored; not {@link Config#HARDWARE}
     * @param stride bytes from one row to the next, at least those of a row
     * @return the bitmap
     * @throws IllegalArgumentException for a side below 1, {@code HARDWARE}, a stride too small or
     *                                  over 2 GiB
     */
    public static Bitmap createBitmap(int width, int height, Config config, int stride) {
        if (config == Config.HARDWARE) {
            throw new IllegalArgumentException("a HARDWARE bitmap is made by copy only");
        }
        return new Bitmap(width, height, config, stride);
    }

    /**
     * Makes an immutable bitmap of colours.
     *
     * @param colors row by row, {@code width * height} of them or more
     * @param width  pixels in a row, 1 or more
     * @param height rows, 1 or more
     * @param config {@link Config#ARGB_8888}
     * @return the bitmap
     * @throws IllegalArgumentException       for a side below 1 or over 2 GiB
     * @throws ArrayIndexOutOfBoundsException when there are too few colours
     * @throws IllegalStateException          for another configuration
     */
    public static Bitmap createBitmap(int[] colors, int width, int height, Config config) {
        Bitmap bitmap = createBitmap(width, height, config);
        bitmap.setPixels(colors, 0, width, 0, 0, width, height);
        bitmap.mutable = false;
        return bitmap;
    }

    /**
     * Makes a bitmap of the same pixels, density, alpha and premultiplication.
     *
     * @param config  how the copy stores them
     * @param mutable whether its pixels can be changed
     * @return the copy, or null when it would have to convert; see above
     * @throws IllegalArgumentException for a mutable {@link Config#HARDWARE} bitmap
     * @throws IllegalStateException    when recycled
     */
    public Bitmap copy(Config config, boolean mutable) {
        if (config == Config.HARDWARE && mutable) {
            throw new IllegalArgumentException("a HARDWARE bitmap is immutable");
        }
        ByteBuffer source = all();
        if (config.format != format) {
            return null;
        }
        Bitmap copy = new Bitmap(width, height, config, stride);
        copy.pixels.put(source).clear();
        copy.mutable = mutable;
        synchronized (this) {
            copy.hasAlpha = hasAlpha;
            copy.premultiplied = premultiplied;
            copy.density = density;
        }
        return copy;
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
     * Tells whether the pixels can be changed by this class's methods. Natives change them anyway.
     *
     * @return false for copies and bitmaps of colours that were made so
     */
    public boolean isMutable() {
        return mutable;
    }

    /**
     * Tells whether pixels may be translucent.
     *
     * @return true at first, but for {@link Config#RGB_565}
     */
    public synchronized boolean hasAlpha() {
        return hasAlpha;
    }

    /**
     * Says whether pixels may be translucent. No pixel changes; where they may not be, colours are
     * stored as they are and read with alpha 255. {@link Config#RGB_565} never is translucent,
     * {@link Config#ALPHA_8} always.
     *
     * @param hasAlpha false when all pixels are opaque
     */
    public synchronized void setHasAlpha(boolean hasAlpha) {
        if (config != Config.RGB_565 && config != Config.ALPHA_8) {
            this.hasAlpha = hasAlpha;
        }
    }

    /**
     * Tells whether the stored colours are multiplied by their alpha.
     *
     * @return true at first; false without alpha, when there is no difference
     */
    public synchronized boolean isPremultiplied() {
        return hasAlpha && premultiplied;
    }

    /**
     * Says whether the stored colours are multiplied by their alpha. No pixel changes; it decides
     * how {@link #setPixel} and {@link #getPixel} and their like convert, and nothing where the
     * bitmap has no alpha.
     *
     * @param premultiplied false for colours as they are
     */
    public synchronized void setPremultiplied(boolean premultiplied) {
        this.premultiplied = premultiplied;
    }

    /**
     * Tells for which density of a display the bitmap is made.
     *
     * @return dots per inch, or {@link #DENSITY_NONE}
     */
    public synchronized int getDensity() {
        return density;
    }

    /**
     * Says for which density of a display the bitmap is made. No pixel changes.
     *
     * @param density dots per inch, or {@link #DENSITY_NONE}
     */
    public synchronized void setDensity(int density) {
        this.density = density;
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
        int[] color = new int[1];
        getPixels(color, 0, 1, x, y, 1, 1);
        return color[0];
    }

    /**
     * Writes a pixel of an {@link Config#ARGB_8888} bitmap.
     *
     * @param x     its column
     * @param y     its row
     * @param color its colour
     * @throws IllegalArgumentException outside the bitmap
     * @throws IllegalStateException    when recycled, immutable or of another configuration
     */
    public void setPixel(int x, int y, int color) {
        setPixels(new int[] {color}, 0, 1, x, y, 1, 1);
    }

    /**
     * Reads a rectangle of an {@link Config#ARGB_8888} bitmap.
     *
     * @param colors receives the colours
     * @param offset where the first goes
     * @param stride from one row's first to the next one's, at least {@code width}, or negative
     * @param x      the first column
     * @param y      the first row
     * @param width  columns, 0 or more
     * @param height rows, 0 or more
     * @throws IllegalArgumentException       when the rectangle is not inside, or the stride too
     *                                        small
     * @throws ArrayIndexOutOfBoundsException when the array is too small
     * @throws IllegalStateException          when recycled or of another configuration
     */
    public void getPixels(
            int[] colors, int offset, int stride, int x, int y, int width, int height) {
        ByteBuffer stored = ofRectangle(colors, offset, stride, x, y, width, height);
        boolean translucent = hasAlpha();
        boolean divided = isPremultiplied();
        int[] part = new int[Math.min(width, PART)];
        for (int i = 0; i < height; ++i) {
            stored.position((y + i) * this.stride + x * 4);
            IntBuffer row = stored.asIntBuffer();
            for (int j = 0; j < width; j += PART) {
                int count = Math.min(PART, width - j);
                row.get(part, 0, count);
                StoredPixels.toColors(part, count, divided);
                if (!translucent) {
                    StoredPixels.makeOpaque(part, count);
                }
                System.arraycopy(part, 0, colors, offset + i * stride + j, count);
            }
        }
    }

    /**
     * Writes a rectangle of an {@link Config#ARGB_8888} bitmap.
     *
     * @param colors the colours
     * @param offset where the first is
     * @param stride from one row's first to the next one's, at least {@code width}, or negative
     * @param x      the first column
     * @param y      the first row
     * @param width  columns, 0 or more
     * @param height rows, 0 or more
     * @throws IllegalArgumentException       when the rectangle is not inside, or the stride too
     *                                        small
     * @throws ArrayIndexOutOfBoundsException when the array is too small
     * @throws IllegalStateException          when recycled, immutable or of another configuration
     */
    public void setPixels(
            int[] colors, int offset, int stride, int x, int y, int width, int height) {
        requireMutable();
        ByteBuffer stored = ofRectangle(colors, offset, stride, x, y, width, height);
        boolean multiplied = isPremultiplied();
        int[] part = new int[Math.min(width, PART)];
        for (int i = 0; i < height; ++i) {
            stored.position((y + i) * this.stride + x * 4);
            IntBuffer row = stored.asIntBuffer();
            for (int j = 0; j < width; j += PART) {
                int count = Math.min(PART, width - j);
                System.arraycopy(colors, offset + i * stride + j, part, 0, count);
                StoredPixels.fromColors(part, count, multiplied);
                row.put(part, 0, count);
            }
        }
    }

    /**
     * Writes all pixels of an {@link Config#ARGB_8888} bitmap.
     *
     * @param color their colour
     * @throws IllegalStateException when recycled, immutable or of another configuration
     */
    public void eraseColor(int color) {
        int[] row = new int[width];
        Arrays.fill(row, color);
        for (int y = 0; y < height; ++y) {
            setPixels(row, 0, width, 0, y, width, 1);
        }
    }

    /**
     * Copies all bytes, padding included, into {@code target} from its position on, which moves by
     * as many elements. Bytes that fill no element are left out.
     *
     * @param target of bytes, shorts or ints; has room for {@link #getByteCount} bytes or more
     * @throws IllegalStateException when recycled or {@link Config#HARDWARE}
     * @throws RuntimeException      when the room does not suffice, or for another kind of buffer
     */
    public void copyPixelsToBuffer(Buffer target) {
        ByteBuffer source = reachable();
        int elements = elementsOf(target);
        int start = target.position();
        if (target instanceof ByteBuffer) {
            ((ByteBuffer) target).put(source);
            return;
        }
        ByteOrder order = target instanceof IntBuffer
                ? ((IntBuffer) target).order() : ((ShortBuffer) target).order();
        source.order(order);
        if (target instanceof IntBuffer) {
            ((IntBuffer) target).put(source.asIntBuffer());
        } else {
            ((ShortBuffer) target).put(source.asShortBuffer());
        }
        target.position(start + elements);
    }

    /**
     * Copies all bytes, padding included, from {@code source} from its position on, which moves by
     * as many elements. They are taken as they are: nothing is multiplied.
     *
     * @param source of bytes, shorts or ints; holds {@link #getByteCount} bytes or more
     * @throws IllegalStateException when recycled or immutable
     * @throws RuntimeException      when there are fewer bytes, or for another kind of buffer
     */
    public void copyPixelsFromBuffer(Buffer source) {
        requireMutable();
        ByteBuffer target = reachable();
        int elements = elementsOf(source);
        int end = source.position() + elements;
        if (source instanceof ByteBuffer) {
            ByteBuffer part = ((ByteBuffer) source).duplicate();
            part.limit(end);
            target.put(part);
        } else if (source instanceof IntBuffer) {
            IntBuffer part = ((IntBuffer) source).duplicate();
            part.limit(end);
            target.order(part.order()).asIntBuffer().put(part);
        } else {
            ShortBuffer part = ((ShortBuffer) source).duplicate();
            part.limit(end);
            target.order(part.order()).asShortBuffer().put(part);
        }
        source.position(end);
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

    // Called by the native bitmap library. Null when there is nothing to lock.
    @SuppressWarnings("unused")
    private synchronized ByteBuffer lockPixels() {
        if (recycled || config == Config.HARDWARE || config == Config.RGBA_F16) {
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

    private void requireMutable() {
        if (!mutable) {
            throw new IllegalStateException("the bitmap is immutable");
        }
    }

    private synchronized ByteBuffer all() {
        if (recycled) {
            throw new IllegalStateException("the bitmap is recycled");
        }
        return pixels.duplicate().order(ByteOrder.LITTLE_ENDIAN);
    }

    private ByteBuffer reachable() {
        if (config == Config.HARDWARE) {
            throw new IllegalStateException("pixels of HARDWARE cannot be reached");
        }
        return all();
    }

    /** The bitmap's bytes in the buffer's elements, which it is to have left. */
    private int elementsOf(Buffer buffer) {
        int bytesOfOne;
        if (buffer instanceof ByteBuffer) {
            bytesOfOne = 1;
        } else if (buffer instanceof ShortBuffer) {
            bytesOfOne = 2;
        } else if (buffer instanceof IntBuffer) {
            bytesOfOne = 4;
        } else {
            throw new RuntimeException("a buffer of neither bytes, shorts nor ints");
        }
        if ((long) buffer.remaining() * bytesOfOne < getByteCount()) {
            throw new RuntimeException("the buffer is too small: " + (long) buffer.remaining()
                    * bytesOfOne + " bytes of " + getByteCount());
        }
        return getByteCount() / bytesOfOne;
    }

    /** All pixels as they are stored, for a rectangle that is inside both them and the array. */
    private ByteBuffer ofRectangle(
            int[] colors, int offset, int stride, int x, int y, int columns, int rows) {
        if (config != Config.ARGB_8888) {
            throw new IllegalStateException("pixels of " + config + " cannot be told");
        }
        ByteBuffer stored = all();
        if (x < 0 || y < 0 || columns < 0 || rows < 0 || columns > width - x || rows > height - y) {
            throw new IllegalArgumentException("not inside " + width + " x " + height + ": "
                    + columns + " x " + rows + " pixels at " + x + ", " + y);
        }
        if (Math.abs((long) stride) < columns) {
            throw new IllegalArgumentException(
                    "a row of " + columns + " pixels is longer than the stride " + stride);
        }
        long last = offset + (rows - 1L) * stride;
        boolean fits = Math.min(offset, last) >= 0
                && Math.max(offset, last) + columns <= colors.length;
        if (columns > 0 && rows > 0 && !fits) {
            throw new ArrayIndexOutOfBoundsException("the array is too small: " + colors.length);
        }
        return stored;
    }
}
