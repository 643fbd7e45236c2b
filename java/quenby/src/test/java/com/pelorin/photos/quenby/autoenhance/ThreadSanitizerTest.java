package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assumptions.assumeFalse;

import android.graphics.Bitmap;
import android.graphics.RectF;
import com.pelorin.photos.quenby.desktop.NativeLog;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.Future;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** Threads that share natives, watched by the thread sanitizer the libraries were built with. */
class ThreadSanitizerTest {
    private static final int THREADS = 8;
    private static final String REPORT = "WARNING: ThreadSanitizer";

    @TempDir Path folder;

    private static ChildJvm run(Class<?> main, String... arguments) throws Exception {
        String runtime = System.getProperty("quenby.tsan.runtime", "");
        assumeFalse(runtime.isEmpty(), "quenby.tsan.runtime names no thread sanitizer");
        // The virtual machine is not instrumented and handles faults of its own.
        String options = "handle_segv=0 ignore_noninstrumented_modules=1 exitcode=66";
        return ChildJvm.run("export LD_PRELOAD=" + runtime + " TSAN_OPTIONS='" + options + "';",
                List.of("-Xint", "-XX:+UseSerialGC"), main, arguments);
    }

    /** What all threads do at once. */
    private interface Work {
        void run(int thread) throws Exception;
    }

    private static void inThreads(Work work) throws Exception {
        ExecutorService threads = Executors.newFixedThreadPool(THREADS);
        List<Future<Void>> results = new ArrayList<>();
        for (int i = 0; i < THREADS; ++i) {
            int thread = i;
            results.add(threads.submit(() -> {
                work.run(thread);
                return null;
            }));
        }
        for (Future<Void> result : results) {
            result.get();
        }
        threads.shutdown();
    }

    @Test
    void aRaceIsReported() throws Exception {
        ChildJvm child = run(PlantedRace.class, System.getProperty("quenby.planted.race", ""));
        assertTrue(child.output.contains(REPORT), child.output);
        assertTrue(child.output.contains("planted_race.cpp"), child.output);
        assertEquals(66, child.exitCode, child.output);
    }

    /** Counts without a lock, in a library of its own. */
    static final class PlantedRace {
        private PlantedRace() {}

        private static native void count();

        public static void main(String[] library) throws Exception {
            System.load(library[0]);
            inThreads(thread -> {
                for (int i = 0; i < 1000; ++i) {
                    count();
                }
            });
        }
    }

    @Test
    void eightThreadsShareASession() throws Exception {
        String input = Pictures.jpeg(folder.resolve("in.jpg"), 40, 30, 1).toString();
        ChildJvm child = run(SharedSession.class, input, folder.toString());
        assertFalse(child.output.contains("ThreadSanitizer"), child.output);
        assertEquals(0, child.exitCode, child.output);
        assertTrue(child.output.contains("calls shared a session"), child.output);
    }

    /** Every native from eight threads, most of them with one handle. */
    static final class SharedSession {
        private static final RectF[][] FACES = {{}, {new RectF(0.2f, 0.1f, 0.5f, 0.6f)}};
        private static final String[] PARAMETERS = {
            "slider=0.2;s1=0.4;s2=0.6;s3=0.5;s4=0.55;", "slider=0.7;s1=0.5;s2=0.5;s3=0.6;s4=0.4;"};
        private static final int ROUNDS = 10;
        private static final int STEPS = 2 * Filter.values().length;

        private final QuenbyEngine engine = Natives.engine();
        private final Bitmap photo = Pictures.photo(48, 36, 1);
        /** By faces and step. */
        private final byte[][][] expected = new byte[FACES.length][STEPS][];

        private SharedSession() {}

        public static void main(String[] paths) throws Exception {
            NativeLog.setPriority(NativeLog.SILENT);
            new SharedSession().run(paths[0], Path.of(paths[1]));
            System.out.println(ROUNDS * THREADS * STEPS + " calls shared a session");
        }

        private void apply(long handle, Bitmap output, int step) {
            engine.applyAutoEnhanceFilter(handle, output,
                    Filter.values()[step % Filter.values().length].key(),
                    PARAMETERS[step / Filter.values().length]);
        }

        private void run(String input, Path folder) throws Exception {
            Bitmap output = Pictures.sameSize(photo);
            long stale = engine.init(photo);
            for (int faces = 0; faces < FACES.length; ++faces) {
                engine.preprocess(FACES[faces], stale);
                for (int step = 0; step < STEPS; ++step) {
                    apply(stale, output, step);
                    expected[faces][step] = Pictures.bytes(output);
                }
            }
            engine.releaseSession(stale);
            for (int round = 0; round < ROUNDS; ++round) {
                long handle = engine.init(photo);
                engine.preprocess(FACES[0], handle);
                inThreads(thread -> share(handle, stale, thread));
                inThreads(thread -> endWhileOthersWork(handle, thread));
            }
            inThreads(thread -> besideOthers(input, folder.resolve(thread + ".jpg")));
        }

        private void share(long handle, long stale, int thread) {
            Bitmap output = Pictures.sameSize(photo);
            for (int i = 0; i < STEPS; ++i) {
                int step = (i + thread) % STEPS;
                if (thread < 2 && i % 6 == 0) {
                    engine.preprocess(FACES[i / 6 % 2], handle);
                }
                apply(handle, output, step);
                check(output, expected[0][step], expected[1][step]);
                engine.releaseSession(stale);
                engine.preprocess(FACES[0], stale);
                apply(stale, output, step);
            }
        }

        private void endWhileOthersWork(long handle, int thread) {
            Bitmap output = Pictures.sameSize(photo);
            byte[] untouched = Pictures.bytes(output);
            if (thread == 0) {
                engine.releaseSession(handle);
            }
            apply(handle, output, thread);
            check(output, untouched, expected[0][thread], expected[1][thread]);
        }

        private void besideOthers(String input, Path output) throws IOException {
            long handle = engine.init(photo);
            engine.preprocess(FACES[1], handle);
            Bitmap own = Pictures.sameSize(photo);
            apply(handle, own, 0);
            check(own, expected[1][0]);
            ImageDupeDetector.similarityScore(photo, 1, 1, own, 2, 1);
            engine.releaseSession(handle);
            if (!engine.applyAutoEnhanceFilterToJpegFile(
                    input, output.toString(), 90, FACES[1], 1, "AE0", PARAMETERS[0])) {
                throw new IOException(output + " was not written");
            }
            Files.delete(output);
        }

        private static void check(Bitmap output, byte[]... allowed) {
            byte[] bytes = Pictures.bytes(output);
            if (Arrays.stream(allowed).noneMatch(each -> Arrays.equals(each, bytes))) {
                throw new AssertionError("a result is none of " + allowed.length + " allowed");
            }
        }
    }
}
