package android.graphics;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNull;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.nio.ByteBuffer;
import java.nio.ByteOrder;
import java.nio.CharBuffer;
import java.nio.IntBuffer;
import java.nio.ShortBuffer;
import java.util.Arrays;
import org.junit.jupiter.api.Test;

class BitmapTest {
    private static Bitmap bitmap(int width, int height) {
        return Bitmap.createBitmap(width, height, Bitmap.Config.ARGB_8888);
    }

    private static byte[] bytes(Bitmap bitmap) {
        ByteBuffer buffer = ByteBuffer.allocate(bitmap.getByteCount());
        bitmap.copyPixelsToBuffer(buffer);
        return buffer.array();
    }

    @Test
    void startsTransparentBlack() {
        Bitmap bitmap = bitmap(3, 2);
        assertEquals(0, bitmap.getPixel(2, 1));
        assertEquals(12, bitmap.getRowBytes());
        assertEquals(24, bitmap.getByteCount());
        assertTrue(bitmap.isMutable() && bitmap.hasAlpha() && bitmap.isPremultiplied());
    }

    @Test
    void startsOpaqueBlackWithoutAlpha() {
        Bitmap bitmap = Bitmap.createBitmap(2, 1, Bitmap.Config.ARGB_8888, false);
        assertFalse(bitmap.hasAlpha());
        assertArrayEquals(new byte[] {0, 0, 0, -1, 0, 0, 0, -1}, bytes(bitmap));
    }

    @Test
    void storesRedGreenBlueAlpha() {
        Bitmap bitmap = Bitmap.createBitmap(2, 2, Bitmap.Config.ARGB_8888, 12);
        bitmap.setPixel(1, 1, 0xFF818283);
        assertEquals(0xFF818283, bitmap.getPixel(1, 1));
        assertEquals(0x818283FF, ByteBuffer.wrap(bytes(bitmap)).getInt(16));
    }

    @Test
    void storesColoursMultipliedByTheirAlpha() {
        Bitmap bitmap = bitmap(1, 1);
        bitmap.setPixel(0, 0, 0x80FF8001);
        assertArrayEquals(new byte[] {(byte) 0x80, 0x40, 1, (byte) 0x80}, bytes(bitmap));
        assertEquals(0x80FF8002, bitmap.getPixel(0, 0)); // 1 of 128 is 1.99 of 255
        bitmap.setPixel(0, 0, 0x00FFFFFF);
        assertEquals(0, bitmap.getPixel(0, 0));
    }

    /** Every channel under every alpha, against the quotients in double precision. */
    @Test
    void roundsToNearest() {
        Bitmap bitmap = bitmap(256, 256);
        int[] colors = new int[256 * 256];
        Arrays.setAll(colors, i -> i / 256 << 24 | i % 256 << 16 | i % 256 << 8 | 255 - i % 256);
        bitmap.setPixels(colors, 0, 256, 0, 0, 256, 256);
        byte[] stored = bytes(bitmap);
        int[] read = new int[256 * 256];
        bitmap.getPixels(read, 0, 256, 0, 0, 256, 256);
        for (int i = 0; i < colors.length; ++i) {
            int alpha = i / 256;
            for (int band = 0; band < 3; ++band) {
                int channel = colors[i] >> 16 - 8 * band & 0xFF;
                int multiplied = (int) Math.floor(channel * alpha / 255.0 + 0.5);
                assertEquals(multiplied, stored[4 * i + band] & 0xFF, channel + " of " + alpha);
                int divided = alpha == 0 ? 0
                        : (int) Math.min(255, Math.floor(multiplied * 255.0 / alpha + 0.5));
                assertEquals(divided, read[i] >> 16 - 8 * band & 0xFF, channel + " of " + alpha);
            }
            assertEquals(alpha, stored[4 * i + 3] & 0xFF);
            assertEquals(alpha, read[i] >>> 24);
        }
        bitmap.setPixels(read, 0, 256, 0, 0, 256, 256);
        assertArrayEquals(stored, bytes(bitmap)); // nothing is lost twice
    }

