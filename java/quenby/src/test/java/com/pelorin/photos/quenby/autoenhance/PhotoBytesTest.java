package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotNull;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assumptions.assumeFalse;

import android.graphics.RectF;
import java.awt.Transparency;
import java.awt.color.ColorSpace;
import java.awt.image.BufferedImage;
import java.awt.image.ComponentColorModel;
import java.awt.image.DataBuffer;
import java.io.ByteArrayInputStream;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.nio.ByteBuffer;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.time.Duration;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.Collections;
import java.util.List;
import java.util.concurrent.Callable;
import java.util.concurrent.CancellationException;
import java.util.concurrent.ExecutionException;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.Future;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class PhotoBytesTest {
    @TempDir Path folder;
    private byte[] plain;
    /** 64 x 48, to be turned right, taken at 2024-06-01 12:30:15 two hours east of Greenwich. */
    private byte[] turned;

    @BeforeEach
    void makePhotos() throws IOException {
        plain = Files.readAllBytes(Pictures.jpeg(folder.resolve("plain.jpg"), 64, 48, 5));
        turned = withExif(plain, 6);
    }

    /** The file with an EXIF segment of orientation, time and zone behind its first marker. */
    static byte[] withExif(byte[] jpeg, int orientation) throws IOException {
        ByteBuffer tiff = ByteBuffer.allocate(96);
        tiff.put("MM\0*".getBytes(StandardCharsets.US_ASCII)).putInt(8);
        tiff.putShort((short) 2);
        entry(tiff, 0x0112, 3, 1, orientation << 16);
        entry(tiff, 0x8769, 4, 1, 38); // where the next directory is
        tiff.putInt(0);
        tiff.putShort((short) 2);
        entry(tiff, 0x9003, 2, 20, 68);
        entry(tiff, 0x9011, 2, 7, 88);
        tiff.putInt(0);
        tiff.put("2024:06:01 12:30:15\0+02:00\0\0".getBytes(StandardCharsets.US_ASCII));
        ByteArrayOutputStream file = new ByteArrayOutputStream();
        file.write(jpeg, 0, 2);
        file.write(ByteBuffer.allocate(10).putShort((short) 0xFFE1).putShort((short) (8 + 96))
                .put("Exif\0\0".getBytes(StandardCharsets.US_ASCII)).array());
        file.write(tiff.array());
        file.write(jpeg, 2, jpeg.length - 2);
        return file.toByteArray();
    }

    private static void entry(ByteBuffer tiff, int tag, int type, int count, int value) {
        tiff.putShort((short) tag).putShort((short) type).putInt(count).putInt(value);
    }

    private static ByteBuffer direct(byte[] bytes) {
        ByteBuffer buffer = ByteBuffer.allocateDirect(bytes.length + 7);
        buffer.position(3);
        buffer.put(bytes);
        buffer.flip();
        buffer.position(3);
        return buffer;
    }

    @Test
    void everyWayToHoldTheBytesGivesTheSame() throws IOException {
        byte[] expected = PhotoBytes.of(turned).enhance(0.4f);
        byte[] longer = new byte[turned.length + 9];
        System.arraycopy(turned, 0, longer, 4, turned.length);
        ByteBuffer buffer = direct(turned);
        ByteBuffer heap = ByteBuffer.wrap(longer, 4, turned.length).slice();
        for (PhotoBytes photo : List.of(PhotoBytes.of(longer, 4, turned.length),
                PhotoBytes.of(buffer), PhotoBytes.of(heap),
                PhotoBytes.of(buffer.asReadOnlyBuffer()))) {
            assertArrayEquals(expected, photo.enhance(0.4f));
            assertEquals(6, photo.facts().orientation());
        }
        assertEquals(3, buffer.position());
        assertThrows(IllegalArgumentException.class,
                () -> PhotoBytes.of(heap.asReadOnlyBuffer()));
        assertThrows(IndexOutOfBoundsException.class, () -> PhotoBytes.of(longer, 10, -1));
        assertThrows(IndexOutOfBoundsException.class,
                () -> PhotoBytes.of(longer, 10, longer.length));
    }

    @Test
    void aPhotoOnItsSideIsTurnedUpright() throws IOException {
        byte[] made = PhotoBytes.of(turned).filter(Filter.SUMMER, "");
        BufferedImage picture = ImageIO.read(new ByteArrayInputStream(made));
        assertEquals(48, picture.getWidth());
        assertEquals(64, picture.getHeight());
        PhotoFacts facts = PhotoBytes.of(made).facts();
        assertEquals(1, facts.orientation());
        assertEquals(PhotoBytes.of(turned).facts().utcSeconds(), facts.utcSeconds());
    }

    @Test
    void factsAreReadWithoutThePicture() throws IOException {
        PhotoFacts facts = PhotoBytes.of(turned).facts();
        assertEquals(64, facts.width());
        assertEquals(48, facts.height());
        assertEquals(6, facts.orientation());
        assertEquals(1717245015, facts.wallClockSeconds().getAsDouble());
        assertEquals(1717245015 - 7200, facts.utcSeconds().getAsDouble());
        assertFalse(PhotoBytes.of(plain).facts().wallClockSeconds().isPresent());
        assertFalse(PhotoBytes.of(plain).facts().utcSeconds().isPresent());
    }

    @Test
    void settingsCount() throws IOException {
        PhotoBytes photo = PhotoBytes.of(turned);
        assertTrue(photo.quality(30).enhance(0.4f).length < photo.enhance(0.4f).length);
        BufferedImage picture = ImageIO.read(new ByteArrayInputStream(
                photo.rotation(90).scale(2).filter(Filter.ORIGINAL, null)));
        assertEquals(32, picture.getWidth());
        assertEquals(24, picture.getHeight());
        assertFalse(Arrays.equals(photo.enhance(0.8f),
                photo.faces(List.of(new RectF(0, 0, 0.4f, 0.4f))).enhance(0.8f)));
        assertThrows(IllegalArgumentException.class, () -> photo.quality(0));
        assertThrows(IllegalArgumentException.class, () -> photo.quality(101));
        assertThrows(IllegalArgumentException.class, () -> photo.rotation(45));
        assertThrows(IllegalArgumentException.class, () -> photo.scale(3));
        assertThrows(IllegalArgumentException.class,
                () -> photo.faces(Collections.singletonList(null)));
        assertThrows(IllegalArgumentException.class, () -> photo.enhance(Float.NaN));
        assertThrows(UnknownFilterException.class, () -> photo.filter(null, ""));
    }

    /** The file with a second picture behind it, which no result can keep. */
    @Test
    void whatIsLostOfTheMetadataIsTold() throws IOException {
        ByteArrayOutputStream two = new ByteArrayOutputStream();
        two.write(turned);
        two.write(plain);
        List<Loss> losses = new ArrayList<>();
        byte[] made = PhotoBytes.of(two.toByteArray()).losses(losses::add).enhance(0.4f);
        assertArrayEquals(PhotoBytes.of(two.toByteArray()).enhance(0.4f), made);
        assertEquals(1, losses.size());
        assertEquals("second picture", losses.get(0).what());
        assertEquals("shows the picture as it was", losses.get(0).why());
        PhotoBytes.of(turned).losses(losses::add).enhance(0.4f);
        assertEquals(1, losses.size());
    }

    @Test
    void theMarkOfTheEditCanBeLeftOut() throws IOException {
        String mark = "AE0 slider=0.4";
        byte[] marked = PhotoBytes.of(plain).enhance(0.4f);
        assertTrue(new String(marked, StandardCharsets.ISO_8859_1).contains(mark));
        byte[] bare = PhotoBytes.of(plain).mark(false).enhance(0.4f);
        assertFalse(new String(bare, StandardCharsets.ISO_8859_1).contains(mark));
    }

    @Test
    void filesAreCodedLikeThePhotosOwnUnlessChosen() throws IOException {
        byte[] small = PhotoBytes.of(plain).quality(40).subsampling(422).enhance(0.4f);
        byte[] like = PhotoBytes.of(small).sourceQuality().enhance(0.4f);
        assertArrayEquals(PhotoBytes.of(small).quality(40).subsampling(422).enhance(0.4f), like);
        assertThrows(IllegalArgumentException.class,
                () -> PhotoBytes.of(plain).subsampling(411));
    }

    private static PhotoException.Kind kindOf(byte[] file) {
        List<Callable<?>> ways = List.of(() -> PhotoBytes.of(file).enhance(0.4f),
                () -> PhotoBytes.of(file).niqe(), () -> PhotoBytes.of(file).niqeFeatures(),
                () -> PhotoBytes.of(direct(file)).greenCdf());
        List<PhotoException.Kind> kinds = new ArrayList<>();
        for (Callable<?> way : ways) {
            PhotoException error = assertThrows(PhotoException.class, way::call);
            assertTrue(error.getMessage().length() > 3, error.getMessage());
            kinds.add(error.kind());
        }
        assertEquals(Collections.nCopies(ways.size(), kinds.get(0)), kinds);
        return kinds.get(0);
    }

    @Test
    void failuresAreToldApart() {
        assertEquals(PhotoException.Kind.EMPTY, kindOf(new byte[0]));
        assertEquals(PhotoException.Kind.NOT_A_PHOTO, kindOf("no photo at all".getBytes()));
        assertEquals(PhotoException.Kind.TRUNCATED,
                kindOf(Arrays.copyOf(plain, plain.length * 2 / 3)));
    }

    @Test
    void aPhotoIsItsOwnDuplicate() throws IOException {
        GreenCdf cdf = PhotoBytes.of(plain).greenCdf();
        BufferedImage halves = new BufferedImage(64, 64, BufferedImage.TYPE_INT_RGB);
        halves.setRGB(0, 0, 32, 64, Collections.nCopies(32 * 64, 0xE0E0E0).stream()
                .mapToInt(Integer::intValue).toArray(), 0, 32);
        ByteArrayOutputStream file = new ByteArrayOutputStream();
        ImageIO.write(halves, "jpeg", file);
        GreenCdf other = PhotoBytes.of(file.toByteArray()).greenCdf();
        assertEquals(cdf, PhotoBytes.of(direct(plain)).greenCdf());
        assertEquals(0, cdf.distanceTo(cdf), 0.01);
        assertTrue(cdf.distanceTo(other) > 0.01);
        assertEquals(3.65f, Duplicates.score(cdf, cdf, 0, true), 0.1f);
        assertTrue(Duplicates.score(cdf, other, 86400, false) < 0);
        assertEquals(Duplicates.score(cdf, other, 7, true),
                Duplicates.score(cdf.distanceTo(other), 7, true));
        assertThrows(IllegalArgumentException.class,
                () -> Duplicates.score(cdf, other, Double.NaN, true));
        assertEquals(130.9, Duplicates.window(0, true), 0.1);
        assertTrue(Duplicates.window(0, false) < Duplicates.window(0, true));
    }

    @Test
    void aDistributionCanBeKept() throws IOException {
        GreenCdf cdf = PhotoBytes.of(plain).greenCdf();
        byte[] kept = cdf.toBytes();
        assertEquals(GreenCdf.BYTES, kept.length);
        GreenCdf back = GreenCdf.fromBytes(kept);
        assertEquals(cdf, back);
        assertEquals(cdf.hashCode(), back.hashCode());
        kept[1023] ^= 64;
        assertThrows(IllegalArgumentException.class, () -> GreenCdf.fromBytes(kept));
        assertThrows(IllegalArgumentException.class, () -> GreenCdf.fromBytes(new byte[1023]));
        Arrays.fill(kept, (byte) -1); // not a number
        assertThrows(IllegalArgumentException.class, () -> GreenCdf.fromBytes(kept));
    }

    @Test
    void theEngineTellsItsVersion() throws IOException {
        String project = Files.readString(
                Path.of(System.getProperty("quenby.root"), "CMakeLists.txt"));
        assertTrue(project.contains("project(Quenby VERSION " + NativeLibrary.version() + " "));
    }

    @Test
    void qualityNeedsSomeSize() throws IOException {
        assertTrue(Float.isNaN(PhotoBytes.of(plain).niqe()));
        PhotoBytes large = PhotoBytes.of(Files.readAllBytes(
                Pictures.jpeg(folder.resolve("large.jpg"), 400, 300, 3)));
        assertTrue(large.niqe() > 0);
        assertEquals(36, large.niqeFeatures().length);
    }

    @Test
    void whatIsCancelledThrows() throws Exception {
        Cancellation cancellation = new Cancellation();
        PhotoBytes photo = PhotoBytes.of(plain).cancellation(cancellation);
        byte[] whole = photo.enhance(0.4f);
        assertArrayEquals(PhotoBytes.of(plain).enhance(0.4f), whole);
        cancellation.cancel();
        cancellation.cancel();
        assertTrue(cancellation.isCancelled());
        assertThrows(CancellationException.class, () -> photo.enhance(0.4f));
        assertThrows(CancellationException.class, photo::niqe);
        assertThrows(CancellationException.class, photo::greenCdf);
    }

    @Test
    void whatTakesTooLongThrows() throws IOException {
        PhotoBytes photo = PhotoBytes.of(plain);
        Cancellation weeks = Cancellation.after(Duration.ofSeconds(Long.MAX_VALUE));
        assertArrayEquals(photo.enhance(0.4f), photo.cancellation(weeks).enhance(0.4f));
        assertFalse(weeks.isCancelled());
        weeks.cancel();
        assertTrue(weeks.isCancelled());
        for (long seconds : new long[] {0, -1, Long.MIN_VALUE}) {
            PhotoBytes late = photo.cancellation(Cancellation.after(Duration.ofSeconds(seconds)));
            assertThrows(CancellationException.class, () -> late.enhance(0.4f));
            assertThrows(CancellationException.class, late::facts);
        }
    }

    /** Enough work that the time is over in the middle of it, unless that comes too early or too late. */
    @Test
    void workInProgressEndsWithItsTime() throws Exception {
        byte[] large = Files.readAllBytes(
                Pictures.jpeg(folder.resolve("large.jpg"), 4000, 400, 3));
        String message = "";
        for (int round = 0; round < 200 && !message.equals("interrupted"); ++round) {
            PhotoBytes late = PhotoBytes.of(large)
                    .cancellation(Cancellation.after(Duration.ofMillis(round % 40)));
            try {
                assertTrue(late.enhance(0.4f).length > 0);
            } catch (CancellationException error) {
                message = error.getMessage();
            }
        }
        assertEquals("interrupted", message);
    }

    @Test
    void limitsAreThoseThatAreNamed() throws IOException {
        PhotoBytes photo = PhotoBytes.of(plain);
        long pixels = (long) photo.facts().width() * photo.facts().height();
        assertNotNull(photo.maxBytes(plain.length).maxPixels(pixels).maxScans(1).maxSegments(9)
                .enhance(0.4f));
        for (PhotoBytes limited : List.of(photo.maxBytes(plain.length - 1),
                photo.maxPixels(pixels - 1), photo.maxSegments(1))) {
            assertEquals(PhotoException.Kind.TOO_LARGE, assertThrows(PhotoException.class,
                    () -> limited.enhance(0.4f)).kind());
            assertEquals(PhotoException.Kind.TOO_LARGE,
                    assertThrows(PhotoException.class, limited::facts).kind());
        }
        assertThrows(IllegalArgumentException.class, () -> photo.maxBytes(0));
        assertThrows(IllegalArgumentException.class, () -> photo.maxPixels(0));
        assertThrows(IllegalArgumentException.class, () -> photo.maxScans(0));
        assertThrows(IllegalArgumentException.class, () -> photo.maxSegments(0));
    }

    /** Enough work that the other thread comes in the middle of it. */
    @Test
    void workInProgressIsGivenUp() throws Exception {
        byte[] large = Files.readAllBytes(
                Pictures.jpeg(folder.resolve("large.jpg"), 4000, 400, 3));
        ExecutorService threads = Executors.newFixedThreadPool(1);
        int givenUp = 0;
        for (int round = 0; round < 200 && givenUp == 0; ++round) {
            Cancellation cancellation = new Cancellation();
            Future<byte[]> work = threads.submit(
                    () -> PhotoBytes.of(large).cancellation(cancellation).enhance(0.4f));
            Thread.sleep(round % 40);
            cancellation.cancel();
            try {
                assertTrue(work.get().length > 0); // it was done before
            } catch (ExecutionException error) {
                assertEquals(CancellationException.class, error.getCause().getClass());
                if (!"cancelled before it began".equals(error.getCause().getMessage())) {
                    ++givenUp;
                }
            }
        }
        threads.shutdown();
        assertTrue(givenUp > 0, "nothing was given up");
    }

    @Test
    void eightThreadsGetTheSame() throws Exception {
        PhotoBytes photo = PhotoBytes.of(direct(turned));
        byte[] file = photo.enhance(0.4f);
        GreenCdf cdf = photo.greenCdf();
        ExecutorService threads = Executors.newFixedThreadPool(8);
        Callable<Void> work = () -> {
            for (int i = 0; i < 5; ++i) {
                assertArrayEquals(file, photo.enhance(0.4f));
                assertEquals(cdf, photo.greenCdf());
                assertEquals(6, photo.facts().orientation());
                assertTrue(Float.isNaN(photo.niqe()));
            }
            return null;
        };
        for (Future<Void> each : threads.invokeAll(Collections.nCopies(8, work))) {
            each.get();
        }
        threads.shutdown();
    }

    private byte[] ofTheCommand(byte[] file, String name, String made) throws Exception {
        String command = System.getProperty("quenby.command", "");
        assumeFalse(command.isEmpty(),
                "quenby.command names no quenby to compare with");
        Path input = Files.write(folder.resolve(name), file);
        Path output = folder.resolve(made);
        Process process = new ProcessBuilder(command, "enhance", input.toString(), "-o",
                output.toString(), "--slider", "0.7", "--overwrite").redirectErrorStream(true)
                        .start();
        String said = new String(process.getInputStream().readAllBytes());
        assertEquals(0, process.waitFor(), said);
        return Files.readAllBytes(output);
    }

    @Test
    void aFileIsTheCommands() throws Exception {
        byte[] expected = ofTheCommand(turned, "turned.jpg", "command.jpg");
        assertArrayEquals(expected, PhotoBytes.of(turned).enhance(0.7f));
        Path own = folder.resolve("own.jpg");
        JpegJob.of(folder.resolve("turned.jpg"), own).filter(Filter.AUTO, "slider=0.7;").run();
        assertArrayEquals(expected, Files.readAllBytes(own));
        for (byte[] png : pngFiles()) {
            assertArrayEquals(ofTheCommand(png, "in.png", "command.jpg"),
                    PhotoBytes.of(png).enhance(0.7f));
            assertArrayEquals(ofTheCommand(png, "in.png", "command.png"),
                    PhotoBytes.of(png).png().enhance(0.7f));
        }
    }

    /** A picture of 110 x 100 with alpha, and one with 16 bits a channel. */
    private static List<byte[]> pngFiles() throws IOException {
        BufferedImage eight = new BufferedImage(110, 100, BufferedImage.TYPE_INT_ARGB);
        ComponentColorModel model = new ComponentColorModel(
                ColorSpace.getInstance(ColorSpace.CS_sRGB), false, false, Transparency.OPAQUE,
                DataBuffer.TYPE_USHORT);
        BufferedImage sixteen = new BufferedImage(
                model, model.createCompatibleWritableRaster(110, 100), false, null);
        for (int y = 0; y < 100; ++y) {
            for (int x = 0; x < 110; ++x) {
                int[] rgb = {600 * x + 37 * y, 600 * y + 11 * x, x * y * 6};
                eight.setRGB(x, y, (x < 9 ? 0x80 : 0xFF) << 24 | rgb[0] >> 8 << 16
                        | rgb[1] >> 8 << 8 | rgb[2] >> 8);
                sixteen.getRaster().setPixel(x, y, rgb);
            }
        }
        List<byte[]> files = new ArrayList<>();
        for (BufferedImage image : List.of(eight, sixteen)) {
            ByteArrayOutputStream file = new ByteArrayOutputStream();
            ImageIO.write(image, "png", file);
            files.add(file.toByteArray());
        }
        assertEquals(8, files.get(0)[24]);
        assertEquals(16, files.get(1)[24]);
        return files;
    }

    @Test
    void aPngFileIsAPhotoToo() throws Exception {
        for (byte[] png : pngFiles()) {
            byte[] made = PhotoBytes.of(png).enhance(0.7f);
            PhotoBytes photo = PhotoBytes.of(direct(png));
            assertArrayEquals(made, photo.enhance(0.7f));
            assertEquals(110, photo.facts().width());
            assertEquals(100, photo.facts().height());
            assertEquals(PhotoBytes.of(png).niqe(), photo.niqe());
            assertTrue(photo.niqe() > 0);
            assertEquals(36, photo.niqeFeatures().length);
            assertEquals(PhotoBytes.of(png).greenCdf(), photo.greenCdf());
            byte[] cut = Arrays.copyOf(png, png.length * 2 / 3);
            assertEquals(PhotoException.Kind.TRUNCATED, kindOf(cut));
        }
    }

    @Test
    void pixelsThatAreNamedAreAllowedToSmallFilesToo() throws IOException {
        ByteArrayOutputStream blank = new ByteArrayOutputStream();
        ImageIO.write(new BufferedImage(7000, 6000, BufferedImage.TYPE_BYTE_BINARY), "png", blank);
        PhotoBytes photo = PhotoBytes.of(blank.toByteArray());
        assertEquals(PhotoException.Kind.TOO_LARGE,
                assertThrows(PhotoException.class, photo::greenCdf).kind());
        assertEquals(PhotoException.Kind.TOO_LARGE, assertThrows(PhotoException.class,
                () -> photo.maxPixels(41_999_999).greenCdf()).kind());
        assertNotNull(photo.maxPixels(42_000_000).greenCdf());
    }
}
