package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assumptions.assumeFalse;

import android.graphics.RectF;
import java.awt.image.BufferedImage;
import java.io.IOException;
import java.nio.file.AccessDeniedException;
import java.nio.file.Files;
import java.nio.file.NoSuchFileException;
import java.nio.file.Path;
import java.nio.file.attribute.FileTime;
import java.nio.file.attribute.PosixFilePermission;
import java.nio.file.attribute.PosixFilePermissions;
import java.time.Duration;
import java.util.Arrays;
import java.util.List;
import java.util.Set;
import java.util.concurrent.CancellationException;
import java.util.stream.Collectors;
import java.util.stream.Stream;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class JpegFileTest {
    private final QuenbyEngine engine = Natives.engine();
    @TempDir Path folder;
    private Path input;
    private Path output;

    @BeforeEach
    void makeInput() throws IOException {
        input = Pictures.jpeg(folder.resolve("in.jpg"), 64, 48, 5);
        output = folder.resolve("out.jpg");
    }

    private boolean call(Path from, Path to, int rotation, String params) throws IOException {
        return engine.applyAutoEnhanceFilterToJpegFile(
                from.toString(), to.toString(), rotation, new RectF[0], 1, "AE0", params);
    }

    private List<String> names() throws IOException {
        try (Stream<Path> files = Files.list(folder)) {
            return files.map(file -> file.getFileName().toString()).sorted()
                    .collect(Collectors.toList());
        }
    }

    @Test
    void withoutRotationTheInputIsNeverWritten() throws IOException {
        FileTime before = FileTime.fromMillis(1000000);
        Files.setLastModifiedTime(input, before);
        byte[] content = Files.readAllBytes(input);
        assertTrue(call(input, output, 0, "slider=0.4;"));
        assertEquals(before, Files.getLastModifiedTime(input));
        assertArrayEquals(content, Files.readAllBytes(input));
        assertEquals(64, ImageIO.read(output.toFile()).getWidth());
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    @Test
    void theOutputMayBeTheInput() throws IOException {
        assertTrue(call(input, output, 0, "slider=0.4;"));
        assertTrue(call(input, input, 0, "slider=0.4;"));
        assertArrayEquals(Files.readAllBytes(output), Files.readAllBytes(input));
    }

    @Test
    void rotationComesFirst() throws IOException {
        assertTrue(call(input, output, 90, "slider=0.4;"));
        BufferedImage image = ImageIO.read(output.toFile());
        assertEquals(48, image.getWidth());
        assertEquals(64, image.getHeight());
    }

    @Test
    void aMissingInputIsFalse() throws IOException {
        assertFalse(call(folder.resolve("missing.jpg"), output, 0, "slider=0.4;"));
        assertThrows(IOException.class,
                () -> call(folder.resolve("missing.jpg"), output, 90, "slider=0.4;"));
        assertEquals(List.of("in.jpg"), names());
    }

    @Test
    void aDamagedInputIsAFailureAndKeepsTheOldOutput() throws IOException {
        byte[] whole = Files.readAllBytes(input);
        Files.write(output, new byte[] {1, 2, 3});
        for (int length : new int[] {whole.length / 2, 20, 0}) {
            Files.write(input, Arrays.copyOf(whole, length));
            assertFalse(call(input, output, 0, "slider=0.4;"));
            assertThrows(RuntimeException.class, () -> call(input, output, 90, "slider=0.4;"));
            assertThrows(JpegException.class, () -> JpegJob.of(input, output).run());
            assertThrows(JpegException.class, () -> JpegJob.of(input, output).rotation(90).run());
            assertArrayEquals(new byte[] {1, 2, 3}, Files.readAllBytes(output));
        }
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    @Test
    void anOutputThatCannotBeWrittenIsAnIoException() {
        Path nowhere = folder.resolve("no/such/folder.jpg");
        assertThrows(IOException.class, () -> call(input, nowhere, 0, "slider=0.4;"));
        assertThrows(IOException.class, () -> call(input, nowhere, 90, "slider=0.4;"));
        assertThrows(IOException.class, () -> JpegJob.of(input, nowhere).rotation(90).run());
    }

    @Test
    void aFullDiskKeepsTheOldFile() throws Exception {
        Pictures.jpeg(input, 800, 600, 5);
        Files.write(output, new byte[] {1, 2, 3});
        assertTrue(Files.size(input) > 16 * 1024);
        ChildJvm child = ChildJvm.run("ulimit -f 8;", List.of("-Xshare:auto"), FullDisk.class,
                input.toString(), output.toString());
        assertEquals(0, child.exitCode, child.output);
        assertArrayEquals(new byte[] {1, 2, 3}, Files.readAllBytes(output));
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    /** Where no file may grow beyond 8 KiB. */
    static final class FullDisk {
        private FullDisk() {}

        public static void main(String[] paths) throws IOException {
            for (int rotation : new int[] {0, 90}) {
                try {
                    Natives.engine().applyAutoEnhanceFilterToJpegFile(
                            paths[0], paths[1], rotation, null, 1, "AE0", "slider=0.4;");
                    System.exit(1);
                } catch (IOException expected) {
                    System.out.println(expected);
                }
            }
            try {
                JpegJob.of(Path.of(paths[0]), Path.of(paths[1])).run();
                System.exit(1);
            } catch (JpegException unexpected) {
                throw unexpected;
            } catch (IOException expected) {
                System.out.println(expected);
            }
        }
    }

    @Test
    void namesBeyondTheBasicPlaneAreFiles() throws IOException {
        Path camera = folder.resolve("\ud83d\udcf7.jpg");
        Files.move(input, camera);
        assertTrue(call(camera, output, 0, "slider=0.4;"));
        assertTrue(call(camera, folder.resolve("\ud83d\udcf7 2.jpg"), 90, "slider=0.4;"));
    }

    @Test
    void nullPathsAreIllegalArguments() {
        assertThrows(IllegalArgumentException.class, () -> engine.applyAutoEnhanceFilterToJpegFile(
                null, output.toString(), 0, null, 1, "AE0", "slider=0.4;"));
        assertThrows(IllegalArgumentException.class, () -> engine.applyAutoEnhanceFilterToJpegFile(
                input.toString(), null, 90, null, 1, "AE0", "slider=0.4;"));
    }

    @Test
    void aJobScalesAndTurns() throws IOException {
        JpegJob.of(input, output).rotation(-90).scale(2).faces(List.of(new RectF(0, 0, 1, 1)))
                .filter(Filter.SUMMER, "").run();
        BufferedImage image = ImageIO.read(output.toFile());
        assertEquals(24, image.getWidth());
        assertEquals(32, image.getHeight());
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    @Test
    void aJobSaysWhatIsWrongWithItsInput() throws IOException {
        byte[] whole = Files.readAllBytes(input);
        Files.write(output, new byte[] {1, 2, 3});
        Object[][] inputs = {{PhotoException.Kind.EMPTY, new byte[0]},
            {PhotoException.Kind.NOT_A_PHOTO, "text".getBytes()},
            {PhotoException.Kind.TRUNCATED, Arrays.copyOf(whole, whole.length / 2)}};
        for (Object[] each : inputs) {
            Files.write(input, (byte[]) each[1]);
            JpegException error =
                    assertThrows(JpegException.class, () -> JpegJob.of(input, output).run());
            assertEquals(each[0], error.kind());
            assertTrue(error.getMessage().startsWith(input + ": "), error.getMessage());
            assertEquals(error.getMessage(), input + ": " + error.getCause().getMessage());
        }
        assertArrayEquals(new byte[] {1, 2, 3}, Files.readAllBytes(output));
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    @Test
    void aJobTurnsAPhotoUprightAndKeepsItsTime() throws IOException {
        Files.write(input, PhotoBytesTest.withExif(Files.readAllBytes(input), 6));
        JpegJob.of(input, output).run();
        BufferedImage image = ImageIO.read(output.toFile());
        assertEquals(48, image.getWidth());
        assertEquals(64, image.getHeight());
        assertTrue(PhotoBytes.of(Files.readAllBytes(output)).facts().utcSeconds().isPresent());
        JpegJob.of(input, input).run();
        assertArrayEquals(Files.readAllBytes(output), Files.readAllBytes(input));
    }

    @Test
    void aJobFollowsALinkAndWritesIntoADevice() throws IOException {
        Path link = Files.createSymbolicLink(folder.resolve("link.jpg"), output);
        Files.write(output, new byte[] {1, 2, 3});
        JpegJob.of(input, link).run();
        assertTrue(Files.isSymbolicLink(link));
        assertEquals(64, ImageIO.read(output.toFile()).getWidth());
        Path device = Path.of("/dev/null");
        JpegJob.of(input, device).rotation(90).run();
        assertFalse(Files.isRegularFile(device));
    }

    @Test
    void aJobMakesTheFileThatALinkNames() throws IOException {
        Path link = Files.createSymbolicLink(folder.resolve("link.jpg"), Path.of("new.jpg"));
        JpegJob.of(input, link).run();
        assertTrue(Files.isSymbolicLink(link));
        assertEquals(List.of("in.jpg", "link.jpg", "new.jpg"), names());
        Path loop = folder.resolve("loop.jpg");
        Files.createSymbolicLink(loop, loop);
        assertThrows(IOException.class, () -> JpegJob.of(input, loop).run());
    }

    @Test
    void aReplacedFileKeepsItsPermissions() throws IOException {
        Path plain = Files.createFile(folder.resolve("plain"));
        JpegJob.of(input, output).run();
        assertEquals(Files.getPosixFilePermissions(plain), Files.getPosixFilePermissions(output));
        for (String text : List.of("rw-------", "rwxr-x--x", "rw-rw-rw-")) {
            Set<PosixFilePermission> permissions = PosixFilePermissions.fromString(text);
            Files.setPosixFilePermissions(output, permissions);
            JpegJob.of(input, output).run();
            assertEquals(permissions, Files.getPosixFilePermissions(output));
        }
    }

    @Test
    void aProtectedFileIsNotReplaced() throws IOException {
        Files.write(output, new byte[] {1, 2, 3});
        Files.setPosixFilePermissions(output, PosixFilePermissions.fromString("r--r--r--"));
        assumeFalse(Files.isWritable(output), "this user may write everything");
        assertThrows(AccessDeniedException.class, () -> JpegJob.of(input, output).run());
        assertArrayEquals(new byte[] {1, 2, 3}, Files.readAllBytes(output));
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    @Test
    void aJobThatIsGivenUpWritesNothing() throws IOException {
        Cancellation cancellation = new Cancellation();
        cancellation.cancel();
        assertThrows(CancellationException.class,
                () -> JpegJob.of(input, output).cancellation(cancellation).run());
        assertEquals(List.of("in.jpg"), names());
    }

    @Test
    void aJobKeepsToItsLimits() throws IOException {
        long bytes = Files.size(input);
        JpegJob job = JpegJob.of(input, output);
        for (JpegJob limited : List.of(job.maxBytes(bytes - 1), job.maxPixels(64 * 48 - 1),
                job.maxSegments(1))) {
            assertEquals(PhotoException.Kind.TOO_LARGE,
                    assertThrows(JpegException.class, limited::run).kind());
        }
        assertThrows(CancellationException.class,
                () -> job.cancellation(Cancellation.after(Duration.ZERO)).run());
        assertEquals(List.of("in.jpg"), names());
        job.maxBytes(bytes).maxPixels(64 * 48).maxScans(1).maxSegments(9)
                .cancellation(Cancellation.after(Duration.ofHours(1))).run();
        assertEquals(List.of("in.jpg", "out.jpg"), names());
    }

    @Test
    void aFailingJobLeavesNothingBehind() throws IOException {
        assertThrows(IllegalArgumentException.class,
                () -> JpegJob.of(input, output).rotation(90).filter(Filter.AUTO, "").run());
        assertThrows(NoSuchFileException.class,
                () -> JpegJob.of(folder.resolve("missing.jpg"), output).run());
        assertThrows(IOException.class, () -> JpegJob.of(folder, output).run());
        assertEquals(List.of("in.jpg"), names());
    }

    @Test
    void aJobRefusesWhatCannotBe() {
        JpegJob job = JpegJob.of(input, output);
        assertThrows(IllegalArgumentException.class, () -> job.rotation(45));
        assertThrows(IllegalArgumentException.class, () -> job.scale(3));
        assertThrows(UnknownFilterException.class, () -> job.filter(null, ""));
        assertThrows(IllegalArgumentException.class,
                () -> job.faces(List.of(new RectF(Float.NaN, 0, 1, 1))));
    }
}
