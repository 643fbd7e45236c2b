package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assertions.fail;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import android.graphics.Bitmap;
import com.pelorin.photos.quenby.desktop.NativeLibraries;
import com.pelorin.photos.quenby.desktop.NativeLog;
import java.io.IOException;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.concurrent.CyclicBarrier;
import java.util.concurrent.TimeUnit;
import java.util.concurrent.atomic.AtomicReference;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;
import org.opentest4j.AssertionFailedError;

/** The first uses of a fresh virtual machine, several at once. */
class FirstUseTest {
    private static final int CHILDREN_AT_ONCE = 2;

    @TempDir Path folder;

    /** Every way into the natives. */
    enum Entry {
        ENGINE {
            @Override
            void use() {
                NativeLibrary.load();
                new QuenbyEngine().releaseSession(0);
            }
        },
        DETECTOR {
            @Override
            void use() {
                NativeLibrary.load();
                assertEquals(ImageDupeDetector.SIMILARITY_ERROR,
                        ImageDupeDetector.similarityScore(null, 0, 0, null, 0, 0));
            }
        },
        SESSION {
            @Override
            void use() {
                EnhanceSession.open(pixel()).close();
            }
        },
        DUPLICATES {
            @Override
            void use() {
                Duplicates.Photo photo = new Duplicates.Photo(pixel(), 0, 0);
                assertTrue(Float.isFinite(Duplicates.score(photo, photo)));
            }
        },
        JPEG {
            @Override
            void use() {
                Path empty = Path.of("/dev/null");
                try {
                    JpegJob.of(empty, empty).run();
                    fail("an empty file became a photo");
                } catch (JpegException expected) {
                    // It was read.
                } catch (IOException error) {
                    fail(error);
                }
            }
        },
        BYTES {
            @Override
            void use() {
                try {
                    assertEquals(PhotoException.Kind.EMPTY, assertThrows(PhotoException.class,
                            () -> PhotoBytes.of(new byte[0]).facts()).kind());
                } catch (AssertionFailedError notLoaded) {
                    if (notLoaded.getCause() instanceof Error) {
                        throw (Error) notLoaded.getCause();
                    }
                    throw notLoaded;
                }
            }
        },
        LOG {
            @Override
            void use() {
                NativeLog.setPriority(NativeLog.SILENT);
            }
        },
        DESKTOP {
            @Override
            void use() {
                NativeLibraries.load();
            }
        };

        abstract void use();

        private static Bitmap pixel() {
            return Bitmap.createBitmap(1, 1, Bitmap.Config.ARGB_8888);
        }
    }

    /** Uses two entries first from a number of threads; a hang ends it with what they wait for. */
    static final class TwoEntries {
        private TwoEntries() {}

        public static void main(String[] arguments) throws Exception {
            Entry[] entries = {Entry.valueOf(arguments[0]), Entry.valueOf(arguments[1])};
            int count = Integer.parseInt(arguments[2]);
            CyclicBarrier start = new CyclicBarrier(count);
            AtomicReference<Throwable> failure = new AtomicReference<>();
            List<Thread> threads = new ArrayList<>();
            for (int i = 0; i < count; ++i) {
                Entry entry = entries[i % 2];
                threads.add(new Thread(() -> {
                    try {
                        start.await();
                        entry.use();
                    } catch (Throwable error) {
                        failure.set(error);
                    }
                }));
            }
            threads.forEach(Thread::start);
            long end = System.nanoTime() + TimeUnit.SECONDS.toNanos(20);
            for (Thread thread : threads) {
                long left = TimeUnit.NANOSECONDS.toMillis(end - System.nanoTime());
                thread.join(Math.max(1, left));
                if (thread.isAlive()) {
                    System.out.println("hangs:\n  "
                            + List.of(thread.getStackTrace()).toString().replace(", ", "\n  "));
                    failure.compareAndSet(null, new IllegalStateException("a thread hangs"));
                }
            }
            if (failure.get() != null) {
                failure.get().printStackTrace(System.out);
                Runtime.getRuntime().halt(1);
            }
            System.out.println("all came back");
        }
    }

    /** Every pair of entries, an entry with itself included, from two to eight threads. */
    private void everyPair(String option) throws Exception {
        List<ChildJvm.Running> running = new ArrayList<>();
        int pairs = 0;
        for (Entry one : Entry.values()) {
            for (Entry other : Entry.values()) {
                if (other.ordinal() < one.ordinal()) {
                    continue;
                }
                running.add(ChildJvm.start("", List.of(option, "-XX:TieredStopAtLevel=1",
                        "-XX:+UseSerialGC", "-Xshare:auto"), TwoEntries.class, one.name(),
                        other.name(), String.valueOf(2 + pairs++ % 7)));
                if (running.size() == CHILDREN_AT_ONCE) {
                    checkAll(running);
                }
            }
        }
        checkAll(running);
        assertEquals(36, pairs);
    }

    private static void checkAll(List<ChildJvm.Running> running) throws Exception {
        for (ChildJvm.Running each : running) {
            ChildJvm child = each.await();
            assertEquals(0, child.exitCode, child.output);
            assertTrue(child.output.contains("all came back"), child.output);
        }
        running.clear();
    }

    @Test
    void noPairOfEntriesHangsWithTheJar() throws Exception {
        everyPair("-Djava.io.tmpdir=" + folder);
    }

    @Test
    void noPairOfEntriesHangsWithTheProperty() throws Exception {
        String built = System.getProperty("quenby.native.dir");
        assumeTrue(built != null, "quenby.native.dir names no libraries");
        everyPair("-Dquenby.library=" + built);
    }

    /** Bare natives before anything is loaded. */
    static final class NothingLoaded {
        private NothingLoaded() {}

        public static void main(String[] arguments) {
            assertThrows(UnsatisfiedLinkError.class, () -> new QuenbyEngine().init(null));
            assertThrows(UnsatisfiedLinkError.class,
                    () -> ImageDupeDetector.similarityScore(null, 0, 0, null, 0, 0));
            System.out.println("nothing was loaded");
        }
    }

    @Test
    void theBareClassesLoadNothing() throws Exception {
        ChildJvm child = ChildJvm.run(List.of(), NothingLoaded.class);
        assertTrue(child.output.contains("nothing was loaded"), child.output);
    }

    /** Fails to load, then finds the library. */
    static final class SecondAttempt {
        private SecondAttempt() {}

        public static void main(String[] libraries) {
            System.setProperty(NativeLibraries.PROPERTY, "/no/such/folder");
            for (Entry entry : Entry.values()) {
                assertThrows(UnsatisfiedLinkError.class, entry::use, entry.name());
            }
            System.setProperty(NativeLibraries.PROPERTY, libraries[0]);
            for (Entry entry : Entry.values()) {
                entry.use();
            }
            System.out.println("found at last");
        }
    }

    @Test
    void aFailedLoadIsTriedAgain() throws Exception {
        String built = System.getProperty("quenby.native.dir");
        assumeTrue(built != null, "quenby.native.dir names no libraries");
        ChildJvm child = ChildJvm.run(List.of(), SecondAttempt.class, built);
        assertTrue(child.output.contains("found at last"), child.output);
    }
}
