package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.io.IOException;
import java.io.OutputStream;
import java.util.Arrays;
import java.util.List;
import java.util.concurrent.Callable;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.stream.Collectors;
import java.util.stream.IntStream;
import org.junit.jupiter.api.Test;

class QuenbyEngineTest {
    private final QuenbyEngine engine = Natives.engine();
    private final Bitmap photo = Pictures.photo(97, 61, 1);
    private final Bitmap output = Pictures.sameSize(photo);

    private long open(Bitmap bitmap) {
        long handle = engine.init(bitmap);
        assertNotEquals(0, handle);
        engine.preprocess(new RectF[0], handle);
        return handle;
    }

    /** What the engine makes of the photo without Java. */
    private byte[] engineResult(Filter filter) throws IOException {
        String tool = System.getProperty("quenby.engine");
        assumeTrue(tool != null, "quenby.engine names no apply_filter to compare with");
        Process process = new ProcessBuilder(tool, "" + photo.getWidth(), "" + photo.getHeight(),
                filter.key(), Pictures.ALL_PARAMETERS)
                        .redirectError(ProcessBuilder.Redirect.INHERIT).start();
        try (OutputStream in = process.getOutputStream()) {
            in.write(Pictures.bytes(photo));
        }
        return process.getInputStream().readAllBytes();
    }

    @Test
    void everyFilterGivesTheEnginesBytes() throws IOException {
        long handle = open(photo);
        for (Filter filter : Filter.values()) {
            engine.applyAutoEnhanceFilter(handle, output, filter.key(), Pictures.ALL_PARAMETERS);
            assertArrayEquals(engineResult(filter), Pictures.bytes(output), filter.key());
        }
        engine.releaseSession(handle);
    }

    @Test
    void paddedRowsAreReadAndWritten() {
        Bitmap padded = Bitmap.createBitmap(97, 61, Bitmap.Config.ARGB_8888, 97 * 4 + 28);
        Bitmap paddedOutput = Bitmap.createBitmap(97, 61, Bitmap.Config.ARGB_8888, 97 * 4 + 4);
        Pictures.fill(padded, 1);
        long handle = open(padded);
        engine.applyAutoEnhanceFilter(handle, paddedOutput, "PassThrough", "");
        for (int y = 0; y < 61; ++y) {
            for (int x = 0; x < 97; ++x) {
                assertEquals(photo.getPixel(x, y), paddedOutput.getPixel(x, y));
            }
        }
        engine.releaseSession(handle);
    }

    @Test
    void locksAreGivenBack() {
        long handle = open(photo);
        engine.applyAutoEnhanceFilter(handle, output, "AE0", "slider=0.4;");
        engine.releaseSession(handle);
        assertEquals(1, photo.getTimesLocked());
        assertEquals(1, output.getTimesLocked());
        assertEquals(0, photo.getLockCount() + output.getLockCount());
    }

    @Test
    void bitmapsThatCannotBeReadOpenNothing() {
        assertEquals(0, engine.init(null));
        for (Bitmap.Config config : Bitmap.Config.values()) {
            if (config != Bitmap.Config.ARGB_8888 && config != Bitmap.Config.HARDWARE) {
                assertEquals(0, engine.init(Bitmap.createBitmap(4, 4, config)));
            }
        }
        assertEquals(0, engine.init(photo.copy(Bitmap.Config.HARDWARE, false)));
        photo.recycle();
        assertEquals(0, engine.init(photo));
    }

    @Test
    void unknownNamesGiveThePhoto() {
        long handle = open(photo);
        for (String name : new String[] {"NoSuchFilter", "", null, "Original", "ae0", "\ud83d"}) {
            output.eraseColor(0);
            engine.applyAutoEnhanceFilter(handle, output, name, null);
            assertArrayEquals(Pictures.bytes(photo), Pictures.bytes(output));
        }
        engine.releaseSession(handle);
    }