    @Test
    void clampsStoredColoursAboveTheirAlpha() {
        Bitmap bitmap = bitmap(1, 1);
        bitmap.copyPixelsFromBuffer(ByteBuffer.wrap(new byte[] {100, 50, 51, 50}));
        assertEquals(0x32FFFFFF, bitmap.getPixel(0, 0));
    }

    @Test
    void storesColoursAsTheyAreWhenToldSo() {
        Bitmap bitmap = bitmap(1, 1);
        bitmap.setPremultiplied(false);
        assertFalse(bitmap.isPremultiplied());
        bitmap.setPixel(0, 0, 0x01FF8001);
        assertEquals(0x01FF8001, bitmap.getPixel(0, 0));
        assertArrayEquals(new byte[] {-1, (byte) 0x80, 1, 1}, bytes(bitmap));
        bitmap.setPremultiplied(true); // changes no byte
        assertArrayEquals(new byte[] {-1, (byte) 0x80, 1, 1}, bytes(bitmap));
    }

    @Test
    void readsAnOpaqueBitmapWithFullAlpha() {
        Bitmap bitmap = bitmap(1, 1);
        bitmap.copyPixelsFromBuffer(ByteBuffer.wrap(new byte[] {100, 50, 51, 50}));
        bitmap.setHasAlpha(false);
        assertEquals(0xFF643233, bitmap.getPixel(0, 0));
        assertFalse(bitmap.isPremultiplied());
        bitmap.setHasAlpha(true);
        assertTrue(bitmap.isPremultiplied());
        Bitmap opaque = Bitmap.createBitmap(1, 1, Bitmap.Config.RGB_565);
        opaque.setHasAlpha(true);
        assertFalse(opaque.hasAlpha());
        Bitmap mask = Bitmap.createBitmap(1, 1, Bitmap.Config.ALPHA_8);
        mask.setHasAlpha(false);
        assertTrue(mask.hasAlpha());
    }

    @Test
    void readsAndWritesRectangles() {
        Bitmap bitmap = Bitmap.createBitmap(4, 3, Bitmap.Config.ARGB_8888, 19);
        int[] colors = {0, -1, -2, -3, 0, -4, -5, -6};
        bitmap.setPixels(colors, 1, 4, 1, 1, 3, 2);
        assertEquals(0, bitmap.getPixel(0, 1));
        assertEquals(-1, bitmap.getPixel(1, 1));
        assertEquals(-6, bitmap.getPixel(3, 2));
        int[] upsideDown = new int[6];
        bitmap.getPixels(upsideDown, 3, -3, 1, 1, 3, 2);
        assertArrayEquals(new int[] {-4, -5, -6, -1, -2, -3}, upsideDown);
        bitmap.getPixels(new int[0], 0, 0, 4, 3, 0, 0);
    }

    @Test
    void refusesRectanglesThatAreNotInside() {
        Bitmap bitmap = bitmap(4, 3);
        int[] colors = new int[12];
        for (int[] at : new int[][] {{-1, 0, 1, 1}, {0, -1, 1, 1}, {0, 0, 5, 1}, {0, 0, 1, 4},
            {2, 0, 3, 1}, {0, 2, 1, 2}, {0, 0, -1, 1}, {0, 0, 1, -1},
            {1, 1, Integer.MAX_VALUE, 1}, {1, 1, 1, Integer.MAX_VALUE}}) {
            assertThrows(IllegalArgumentException.class,
                    () -> bitmap.setPixels(colors, 0, 4, at[0], at[1], at[2], at[3]));
            assertThrows(IllegalArgumentException.class,
                    () -> bitmap.getPixels(colors, 0, 4, at[0], at[1], at[2], at[3]));
        }
        assertThrows(IllegalArgumentException.class,
                () -> bitmap.setPixels(colors, 0, 3, 0, 0, 4, 1));
        for (int[] of : new int[][] {{-1, 4}, {1, 4}, {0, 5}, {7, -4}, {0, Integer.MAX_VALUE},
            {0, Integer.MIN_VALUE}}) {
            assertThrows(ArrayIndexOutOfBoundsException.class,
                    () -> bitmap.setPixels(colors, of[0], of[1], 0, 0, 4, 3));
            assertThrows(ArrayIndexOutOfBoundsException.class,
                    () -> bitmap.getPixels(colors, of[0], of[1], 0, 0, 4, 3));
        }
    }

