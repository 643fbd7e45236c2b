package com.pelorin.photos.quenby.desktop;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;

import android.graphics.Bitmap;
import java.awt.image.BufferedImage;
import org.junit.jupiter.api.Test;

class BitmapImagesTest {
    @Test
    void colourAndAlphaSurviveBothWays() {
        BufferedImage image = new BufferedImage(3, 2, BufferedImage.TYPE_INT_ARGB);
        image.setRGB(2, 1, 0x80FF4020);
        image.setRGB(0, 0, 0xFF010203);
        Bitmap bitmap = BitmapImages.toBitmap(image);
        assertEquals(0x80FF4020, bitmap.getPixel(2, 1));
        BufferedImage back = BitmapImages.toImage(bitmap);
        assertEquals(0x80FF4020, back.getRGB(2, 1));
        assertEquals(0xFF010203, back.getRGB(0, 0));
    }

    @Test
    void imagesOfAnyKindBecomeBitmaps() {
        for (int type : new int[] {BufferedImage.TYPE_3BYTE_BGR, BufferedImage.TYPE_INT_RGB,
            BufferedImage.TYPE_4BYTE_ABGR, BufferedImage.TYPE_USHORT_565_RGB}) {
            BufferedImage image = new BufferedImage(2, 2, type);
            image.setRGB(1, 0, 0xFFFF0000);
            assertEquals(0xFFFF0000, BitmapImages.toBitmap(image).getPixel(1, 0), "type " + type);
        }
    }

    @Test
    void paddedRowsBecomeImages() {
        Bitmap bitmap = Bitmap.createBitmap(2, 2, Bitmap.Config.ARGB_8888, 20);
        bitmap.setPixel(1, 1, 0xFF123456);
        assertEquals(0xFF123456, BitmapImages.toImage(bitmap).getRGB(1, 1));
    }

    @Test
    void opaqueImagesDropAlpha() {
        Bitmap bitmap = Bitmap.createBitmap(1, 1, Bitmap.Config.ARGB_8888);
        bitmap.setPixel(0, 0, 0x00123456);
        assertEquals(0xFF123456, BitmapImages.toOpaqueImage(bitmap).getRGB(0, 0));
    }

    @Test
    void otherBitmapsAreRefused() {
        assertThrows(IllegalArgumentException.class,
                () -> BitmapImages.toImage(Bitmap.createBitmap(1, 1, Bitmap.Config.RGB_565)));
    }
}
