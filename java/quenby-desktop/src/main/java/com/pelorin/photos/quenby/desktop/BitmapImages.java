package com.pelorin.photos.quenby.desktop;

import android.graphics.Bitmap;
import java.awt.image.BufferedImage;
import java.awt.image.WritableRaster;

/** Turns the images of Java's desktop into bitmaps and back. Stateless; any thread may call. */
public final class BitmapImages {
    private BitmapImages() {}

    /**
     * Copies an image of any kind into a new bitmap of {@link Bitmap.Config#ARGB_8888}, which is
     * premultiplied, and opaque when the image is of an opaque kind.
     *
     * @param image its colours are taken as sRGB, its alpha is kept
     * @return the bitmap, mutable
     */
    public static Bitmap toBitmap(BufferedImage image) {
        int width = image.getWidth();
        int height = image.getHeight();
        Bitmap bitmap = Bitmap.createBitmap(width, height, Bitmap.Config.ARGB_8888);
        int band = rowsAtATime(width, height);
        ColorRows rows = ColorRows.of(image);
        bitmap.setHasAlpha(image.getColorModel().hasAlpha());
        bitmap.setPremultiplied(!rows.premultiplied()); // what is, is stored as it is
        int[] colors = new int[band * width];
        for (int y = 0; y < height; y += band) {
            int count = Math.min(band, height - y);
            rows.read(y, count, colors);
            bitmap.setPixels(colors, 0, width, 0, y, width, count);
        }
        bitmap.setPremultiplied(true);
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
     * @return an image of {@link BufferedImage#TYPE_INT_RGB}, of the colours without their alpha
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
        BufferedImage image = new BufferedImage(width, height, type);
        WritableRaster raster = image.getRaster();
        int band = rowsAtATime(width, height);
        int[] colors = new int[band * width];
        for (int y = 0; y < height; y += band) {
            int count = Math.min(band, height - y);
            bitmap.getPixels(colors, 0, width, 0, y, width, count);
            if (type == BufferedImage.TYPE_INT_RGB) {
                for (int i = 0; i < colors.length; ++i) {
                    colors[i] &= 0xFFFFFF;
                }
            }
            raster.setDataElements(0, y, width, count, colors);
        }
        return image;
    }

    /** Few enough for a cache. */
    private static int rowsAtATime(int width, int height) {
        return Math.max(1, Math.min(height, 8192 / width));
    }
}
