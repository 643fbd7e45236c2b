package com.pelorin.photos.quenby.desktop;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import android.graphics.Bitmap;
import java.awt.image.BufferedImage;
import java.nio.ByteBuffer;
import java.util.Arrays;
import java.util.Random;
import org.junit.jupiter.api.Test;

class BitmapImagesTest {
    private static int[] colors(BufferedImage image) {
        return image.getRGB(0, 0, image.getWidth(), image.getHeight(), null, 0, image.getWidth());
    }

    private static int[] colors(Bitmap bitmap) {
        int[] colors = new int[bitmap.getWidth() * bitmap.getHeight()];
        bitmap.getPixels(colors, 0, bitmap.getWidth(), 0, 0, bitmap.getWidth(),
                bitmap.getHeight());
        return colors;
    }

    private static byte[] bytes(Bitmap bitmap) {
        ByteBuffer buffer = ByteBuffer.allocate(bitmap.getByteCount());
        bitmap.copyPixelsToBuffer(buffer);
        return buffer.array();
    }

    /** What the general way makes of an image: its colours one by one, multiplied and stored. */
    private static Bitmap slowly(BufferedImage image) {
        Bitmap bitmap = Bitmap.createBitmap(
                image.getWidth(), image.getHeight(), Bitmap.Config.ARGB_8888);
        for (int y = 0; y < image.getHeight(); ++y) {
            for (int x = 0; x < image.getWidth(); ++x) {
                bitmap.setPixel(x, y, image.getRGB(x, y));
            }
        }
        return bitmap;
    }

    @Test
    void everyKindOfImageGivesItsColours() {
        Random random = new Random(5);
        for (int type = BufferedImage.TYPE_INT_RGB; type <= BufferedImage.TYPE_BYTE_INDEXED;
                ++type) {
            BufferedImage whole = new BufferedImage(1100, 9, type); // in several bands and parts
            for (int i = 0; i < 1100 * 9; ++i) {
                boolean opaque = i % 3 == 0 || i % 1100 > 900;
                whole.setRGB(i % 1100, i / 1100, random.nextInt() | (opaque ? 0xFF000000 : 0));
            }
            for (BufferedImage image : new BufferedImage[] {
                whole, whole.getSubimage(5, 2, 31, 6), whole.getSubimage(8, 1, 1, 1)}) {
                Bitmap bitmap = BitmapImages.toBitmap(image);
                assertArrayEquals(bytes(slowly(image)), bytes(bitmap), "type " + type);
                assertEquals(image.getColorModel().hasAlpha(), bitmap.hasAlpha(), "type " + type);
                BufferedImage back = BitmapImages.toImage(bitmap);
                assertArrayEquals(colors(bitmap), colors(back), "type " + type);
                if (!image.getColorModel().hasAlpha()) {
                    assertArrayEquals(colors(image), colors(back), "type " + type);
                }
            }
        }
    }

    @Test
    void opaqueColoursSurviveBothWays() {
        BufferedImage image = new BufferedImage(3, 2, BufferedImage.TYPE_INT_ARGB);
        image.setRGB(2, 1, 0x80FF4020);
        image.setRGB(0, 0, 0xFF010203);
        Bitmap bitmap = BitmapImages.toBitmap(image);
        assertTrue(bitmap.isPremultiplied() && bitmap.isMutable());
        BufferedImage back = BitmapImages.toImage(bitmap);
        assertEquals(0x80FF4020, back.getRGB(2, 1));
        assertEquals(0xFF010203, back.getRGB(0, 0));
        assertArrayEquals(bytes(bitmap), bytes(BitmapImages.toBitmap(back)));
    }

    @Test
    void premultipliedImagesAreStoredAsTheyAre() {
        BufferedImage image = new BufferedImage(1, 1, BufferedImage.TYPE_INT_ARGB_PRE);
        image.getRaster().setDataElements(0, 0, new int[] {0x80402010});
        Bitmap bitmap = BitmapImages.toBitmap(image);
        assertArrayEquals(new byte[] {0x40, 0x20, 0x10, (byte) 0x80}, bytes(bitmap));
        assertTrue(bitmap.isPremultiplied());
    }

    @Test
    void opaqueKindsGiveOpaqueBitmaps() {
        BufferedImage image = new BufferedImage(1, 1, BufferedImage.TYPE_INT_RGB);
        assertFalse(BitmapImages.toBitmap(image).hasAlpha());
        assertArrayEquals(new byte[] {0, 0, 0, -1}, bytes(BitmapImages.toBitmap(image)));
    }

    @Test
    void paddedRowsBecomeImages() {
        Bitmap bitmap = Bitmap.createBitmap(2, 2, Bitmap.Config.ARGB_8888, 20);
        bitmap.setPixel(1, 1, 0xFF123456);
        assertEquals(0xFF123456, BitmapImages.toImage(bitmap).getRGB(1, 1));
    }

    @Test
    void opaqueImagesDropAlpha() {
        Bitmap bitmap = Bitmap.createBitmap(2, 1, Bitmap.Config.ARGB_8888);
        bitmap.setPremultiplied(false);
        bitmap.setPixel(0, 0, 0x00123456);
        BufferedImage image = BitmapImages.toOpaqueImage(bitmap);
        assertEquals(0xFF123456, image.getRGB(0, 0));
        assertEquals("[1193046]",
                Arrays.toString((int[]) image.getRaster().getDataElements(0, 0, null)));
    }

    @Test
    void otherBitmapsAreRefused() {
        assertThrows(IllegalArgumentException.class,
                () -> BitmapImages.toImage(Bitmap.createBitmap(1, 1, Bitmap.Config.RGB_565)));
    }
}
