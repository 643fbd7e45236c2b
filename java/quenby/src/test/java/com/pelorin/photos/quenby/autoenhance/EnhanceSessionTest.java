package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.util.Arrays;
import java.util.List;
import java.util.concurrent.Callable;
import java.util.concurrent.CancellationException;
import java.util.concurrent.CountDownLatch;
import java.util.concurrent.CyclicBarrier;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.Future;
import java.util.concurrent.TimeUnit;
import java.util.logging.Handler;
import java.util.logging.LogRecord;
import java.util.logging.Logger;
import org.junit.jupiter.api.Test;

class EnhanceSessionTest {
    private final Bitmap photo = Pictures.photo(50, 40, 2);
    private final Bitmap output = Pictures.sameSize(photo);

    @Test
    void givesWhatTheNativesGive() {
        QuenbyEngine engine = Natives.engine();
        RectF face = new RectF(0.2f, 0.2f, 0.6f, 0.6f);
        long handle = engine.init(photo);
        engine.preprocess(new RectF[] {face}, handle);
        engine.applyAutoEnhanceFilter(handle, output, "AE0", "slider=0.3;");
        engine.releaseSession(handle);
        byte[] expected = Pictures.bytes(output);
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            session.enhance(0.3f, output);
            assertTrue(!Arrays.equals(expected, Pictures.bytes(output)));
            session.setFaces(List.of(face));
            session.enhance(0.3f, output);
            assertArrayEquals(expected, Pictures.bytes(output));
            session.apply("AE0", "slider=0.3;", output);
            assertArrayEquals(expected, Pictures.bytes(output));
            assertEquals(50, session.getWidth());
            assertEquals(40, session.getHeight());
        }
    }

    @Test
    void mayWriteIntoThePhotoItself() {
        byte[] before = Pictures.bytes(photo);
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            session.enhance(0.5f, photo);
            session.apply(Filter.ORIGINAL, null, photo);
        }
        assertArrayEquals(before, Pictures.bytes(photo));
    }

    @Test
    void refusesBitmapsThatCannotBeRead() {
        assertThrows(UnsuitableBitmapException.class, () -> EnhanceSession.open(null));
        assertThrows(UnsuitableBitmapException.class,
                () -> EnhanceSession.open(Bitmap.createBitmap(2, 2, Bitmap.Config.RGB_565)));
        photo.recycle();
        assertThrows(UnsuitableBitmapException.class, () -> EnhanceSession.open(photo));
    }

    @Test
    void refusesOutputsOfAnotherKindOrSize() {
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            for (Bitmap bitmap : new Bitmap[] {null, Pictures.photo(49, 40, 0),
                Pictures.photo(50, 41, 0), Bitmap.createBitmap(50, 40, Bitmap.Config.ARGB_4444)}) {
                assertThrows(UnsuitableBitmapException.class, () -> session.enhance(0.4f, bitmap));
            }
            output.recycle();
            assertThrows(UnsuitableBitmapException.class, () -> session.enhance(0.4f, output));
        }
    }

    @Test
    void refusesUnknownFiltersAndBadParameters() {
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            assertThrows(UnknownFilterException.class, () -> session.apply("Auto", "", output));
            assertThrows(UnknownFilterException.class,
                    () -> session.apply((String) null, "", output));
            assertThrows(UnknownFilterException.class,
                    () -> session.apply((Filter) null, "", output));
            assertThrows(IllegalArgumentException.class,
                    () -> session.apply(Filter.AUTO, "", output));
            assertThrows(IllegalArgumentException.class,
                    () -> session.enhance(Float.NaN, output));
            assertThrows(IllegalArgumentException.class,
                    () -> session.setFaces(Arrays.asList((RectF) null)));
            assertThrows(IllegalArgumentException.class, () -> session.setFaces(
                    List.of(new RectF(0, Float.POSITIVE_INFINITY, 1, 1))));
        }
    }

    @Test
    void refusesWorkAfterItsEnd() {
        EnhanceSession session = EnhanceSession.open(photo);
        session.close();
        session.close();
        assertThrows(SessionClosedException.class, () -> session.enhance(0.4f, output));
        assertThrows(SessionClosedException.class, () -> session.setFaces(List.of()));
    }

    /** While two threads apply and a third closes, a call writes or throws. */
    @Test
    void aCallThatComesAfterTheEndThrows() throws Exception {
        Bitmap pixel = Pictures.photo(1, 1, 2);
        ExecutorService threads = Executors.newFixedThreadPool(2);
        for (int round = 0; round < 1000; ++round) {
            EnhanceSession session = EnhanceSession.open(pixel);
            CyclicBarrier start = new CyclicBarrier(3);
            Callable<Boolean> apply = () -> {
                Bitmap own = Pictures.sameSize(pixel);
                start.await();
                try {
                    for (;;) {
                        own.setPixel(0, 0, 0);
                        session.apply(Filter.ORIGINAL, "", own);
                        if (own.getPixel(0, 0) == 0) {
                            return false;
                        }
                    }
                } catch (SessionClosedException tooLate) {
                    return own.getPixel(0, 0) == 0;
                }
            };
            Future<Boolean> one = threads.submit(apply);
            Future<Boolean> other = threads.submit(apply);
            start.await();
            session.close();
            assertTrue(one.get() && other.get(), "a call returned without having written");
        }
        threads.shutdown();
    }

    @Test
    void anOutputThatIsRecycledMeanwhileIsReported() throws Exception {
        ExecutorService threads = Executors.newFixedThreadPool(1);
        Bitmap large = Pictures.photo(200, 150, 2);
        try (EnhanceSession session = EnhanceSession.open(large)) {
            for (int round = 0; round < 100; ++round) {
                Bitmap own = Pictures.sameSize(large);
                Future<?> recycled = threads.submit(own::recycle);
                int[] returned = {0};
                assertThrows(UnsuitableBitmapException.class, () -> {
                    for (;; ++returned[0]) {
                        session.enhance(0.5f, own);
                    }
                });
                recycled.get();
                assertTrue(own.getTimesLocked() >= returned[0], "a call wrote nothing");
            }
        }
        threads.shutdown();
    }

    @Test
    void isFreedAndLoggedWhenForgotten() throws InterruptedException {
        CountDownLatch warned = new CountDownLatch(1);
        Handler handler = new Handler() {
            @Override
            public void publish(LogRecord message) {
                if (message.getMessage().contains("never closed")) {
                    warned.countDown();
                }
            }

            @Override
            public void flush() {}

            @Override
            public void close() {}
        };
        Logger logger = Logger.getLogger(EnhanceSession.class.getName());
        logger.addHandler(handler);
        logger.setUseParentHandlers(false);
        EnhanceSession.open(photo); // and nobody holds it
        for (int i = 0; i < 100 && warned.getCount() > 0; ++i) {
            System.gc();
            warned.await(10, TimeUnit.MILLISECONDS);
            EnhanceSession.open(photo).close();
        }
        logger.removeHandler(handler);
        logger.setUseParentHandlers(true);
        assertEquals(0, warned.getCount(), "no warning came");
    }

    @Test
    void namesTheParameterThatIsWrong() {
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            for (String params : new String[] {null, "", "slide=0.4;", "slider=much;"}) {
                String message = assertThrows(IllegalArgumentException.class,
                        () -> session.apply(Filter.AUTO, params, output)).getMessage();
                assertTrue(message.contains("AE0") && message.contains("slider"), message);
            }
        }
    }

    @Test
    void givesUpWhatWasCancelled() {
        Cancellation cancellation = new Cancellation();
        byte[] before = Pictures.bytes(output);
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            cancellation.cancel();
            assertThrows(CancellationException.class,
                    () -> session.apply(Filter.AUTO, "slider=0.4;", output, cancellation));
            assertArrayEquals(before, Pictures.bytes(output));
            session.apply(Filter.AUTO, "slider=0.4;", output, new Cancellation());
            assertTrue(!Arrays.equals(before, Pictures.bytes(output)));
        }
    }

    @Test
    void aCallThatIsCancelledAtWorkThrows() throws Exception {
        ExecutorService threads = Executors.newFixedThreadPool(1);
        Bitmap large = Pictures.photo(600, 450, 2);
        Bitmap own = Pictures.sameSize(large);
        String message = "";
        // A call that has its result before it is cancelled, or never begins, proves nothing.
        for (int round = 0; round < 100 && !message.contains("at work"); ++round) {
            Cancellation cancellation = new Cancellation();
            try (EnhanceSession session = EnhanceSession.open(large)) {
                int delay = round % 30;
                Future<?> other = threads.submit(() -> {
                    Thread.sleep(delay);
                    cancellation.cancel();
                    return null;
                });
                try {
                    session.apply(Filter.AUTO, "slider=0.4;", own, cancellation);
                } catch (CancellationException error) {
                    message = error.getMessage();
                    assertTrue(cancellation.isCancelled());
                }
                other.get();
                own.eraseColor(0);
                session.enhance(0.4f, own); // the session is as good as before
                assertTrue(own.getPixel(0, 0) != 0);
            }
        }
        threads.shutdown();
        assertTrue(message.contains("at work"), "no call was cancelled at work: " + message);
    }
}