    @Test
    void unsuitableOutputsStayAsTheyWere() {
        long handle = open(photo);
        Bitmap small = Bitmap.createBitmap(96, 61, Bitmap.Config.ARGB_8888);
        Bitmap other = Bitmap.createBitmap(97, 61, Bitmap.Config.RGB_565);
        byte[] before = Pictures.bytes(small);
        engine.applyAutoEnhanceFilter(handle, small, "PassThrough", "");
        engine.applyAutoEnhanceFilter(handle, other, "PassThrough", "");
        engine.applyAutoEnhanceFilter(handle, null, "PassThrough", "");
        output.recycle();
        engine.applyAutoEnhanceFilter(handle, output, "PassThrough", "");
        assertArrayEquals(before, Pictures.bytes(small));
        engine.releaseSession(handle);
    }

    @Test
    void parametersThatAreMissingOrUnreadableAreIllegalArguments() {
        long handle = open(photo);
        for (String params : new String[] {null, "", "slider=", "slider=much;", "other=1;"}) {
            assertThrows(IllegalArgumentException.class,
                    () -> engine.applyAutoEnhanceFilter(handle, output, "AE0", params), params);
        }
        engine.releaseSession(handle);
    }

    @Test
    void handlesThatAreNoSessionDoNothing() {
        long stale = open(photo);
        engine.releaseSession(stale);
        byte[] before = Pictures.bytes(output);
        long unprepared = engine.init(photo);
        for (long handle :
                new long[] {0, stale, -1, 1, Long.MIN_VALUE, Long.MAX_VALUE, unprepared}) {
            if (handle != unprepared) {
                engine.preprocess(new RectF[0], handle);
            }
            engine.applyAutoEnhanceFilter(handle, output, "PassThrough", "");
            engine.releaseSession(handle);
            engine.releaseSession(handle);
        }
        assertArrayEquals(before, Pictures.bytes(output));
    }

    @Test
    void nullFacesAreNone() {
        long handle = engine.init(photo);
        engine.preprocess(null, handle);
        engine.applyAutoEnhanceFilter(handle, output, "AE0", "slider=0.4;");
        byte[] withNull = Pictures.bytes(output);
        engine.preprocess(new RectF[] {null, null}, handle);
        engine.applyAutoEnhanceFilter(handle, output, "AE0", "slider=0.4;");
        assertArrayEquals(withNull, Pictures.bytes(output));
        engine.releaseSession(handle);
    }

    @Test
    void facesChangeTheResult() {
        long handle = open(photo);
        engine.applyAutoEnhanceFilter(handle, output, "AE0", "slider=0.8;");
        byte[] without = Pictures.bytes(output);
        engine.preprocess(new RectF[] {new RectF(0, 0, 0.3f, 0.3f)}, handle);
        engine.applyAutoEnhanceFilter(handle, output, "AE0", "slider=0.8;");
        assertFalse(Arrays.equals(without, Pictures.bytes(output)));
        engine.releaseSession(handle);
    }

    @Test
    void thousandsOfFacesNeedNoLocalReferences() {
        RectF[] faces = new RectF[20000];
        Arrays.setAll(faces, i -> new RectF(0.1f, 0.1f, 0.2f, 0.2f));
        long handle = engine.init(photo);
        engine.preprocess(faces, handle);
        engine.releaseSession(handle);
    }

    @Test
    void oneSessionServesEightThreads() throws Exception {
        long handle = open(photo);
        byte[][] expected = new byte[Filter.values().length][];
        for (Filter filter : Filter.values()) {
            engine.applyAutoEnhanceFilter(handle, output, filter.key(), Pictures.ALL_PARAMETERS);
            expected[filter.ordinal()] = Pictures.bytes(output);
        }
        engine.preprocess(new RectF[0], handle); // prepared anew, by several threads at once
        ExecutorService threads = Executors.newFixedThreadPool(8);
        List<Callable<Void>> work = IntStream.range(0, 8).<Callable<Void>>mapToObj(thread -> () -> {
            Bitmap own = Pictures.sameSize(photo);
            for (int i = 0; i < 10; ++i) {
                Filter filter = Filter.values()[(thread + i) % Filter.values().length];
                engine.applyAutoEnhanceFilter(handle, own, filter.key(), Pictures.ALL_PARAMETERS);
                assertArrayEquals(expected[filter.ordinal()], Pictures.bytes(own), filter.key());
            }
            return null;
        }).collect(Collectors.toList());
        for (var result : threads.invokeAll(work)) {
            result.get();
        }
        threads.shutdown();
        engine.releaseSession(handle);
    }
}