    @Test
    void copiesItsBytesBothWays() {
        ByteBuffer bytes = ByteBuffer.allocate(40);
        for (int i = 0; i < 40; ++i) {
            bytes.put(i, (byte) i);
        }
        Bitmap bitmap = bitmap(2, 2);
        bitmap.setPremultiplied(false);
        bytes.position(3);
        bitmap.copyPixelsFromBuffer(bytes);
        assertEquals(19, bytes.position());
        assertEquals(0x120F1011, bitmap.getPixel(1, 1));
        ByteBuffer back = ByteBuffer.allocate(20);
        back.position(1);
        bitmap.copyPixelsToBuffer(back);
        assertEquals(17, back.position());
        assertEquals(18, back.get(16));
    }

    /** Ints and shorts show the bytes in the buffer's order, on the heap the machine's. */
    @Test
    void copiesThroughIntsAndShorts() {
        byte[] content = new byte[16];
        for (int i = 0; i < 16; ++i) {
            content[i] = (byte) (i * 17);
        }
        for (ByteOrder order : new ByteOrder[] {ByteOrder.BIG_ENDIAN, ByteOrder.LITTLE_ENDIAN}) {
            ByteBuffer memory = ByteBuffer.allocateDirect(20).order(order);
            memory.position(4);
            memory.put(content);
            memory.position(4);
            IntBuffer ints = memory.asIntBuffer();
            ShortBuffer shorts = memory.asShortBuffer();
            for (int i = 0; i < 2; ++i) {
                Bitmap bitmap = bitmap(2, 2);
                bitmap.copyPixelsFromBuffer(i == 0 ? ints : shorts);
                assertArrayEquals(content, bytes(bitmap));
                memory.duplicate().put(new byte[16]);
                (i == 0 ? ints : shorts).rewind();
                bitmap.copyPixelsToBuffer(i == 0 ? ints : shorts);
                byte[] back = new byte[16];
                memory.duplicate().get(back);
                assertArrayEquals(content, back);
            }
            assertEquals(4, ints.position());
            assertEquals(8, shorts.position());
        }
        IntBuffer onTheHeap = IntBuffer.wrap(new int[] {0x44332211, 0, 0, 0});
        Bitmap bitmap = bitmap(1, 1);
        bitmap.copyPixelsFromBuffer(onTheHeap);
        assertEquals(1, onTheHeap.position());
        byte first = ByteOrder.nativeOrder() == ByteOrder.LITTLE_ENDIAN ? (byte) 0x11 : 0x44;
        assertEquals(first, bytes(bitmap)[0]);
    }

    @Test
    void refusesBuffersThatAreTooSmallOrOfAnotherKind() {
        Bitmap bitmap = bitmap(2, 2);
        ByteBuffer full = ByteBuffer.allocate(16);
        full.position(1);
        for (var buffer : new java.nio.Buffer[] {ByteBuffer.allocate(15), ShortBuffer.allocate(7),
            IntBuffer.allocate(3), full, CharBuffer.allocate(16)}) {
            int before = buffer.position();
            assertThrows(RuntimeException.class, () -> bitmap.copyPixelsToBuffer(buffer));
            assertThrows(RuntimeException.class, () -> bitmap.copyPixelsFromBuffer(buffer));
            assertEquals(before, buffer.position());
        }
    }

    @Test
    void immutableOnesCannotBeWritten() {
        int[] colors = {0xFF010203, 0xFF040506};
        Bitmap bitmap = Bitmap.createBitmap(colors, 2, 1, Bitmap.Config.ARGB_8888);
        assertFalse(bitmap.isMutable());
        assertThrows(IllegalStateException.class, () -> bitmap.setPixel(0, 0, 0));
        assertThrows(IllegalStateException.class,
                () -> bitmap.setPixels(colors, 0, 2, 0, 0, 2, 1));
        assertThrows(IllegalStateException.class, () -> bitmap.eraseColor(0));
        assertThrows(IllegalStateException.class,
                () -> bitmap.copyPixelsFromBuffer(ByteBuffer.allocate(8)));
        assertEquals(0xFF040506, bitmap.getPixel(1, 0));
        Bitmap copy = bitmap.copy(Bitmap.Config.ARGB_8888, true);
        copy.eraseColor(-1);
        assertEquals(-1, copy.getPixel(1, 0));
        assertEquals(0xFF040506, bitmap.getPixel(1, 0));
    }

