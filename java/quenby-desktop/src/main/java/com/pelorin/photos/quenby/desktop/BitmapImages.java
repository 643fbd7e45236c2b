package com.pelorin.photos.quenby.desktop;

import android.graphics.Bitmap;
import java.awt.image.BufferedImage;
import java.nio.ByteBuffer;

/** Turns the images of Java's desktop into bitmaps and back. Stateless; any thread may call. */
public final class BitmapImages {
    private BitmapImages() {}

    /**
     * Copies an image of any kind into a new bitmap of {@link Bitmap.Config#ARGB_8888}.
     *
     * @param image its colours are taken as sRGB, its alpha is kept
     * @return the bitmap
     */
    public static Bitmap toBitmap(BufferedImage image) {
        int width = image.getWidth();
        int height = image.getHeight();
        Bitmap bitmap = Bitmap.createBitmap(width, height, Bitmap.Config.ARGB_8888);
        ByteBuffer bytes = ByteBuffer.allocate(bitmap.getByteCount());
        int[] row = new int[width];
        for (int y = 0; y < height; ++y) {
            image.getRGB(0, y, width, 1, row, 0, width);
            for (int color : row) {
                bytes.putInt(Integer.rotateLeft(color, 8));
            }
        }
        bytes.flip();
        bitmap.copyPixelsFromBuffer(bytes);
        return bitmap;
    }

    /**
     * Copies a bitmap of {@link Bitmap.Config#ARGB_8888} into a new image.
     *
     * @param bitmap not recycled; rows may be padded
     * @return an image of {@link BufferedImage#TYPE_INT_ARGB}
     * @throws IllegalStateException    when the bitmap is recycled
     * @throws IllegalArgumentException when it is of another configuration
     */
    public static BufferedImage toImage(Bitmap bitmap) {
        return convert(bitmap, BufferedImage.TYPE_INT_ARGB);
    }

    /**
     * Copies a bitmap of {@link Bitmap.Config#ARGB_8888} into a new image without alpha, as JPEG
     * writers want it.
     *
     * @param bitmap not recycled; rows may be padded
     * @return an image of {@link BufferedImage#TYPE_INT_RGB}
     * @throws IllegalStateException    when the bitmap is recycled
     * @throws IllegalArgumentException when it is of another configuration
     */
    public static BufferedImage toOpaqueImage(Bitmap bitmap) {
        return convert(bitmap, BufferedImage.TYPE_INT_RGB);
    }

    private static BufferedImage convert(Bitmap bitmap, int type) {
        if (bitmap.getConfig() != Bitmap.Config.ARGB_8888) {
            throw new IllegalArgumentException("a bitmap of " + bitmap.getConfig());
        }
        int width = bitmap.getWidth();
        int height = bitmap.getHeight();
        ByteBuffer bytes = ByteBuffer.allocate(bitmap.getByteCount());
        bitmap.copyPixelsToBuffer(bytes);
        BufferedImage image = new BufferedImage(width, height, type);
        int[] row = new int[width];
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                row[x] = Integer.rotateRight(bytes.getInt(y * bitmap.getRowBytes() + x * 4), 8);
            }
            image.setRGB(0, y, width, 1, row, 0, width);
        }
        return image;
    }
}
