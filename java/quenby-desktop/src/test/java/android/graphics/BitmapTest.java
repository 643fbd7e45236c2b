package android.graphics;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.nio.ByteBuffer;
import org.junit.jupiter.api.Test;

class BitmapTest {
    @Test
    void startsTransparentBlack() {
        Bitmap bitmap = Bitmap.createBitmap(3, 2, Bitmap.Config.ARGB_8888);
        assertEquals(0, bitmap.getPixel(2, 1));
        assertEquals(12, bitmap.getRowBytes());
        assertEquals(24, bitmap.getByteCount());
    }

    @Test
    void storesRedGreenBlueAlpha() {
        Bitmap bitmap = Bitmap.createBitmap(2, 2, Bitmap.Config.ARGB_8888, 12);
        bitmap.setPixel(1, 1, 0x84818283);
        assertEquals(0x84818283, bitmap.getPixel(1, 1));
        ByteBuffer bytes = ByteBuffer.allocate(24);
        bitmap.copyPixelsToBuffer(bytes);
        assertEquals(0x81828384, bytes.getInt(16));
    }

    @Test
    void copiesItsBytesBothWays() {
        ByteBuffer bytes = ByteBuffer.allocate(40);
        for (int i = 0; i < 40; ++i) {
            bytes.put(i, (byte) i);
        }
        Bitmap bitmap = Bitmap.createBitmap(2, 2, Bitmap.Config.ARGB_8888);
        bitmap.copyPixelsFromBuffer(bytes);
        assertEquals(0x0F0C0D0E, bitmap.getPixel(1, 1));
        ByteBuffer back = ByteBuffer.allocate(16);
        bitmap.copyPixelsToBuffer(back);
        assertEquals(15, back.get(15));
    }

    @Test
    void refusesSizesThatCannotBe() {
        assertThrows(IllegalArgumentException.class,
                () -> Bitmap.createBitmap(-1, 1, Bitmap.Config.ARGB_8888));
        assertThrows(IllegalArgumentException.class,
                () -> Bitmap.createBitmap(4, 4, Bitmap.Config.ARGB_8888, 15));
        assertThrows(IllegalArgumentException.class,
                () -> Bitmap.createBitmap(40000, 40000, Bitmap.Config.ARGB_8888));
        assertThrows(IllegalArgumentException.class,
                () -> Bitmap.createBitmap(Integer.MAX_VALUE, 1, Bitmap.Config.ARGB_8888));
    }

    @Test
    void hasNoPixelsOutsideItself() {
        Bitmap bitmap = Bitmap.createBitmap(3, 2, Bitmap.Config.ARGB_8888);
        assertThrows(IllegalArgumentException.class, () -> bitmap.getPixel(3, 0));
        assertThrows(IllegalArgumentException.class, () -> bitmap.setPixel(0, -1, 0));
        assertThrows(IllegalStateException.class,
                () -> Bitmap.createBitmap(1, 1, Bitmap.Config.RGB_565).getPixel(0, 0));
    }

    @Test
    void isOfNoUseOnceRecycled() {
        Bitmap bitmap = Bitmap.createBitmap(3, 2, Bitmap.Config.ARGB_8888);
        assertFalse(bitmap.isRecycled());
        bitmap.recycle();
        bitmap.recycle();
        assertTrue(bitmap.isRecycled());
        assertThrows(IllegalStateException.class, () -> bitmap.getPixel(0, 0));
        assertThrows(IllegalStateException.class,
                () -> bitmap.copyPixelsToBuffer(ByteBuffer.allocate(24)));
    }

    @Test
    void rectanglesHaveFourEdges() {
        RectF rectangle = new RectF(1, 2, 3, 4);
        assertEquals("RectF(1.0, 2.0, 3.0, 4.0)", rectangle.toString());
        assertEquals(0, new RectF().bottom);
    }
}