    @Test
    void aCopyKeepsWhatTheBitmapIs() {
        Bitmap bitmap = bitmap(2, 2);
        bitmap.setPremultiplied(false);
        bitmap.setDensity(Bitmap.DENSITY_NONE);
        Bitmap copy = bitmap.copy(Bitmap.Config.ARGB_8888, false);
        assertFalse(copy.isPremultiplied() || copy.isMutable());
        assertEquals(Bitmap.DENSITY_NONE, copy.getDensity());
        assertEquals(160, bitmap(1, 1).getDensity());
        assertNull(bitmap.copy(Bitmap.Config.RGB_565, false));
    }

    @Test
    void hardwarePixelsAreOutOfReach() {
        assertThrows(IllegalArgumentException.class,
                () -> Bitmap.createBitmap(1, 1, Bitmap.Config.HARDWARE));
        Bitmap bitmap = bitmap(1, 1);
        bitmap.setPixel(0, 0, 0xFF010203);
        assertThrows(IllegalArgumentException.class,
                () -> bitmap.copy(Bitmap.Config.HARDWARE, true));
        Bitmap hardware = bitmap.copy(Bitmap.Config.HARDWARE, false);
        assertEquals(Bitmap.Config.HARDWARE, hardware.getConfig());
        assertThrows(IllegalStateException.class, () -> hardware.getPixel(0, 0));
        assertThrows(IllegalStateException.class,
                () -> hardware.copyPixelsToBuffer(ByteBuffer.allocate(4)));
        assertEquals(0xFF010203,
                hardware.copy(Bitmap.Config.ARGB_8888, false).getPixel(0, 0));
    }

    @Test
    void halfPrecisionTakesEightBytes() {
        assertEquals(6 * 8, Bitmap.createBitmap(3, 2, Bitmap.Config.RGBA_F16).getByteCount());
    }

    @Test
    void refusesSizesThatCannotBe() {
        for (int[] size : new int[][] {{-1, 1}, {0, 0}, {0, 1}, {1, 0}, {40000, 40000},
            {Integer.MAX_VALUE, 1}}) {
            assertThrows(IllegalArgumentException.class, () -> bitmap(size[0], size[1]));
        }
        assertThrows(IllegalArgumentException.class,
                () -> Bitmap.createBitmap(4, 4, Bitmap.Config.ARGB_8888, 15));
    }

    @Test
    void hasNoPixelsOutsideItself() {
        Bitmap bitmap = bitmap(3, 2);
        assertThrows(IllegalArgumentException.class, () -> bitmap.getPixel(3, 0));
        assertThrows(IllegalArgumentException.class, () -> bitmap.setPixel(0, -1, 0));
        assertThrows(IllegalStateException.class,
                () -> Bitmap.createBitmap(1, 1, Bitmap.Config.RGB_565).getPixel(0, 0));
    }

    @Test
    void isOfNoUseOnceRecycled() {
        Bitmap bitmap = bitmap(3, 2);
        assertFalse(bitmap.isRecycled());
        bitmap.recycle();
        bitmap.recycle();
        assertTrue(bitmap.isRecycled());
        assertThrows(IllegalStateException.class, () -> bitmap.getPixel(0, 0));
        assertThrows(IllegalStateException.class,
                () -> bitmap.copyPixelsToBuffer(ByteBuffer.allocate(24)));
        assertThrows(IllegalStateException.class,
                () -> bitmap.copy(Bitmap.Config.ARGB_8888, true));
    }

    @Test
    void rectanglesHaveFourEdges() {
        RectF rectangle = new RectF(1, 2, 3, 4);
        assertEquals("RectF(1.0, 2.0, 3.0, 4.0)", rectangle.toString());
        assertEquals(0, new RectF().bottom);
    }
}
