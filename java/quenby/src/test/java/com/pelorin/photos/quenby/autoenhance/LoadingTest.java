package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertNotSame;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.io.File;
import java.net.URL;
import java.net.URLClassLoader;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.stream.Collectors;
import java.util.stream.Stream;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class LoadingTest {
    @TempDir Path folder;

    /** By the name under which the system tells of what it loaded. */
    @BeforeEach
    void nameTheFolderPlainly() throws Exception {
        folder = folder.toRealPath();
    }

    /** Loads and says where from. */
    static final class Load {
        private Load() {}

        public static void main(String[] arguments) throws Exception {
            long handle = Natives.engine().init(Pictures.photo(4, 4, 1));
            String loaded = Files.readAllLines(Path.of("/proc/self/maps")).stream()
                    .filter(line -> line.contains("libpn_quenby"))
                    .map(line -> line.substring(line.indexOf('/'))).findFirst().orElse("nowhere");
            System.out.println((handle != 0 ? "works from " : "fails from ") + loaded);
        }
    }

    private static String builtLibraries() {
        String built = System.getProperty("quenby.native.dir");
        assumeTrue(built != null, "quenby.native.dir names no libraries");
        return built;
    }

    private String load(String... options) throws Exception {
        ChildJvm child = ChildJvm.run(List.of(options), Load.class);
        return child.output.lines().filter(line -> line.startsWith("works from ")).findFirst()
                .orElse(child.output);
    }

    @Test
    void thePropertyNamesAFolderOrAFile() throws Exception {
        String built = Path.of(builtLibraries()).toRealPath().toString();
        String expected = "works from " + built + "/libpn_quenby.so";
        assertEquals(expected, load("-Dquenby.library=" + built));
        assertEquals(expected, load("-Dquenby.library=" + built + "/libpn_quenby.so"));
    }

    @Test
    void aWrongPropertyIsAnErrorThatSaysSo() throws Exception {
        String output = load("-Dquenby.library=/no/such/folder");
        assertTrue(output.contains("UnsatisfiedLinkError"), output);
        assertTrue(output.contains("property quenby.library, /no/such/folder"), output);
    }

    @Test
    void theLibraryPathComesBeforeTheJar() throws Exception {
        String built = Path.of(builtLibraries()).toRealPath().toString();
        assertEquals("works from " + built + "/libpn_quenby.so",
                load("-Djava.library.path=" + built));
    }

    @Test
    void theJarIsCopiedOnceUnderANameOfItsContent() throws Exception {
        String[] options = {"-Djava.io.tmpdir=" + folder};
        String first = load(options);
        String pattern = "/quenby-[^/]*-[0-9a-f]{16}/libpn_quenby.so";
        assertTrue(first.matches("works from " + folder + pattern), first);
        assertEquals(first, load(options));
        try (Stream<Path> files = Files.list(folder)) {
            assertEquals(1, files.count());
        }
    }

    @Test
    void otherLibrariesInTheJarGetAFolderOfTheirOwn() throws Exception {
        Path classes = folder.resolve("classes");
        Path libraries = Files.createDirectories(
                classes.resolve("native/linux-" + System.getProperty("os.arch")));
        byte[] library = Files.readAllBytes(Path.of(builtLibraries(), "libpn.so"));
        Files.write(libraries.resolve("libpn.so"), Arrays.copyOf(library, library.length + 1));
        String temporary = "-Djava.io.tmpdir=" + folder;
        String other = load(temporary, "-cp", classes + File.pathSeparator + ChildJvm.classPath());
        assertTrue(other.startsWith("works from " + folder), other);
        assertNotEquals(load(temporary), other);
    }

    @Test
    void aCopyThatWasChangedIsReplaced() throws Exception {
        String[] options = {"-Djava.io.tmpdir=" + folder};
        String first = load(options);
        Path copy = Path.of(first.substring("works from ".length()));
        Files.write(copy, new byte[] {1, 2, 3});
        assertEquals(first, load(options));
        assertNotEquals(3, Files.size(copy));
    }

    @Test
    void anUnwritableFolderGivesWayToTheHomeFolder() throws Exception {
        Path home = Files.createDirectory(folder.resolve("home"));
        String loaded = load("-Djava.io.tmpdir=/no/such/folder", "-Duser.home=" + home);
        assertTrue(loaded.startsWith("works from " + home + "/.cache/quenby-"), loaded);
    }

    @Test
    void aHomeThatCannotBeWrittenIsNotNeeded() throws Exception {
        String loaded = load("-Djava.io.tmpdir=" + folder, "-Duser.home=/proc");
        assertTrue(loaded.startsWith("works from " + folder), loaded);
    }

    /** Where a folder that may hold no programs can be had. */
    private ChildJvm loadWithoutPrograms(String home) throws Exception {
        String mount = "mount -t tmpfs -o noexec,mode=1777 tmpfs " + folder;
        Process probe = new ProcessBuilder("unshare", "-m", "bash", "-c", mount)
                .redirectErrorStream(true).start();
        String refusal = new String(probe.getInputStream().readAllBytes());
        assumeTrue(probe.waitFor() == 0, "no folder can be mounted noexec here: " + refusal);
        return ChildJvm.run("exec unshare -m bash -c '" + mount + "; exec \"$@\"' bash \"$@\";",
                List.of("-Djava.io.tmpdir=" + folder, "-Duser.home=" + home), Load.class);
    }

    @Test
    void aFolderThatMayHoldNoProgramsGivesWayToTheHomeFolder(@TempDir Path home)
            throws Exception {
        ChildJvm child = loadWithoutPrograms(home.toString());
        assertTrue(child.output.contains("works from " + home.toRealPath() + "/.cache/quenby-"),
                child.output);
    }

    @Test
    void whereNoProgramsMayBeHeldTheErrorNamesTheProperties() throws Exception {
        ChildJvm child = loadWithoutPrograms("/proc");
        assertTrue(child.output.contains("UnsatisfiedLinkError"), child.output);
        assertTrue(child.output.contains("this jar, copied into " + folder), child.output);
        assertTrue(child.output.contains("Set the property quenby.library"), child.output);
        assertTrue(child.output.contains("java.io.tmpdir"), child.output);
    }

    @Test
    void machinesMayStartTogether() throws Exception {
        for (int round = 0; round < 3; ++round) {
            Path empty = Files.createDirectory(folder.resolve("round" + round));
            List<ChildJvm.Running> running = new ArrayList<>();
            for (int i = 0; i < 8; ++i) {
                running.add(ChildJvm.start("", List.of("-Djava.io.tmpdir=" + empty,
                        "-Duser.home=/proc", "-XX:TieredStopAtLevel=1", "-XX:+UseSerialGC"),
                        LoadOnTime.class, empty.toString(), "8"));
            }
            for (ChildJvm.Running each : running) {
                ChildJvm child = each.await();
                assertTrue(child.output.contains("works from " + empty), child.output);
            }
            try (Stream<Path> files = Files.list(empty)) {
                assertEquals(1, files.filter(file -> file.toString().contains("quenby-")).count());
            }
        }
    }

    /** Loads when as many are ready. */
    static final class LoadOnTime {
        private LoadOnTime() {}

        public static void main(String[] arguments) throws Exception {
            Path folder = Path.of(arguments[0]);
            Files.createTempFile(folder, "ready", null);
            for (long ready = 0; ready < Long.parseLong(arguments[1]);) {
                Thread.sleep(1);
                try (Stream<Path> files = Files.list(folder)) {
                    ready = files.filter(file -> file.toString().contains("ready")).count();
                }
            }
            Load.main(arguments);
        }
    }

    @Test
    void whereNothingCanBeWrittenTheErrorListsWhatWasTried() throws Exception {
        String output = load("-Djava.io.tmpdir=/no/such/folder", "-Duser.home=/no/such/home",
                "-Djava.library.path=/no/such/path");
        assertTrue(output.contains("UnsatisfiedLinkError"), output);
        assertTrue(output.contains("java.library.path /no/such/path"), output);
        assertTrue(output.contains("/no/such/folder/quenby-"), output);
        assertTrue(output.contains("/no/such/home/.cache/quenby-"), output);
        assertTrue(output.contains("Set the property quenby.library"), output);
    }

    @Test
    void aSecondClassLoaderWorksBesideTheFirst() throws Exception {
        for (String option : List.of(
                "-Djava.io.tmpdir=" + folder, "-Dquenby.library=" + builtLibraries())) {
            ChildJvm child = ChildJvm.run(
                    List.of(option, "-Duser.home=/no/such/home"), TwoLoaders.class);
            assertEquals(0, child.exitCode, option + "\n" + child.output);
        }
    }

    /** The natives in two class loaders, each with a RectF of its own. */
    static final class TwoLoaders {
        private TwoLoaders() {}

        public static void main(String[] arguments) throws Exception {
            List<URL> urls = new ArrayList<>();
            for (String entry : ChildJvm.classPath().split(File.pathSeparator)) {
                urls.add(Path.of(entry).toUri().toURL());
            }
            String alone = Session.run();
            try (URLClassLoader loader = new URLClassLoader(urls.toArray(new URL[0]),
                    ClassLoader.getPlatformClassLoader())) {
                Class<?> other = loader.loadClass(Session.class.getName());
                assertNotSame(Session.class, other);
                var run = other.getDeclaredMethod("run");
                run.setAccessible(true);
                assertEquals(alone, run.invoke(null));
            }
            assertEquals(alone, Session.run());
        }
    }

    /** Something to do with the natives. */
    static final class Session {
        private Session() {}

        static String run() {
            Bitmap photo = Pictures.photo(30, 20, 4);
            Bitmap output = Pictures.sameSize(photo);
            try (EnhanceSession session = EnhanceSession.open(photo)) {
                session.setFaces(List.of(new RectF(0.1f, 0.2f, 0.6f, 0.7f)));
                session.enhance(0.5f, output);
            }
            byte[] bytes = Pictures.bytes(output);
            return Stream.of(bytes).map(java.util.Arrays::hashCode).map(String::valueOf)
                    .collect(Collectors.joining());
        }
    }
}
