package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.io.File;
import java.io.IOException;
import java.lang.ref.WeakReference;
import java.net.URL;
import java.net.URLClassLoader;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.logging.Level;
import java.util.logging.Logger;
import java.util.regex.Matcher;
import java.util.regex.Pattern;
import org.junit.jupiter.api.Test;

/** Class loaders that come and go, as on an application server, each with Quenby in it. */
class ClassLoadersTest {
    private static final int LOADERS = 200;

    /** What an application does. */
    static final class Application {
        private Application() {}

        static int run() {
            Logger.getLogger(EnhanceSession.class.getName()).setLevel(Level.OFF);
            Bitmap photo = Pictures.photo(200, 150, 4);
            Bitmap output = Pictures.sameSize(photo);
            EnhanceSession.open(photo); // forgotten: 120 kB that go with the loader
            try (EnhanceSession session =
                    EnhanceSession.open(photo, List.of(new RectF(0.1f, 0.2f, 0.6f, 0.7f)))) {
                session.enhance(0.5f, output);
            }
            ImageDupeDetector.similarityScore(photo, 1, 1, output, 2, 1);
            return Arrays.hashCode(Pictures.bytes(output));
        }
    }

    /** Prints how many loaders are left and by how much memory grew over the latter half. */
    static final class ComeAndGo {
        private ComeAndGo() {}

        public static void main(String[] arguments) throws Exception {
            List<URL> urls = new ArrayList<>();
            for (String entry : ChildJvm.classPath().split(File.pathSeparator)) {
                urls.add(Path.of(entry).toUri().toURL());
            }
            List<WeakReference<ClassLoader>> loaders = new ArrayList<>();
            Integer expected = null;
            long halfway = 0;
            for (int i = 0; i < LOADERS; ++i) {
                if (i == LOADERS / 2) {
                    halfway = residentPages();
                }
                int result = runInALoaderOfItsOwn(urls.toArray(new URL[0]), loaders);
                if (expected != null && expected != result) {
                    throw new AssertionError("loader " + i + " gives another picture");
                }
                expected = result;
                waitUntilGone(loaders);
            }
            long grown = residentPages() - halfway;
            long left = loaders.stream().filter(loader -> loader.get() != null).count();
            long libraries = Files.readAllLines(Path.of("/proc/self/maps")).stream()
                    .filter(line -> line.contains("r-xp") && line.matches(".*quenby.*\\.so.*"))
                    .count();
            System.out.println(LOADERS + " loaders: " + left + " left, " + libraries
                    + " libraries, grown by " + grown + " pages");
        }

        private static int runInALoaderOfItsOwn(URL[] urls,
                List<WeakReference<ClassLoader>> loaders) throws Exception {
            try (URLClassLoader loader =
                    new URLClassLoader(urls, ClassLoader.getPlatformClassLoader())) {
                loaders.add(new WeakReference<>(loader));
                var run = loader.loadClass(Application.class.getName()).getDeclaredMethod("run");
                run.setAccessible(true);
                return (Integer) run.invoke(null);
            }
        }

        private static void waitUntilGone(List<WeakReference<ClassLoader>> loaders)
                throws InterruptedException {
            for (int i = 0; i < 5 && loaders.get(loaders.size() - 1).get() != null; ++i) {
                System.gc();
                Thread.sleep(1); // the collector's own thread unloads the library
            }
        }

        /** Resident memory of this process in pages of 4 KiB. */
        private static long residentPages() throws IOException {
            return Long.parseLong(Files.readString(Path.of("/proc/self/statm")).split(" ")[1]);
        }
    }

    @Test
    void goWithTheirLibraryAndLeaveMemoryWhereItWas() throws Exception {
        assumeTrue(System.getProperty("quenby.native.dir") != null, "no libraries are named");
        // The virtual machine itself logs the name of a library that it has just closed and freed.
        String preload = System.getenv("LD_PRELOAD");
        assumeTrue(preload == null || preload.isEmpty(),
                "the address sanitizer ends a virtual machine that unloads a library");
        ChildJvm child = ChildJvm.run(List.of("-Xms64m", "-Xmx64m", "-XX:+AlwaysPreTouch",
                "-XX:+UseSerialGC", "-XX:TieredStopAtLevel=1", "-Dquenby.library="
                        + System.getProperty("quenby.native.dir")), ComeAndGo.class);
        Matcher found = Pattern.compile("(\\d+) left, (\\d+) libraries, grown by (-?\\d+) pages")
                .matcher(child.output);
        assertTrue(found.find(), child.output);
        System.out.println(LOADERS + " class loaders: " + found.group());
        assertTrue(Integer.parseInt(found.group(1)) <= 2, child.output);
        assertTrue(Integer.parseInt(found.group(2)) <= 2, child.output);
        // The latter 100: a library is 400 pages each, the tables of the engine 16, a session 30.
        assertTrue(Long.parseLong(found.group(3)) < 1000, child.output);
    }
}
