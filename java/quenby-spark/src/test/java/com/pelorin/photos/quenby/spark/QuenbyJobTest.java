package com.pelorin.photos.quenby.spark;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.fasterxml.jackson.databind.JsonNode;
import com.fasterxml.jackson.databind.ObjectMapper;
import java.awt.image.BufferedImage;
import java.io.ByteArrayInputStream;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.PrintStream;
import java.io.UncheckedIOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.attribute.FileTime;
import java.time.Instant;
import java.time.LocalDateTime;
import java.time.ZoneId;
import java.util.Arrays;
import java.util.List;
import java.util.Map;
import java.util.Set;
import java.util.TreeMap;
import java.util.TreeSet;
import java.util.stream.Collectors;
import java.util.stream.Stream;
import javax.imageio.ImageIO;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Encoders;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SparkSession;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class QuenbyJobTest {
    private final SparkSession spark = LocalSpark.session();
    @TempDir Path folder;
    private Path in;
    private Path out;

    @BeforeEach
    void makePhotos() throws IOException {
        folder = folder.toRealPath();
        in = folder.resolve("in");
        out = folder.resolve("out");
        TestPhotos.library(in, 30, 120, 100, 5);
    }

    private String run(String... arguments) throws IOException {
        ByteArrayOutputStream told = new ByteArrayOutputStream();
        QuenbyJob.run(spark, new QuenbyJob.Arguments(arguments), new PrintStream(told));
        return told.toString();
    }

    private String run(String verb, Path from, Path to) throws IOException {
        return run(verb, "--in", from.toString(), "--out", to.toString());
    }

    private static Map<String, byte[]> files(Path folder) throws IOException {
        Map<String, byte[]> files = new TreeMap<>();
        try (Stream<Path> paths = Files.walk(folder)) {
            for (Path file : (Iterable<Path>) paths.filter(Files::isRegularFile)::iterator) {
                String name = folder.relativize(file).toString();
                if (!name.startsWith("_manifest")) {
                    files.put(name, Files.readAllBytes(file));
                }
            }
        }
        return files;
    }

    private static void assertSame(Map<String, byte[]> expected, Map<String, byte[]> actual) {
        assertEquals(expected.keySet(), actual.keySet());
        expected.forEach((name, file) -> assertArrayEquals(file, actual.get(name), name));
    }

    private Dataset<Row> manifest() {
        return spark.read().parquet(out + "/_manifest");
    }

    @Test
    void filesAreTheCommands() throws Exception {
        assertTrue(run("enhance", in, out).contains("30 done, 0 failed, 0 done before"));
        Path expected = folder.resolve("expected");
        LocalSpark.command(0, "enhance", "-r", in.toString(), "-o", expected + "/",
                "--name", "{stem}.jpg");
        assertSame(files(expected), files(out));
        assertEquals(30, manifest().where("status = 'done' AND length(hash) = 64").count());

        Path winter = folder.resolve("winter");
        assertTrue(run("look", "--look", "winter", "--in", in.toString(), "--out",
                folder.resolve("looks").toString()).contains("30 done"));
        LocalSpark.command(0, "look", "winter", "-r", in.toString(), "-o", winter + "/",
                "--name", "{stem}.jpg");
        assertSame(files(winter), files(folder.resolve("looks")));
    }

    @Test
    void aSecondRunDoesWhatIsMissing() throws IOException {
        run("enhance", in, out);
        Map<String, byte[]> made = files(out);
        assertTrue(run("enhance", in, out).contains("0 done, 0 failed, 30 done before"));
        String one = made.keySet().iterator().next();
        Files.delete(out.resolve(one));
        Files.write(in.resolve("new.jpg"), TestPhotos.jpeg(100, 100, 77, 1));
        assertTrue(run("enhance", in, out).contains("2 done, 0 failed, 29 done before"));
        assertArrayEquals(made.get(one), files(out).get(one));
        assertEquals(31, files(out).size());
        // What a killed run wrote and did not tell of is as good.
        try (Stream<Path> told = Files.walk(out.resolve("_manifest"))) {
            told.filter(Files::isRegularFile).forEach(file -> file.toFile().delete());
        }
        Files.write(Files.createDirectories(out.resolve("_parts")).resolve("half"), new byte[9]);
        assertTrue(run("enhance", in, out).contains("31 done, 0 failed, 0 done before"));
        assertEquals(31, files(out).size());
    }

    @Test
    void anotherFileIsReplacedOnlyWhenAllowed() throws IOException {
        run("enhance", in, out);
        Map<String, byte[]> made = files(out);
        String[] stronger = {"enhance", "--in", in.toString(), "--out", out.toString(), "--params",
            "slider=0.9;"};
        assertTrue(run(stronger).contains("0 done, 30 failed"));
        assertSame(made, files(out));
        assertEquals(30, manifest().where("error LIKE '%--overwrite%'").count());
        String[] replacing = Stream.concat(Stream.of(stronger), Stream.of("--overwrite"))
                .toArray(String[]::new);
        assertTrue(run(replacing).contains("30 done, 0 failed"));
        assertEquals(made.keySet(), files(out).keySet());
        made.forEach((name, file) -> assertFalse(
                Arrays.equals(file, read(out.resolve(name))), name));
    }

    private static byte[] read(Path file) {
        try {
            return Files.readAllBytes(file);
        } catch (IOException error) {
            throw new UncheckedIOException(error);
        }
    }

    @Test
    void badFilesAreRows() throws IOException {
        Files.write(in.resolve("empty.jpg"), new byte[0]);
        Files.write(in.resolve("text.JPG"), "no photo".getBytes());
        Files.write(in.resolve("notes.txt"), "no photo".getBytes());
        Files.write(in.resolve(".hidden.jpg"), "no photo".getBytes());
        assertTrue(run("enhance", in, out).contains("30 done, 2 failed"));
        assertEquals(Set.of("empty.jpg", "text.JPG"), manifest().where("status = 'failed'")
                .selectExpr("regexp_extract(input, '[^/]*$', 0)").as(Encoders.STRING())
                .collectAsList().stream().collect(Collectors.toSet()));
        assertEquals(0, manifest().where("status = 'failed' AND length(error) < 5").count());
        assertEquals(30, files(out).size());
    }

    @Test
    void photosMayBeListed() throws IOException {
        List<String> paths;
        try (Stream<Path> photos = Files.walk(in)) {
            paths = photos.filter(Files::isRegularFile).map(Path::toString)
                    .collect(Collectors.toList());
        }
        paths.add(in + "/missing.jpg");
        paths.add(in + "/a");
        paths.add(paths.get(0));
        Path list = Files.write(folder.resolve("list.txt"), paths);
        assertTrue(run("enhance", list, out).contains("30 done, 2 failed"));
        assertEquals(Set.copyOf(paths.subList(0, 30)).stream()
                .map(path -> path.substring(1)).collect(Collectors.toCollection(TreeSet::new)),
                files(out).keySet());
        Path table = folder.resolve("photos.parquet");
        spark.createDataset(paths, Encoders.STRING()).toDF("path").write().parquet(table + "");
        assertTrue(run("enhance", table, out).contains("0 done, 2 failed, 30 done before"));
    }

    @Test
    void scoresAreTheCommands() throws Exception {
        assertTrue(run("score", in, out).contains("30 done"));
        Map<String, String> expected = new TreeMap<>();
        for (JsonNode photo : new ObjectMapper().readTree(LocalSpark.command(0, "score", "-r",
                in.toString(), "--json"))) {
            expected.put("file:" + photo.get("file").asText(),
                    "" + (float) photo.get("score").asDouble());
        }
        Map<String, String> told = new TreeMap<>();
        spark.read().parquet(out + "/scores").select("input", "niqe").collectAsList()
                .forEach(row -> told.put(row.getString(0), "" + row.get(1)));
        assertEquals(expected, told);
        assertTrue(run("score", in, out).contains("0 done, 0 failed, 30 done before"));
    }

    private void writeShot(String name, byte[] jpeg, LocalDateTime time) throws IOException {
        Files.write(in.resolve(name), TestPhotos.withExif(jpeg, 1, time, null));
    }

    @Test
    void groupsAndTheBestOfEachAreTheCommands() throws Exception {
        LocalDateTime time = LocalDateTime.of(2023, 1, 1, 12, 0);
        writeShot("more.jpg", TestPhotos.jpeg(160, 140, 7, 1), time);
        writeShot("less.jpg", TestPhotos.jpeg(150, 130, 8, 1), time);
        for (String name : new String[] {"tiny1.jpg", "tiny2.jpg"}) { // too small for a score
            writeShot(name, TestPhotos.jpeg(80, 60, 9, 1), time.plusDays(1));
        }
        assertTrue(run("dupes", "--in", in.toString(), "--out", out.toString(), "--threshold", "0",
                "--keep", "best").contains("34 done"));
        Set<String> expected = new TreeSet<>();
        for (JsonNode group : new ObjectMapper().readTree(LocalSpark.command(0, "dupes", "-r",
                in.toString(), "--json", "--threshold", "0", "--keep", "best")).get("groups")) {
            int place = 0;
            for (JsonNode photo : group.get("ranking")) {
                expected.add(group.get("photos").get(0).get("file").asText() + " " + ++place + " "
                        + photo.get("file").asText() + " " + photo.get("keep") + " "
                        + (photo.get("niqe").isNull() ? null : (float) photo.get("niqe").asDouble()));
            }
        }
        Set<String> told = new TreeSet<>();
        for (Row photo : spark.read().parquet(out + "/ranking").selectExpr(
                "substr(group, 6)", "place", "substr(photo, 6)", "keep", "niqe").collectAsList()) {
            told.add(photo.mkString(" "));
        }
        assertFalse(expected.isEmpty());
        assertEquals(expected, told);
        Set<String> groups = new TreeSet<>();
        spark.read().parquet(out + "/groups").selectExpr("explode(photos)").as(Encoders.STRING())
                .collectAsList().forEach(groups::add);
        assertEquals(told.size(), groups.size());
        Files.delete(Path.of(groups.iterator().next().substring("file:".length())));
        assertTrue(run("dupes", in, out).contains("0 done, 0 failed, 33 done before"));
    }

    @Test
    void photosWithoutATimeMayTakeThatOfTheirFile() throws Exception {
        String[] names = {"x.jpg", "y.jpg", "z.jpg"};
        for (int i = 0; i < names.length; ++i) {
            Path photo = Files.write(in.resolve(names[i]), TestPhotos.jpeg(120, 100, 99, 1));
            Files.setLastModifiedTime(photo, FileTime.fromMillis(1_720_000_000_000L + 700 * i));
        }
        // One that the camera's clock, without a zone, puts beside them: times of files have one.
        writeShot("w.jpg", TestPhotos.jpeg(120, 100, 99, 1), LocalDateTime.ofInstant(
                Instant.ofEpochSecond(1_720_000_000), ZoneId.systemDefault()));
        Set<String> expected = new TreeSet<>();
        new ObjectMapper().readTree(LocalSpark.command(0, "dupes", "-r", in.toString(), "--json",
                "--assume-mtime")).get("groups").forEach(group -> expected.add(group
                        .findValuesAsText("file") + " " + group.get("seconds").asDouble()));
        assertTrue(run("dupes", "--in", in.toString(), "--out", out.toString(), "--assume-mtime")
                .contains("; 0 photos tell no time"));
        Set<String> told = new TreeSet<>();
        for (Row group : spark.read().parquet(out + "/groups").selectExpr(
                "transform(photos, photo -> substr(photo, 6))", "seconds").collectAsList()) {
            told.add(group.getList(0) + " " + group.get(1));
        }
        assertTrue(expected.toString().contains("z.jpg"), expected.toString());
        assertEquals(expected, told);
    }

    @Test
    void photosBeyondTheLimitsAreRows() throws IOException {
        String[] limited = {"score", "--in", in.toString(), "--out", out.toString(), "", "11999"};
        limited[5] = "--max-pixels";
        assertTrue(run(limited).contains("0 done, 30 failed"));
        limited[5] = "--max-bytes";
        limited[6] = "1k";
        assertTrue(run(limited).contains("0 done, 30 failed"));
        limited[5] = "--max-segments";
        limited[6] = "1";
        assertTrue(run(limited).contains("0 done, 30 failed"));
        assertEquals(3, spark.read().parquet(out + "/scores").select("error").distinct()
                .where("error LIKE '%larger than 1000 bytes%' OR error LIKE '%pixels%'"
                        + " OR error LIKE '%too many segments%'").count());
        limited[5] = "--max-scans";
        assertTrue(run(limited).contains("30 done, 0 failed"));
    }

    @Test
    void aPhotoThatTakesTooLongIsGivenUp() {
        PhotoLimits limits = PhotoLimits.of(Map.of("--timeout", "1"));
        assertTrue(assertThrows(IOException.class, () -> limits.apply(
                TestPhotos.jpeg(120, 100, 1, 1), photo -> {
                    while (true) {
                        photo.niqe();
                    }
                })).getMessage().contains("raise --timeout"));
    }

    @Test
    void pngFilesStayPngFiles() throws Exception {
        Path pictures = Files.createDirectory(folder.resolve("pictures"));
        BufferedImage picture = ImageIO.read(
                new ByteArrayInputStream(TestPhotos.jpeg(120, 100, 3, 1)));
        ImageIO.write(picture, "png", pictures.resolve("a.PNG").toFile());
        assertTrue(run("enhance", pictures, out).contains("1 done"));
        Path expected = folder.resolve("expected");
        LocalSpark.command(0, "enhance", pictures + "/a.PNG", "-o", expected + "/", "--name",
                "{stem}.PNG");
        assertSame(files(expected), files(out));
    }

    @Test
    void anyFileSystemOfHadoopWillDo() throws Exception {
        spark.sparkContext().hadoopConfiguration().set(
                "fs.viewfs.mounttable.test.link./photos", in.toUri().toString());
        spark.sparkContext().hadoopConfiguration().set(
                "fs.viewfs.mounttable.test.link./made", folder.toUri().toString());
        String[] elsewhere = {"enhance", "--in", "viewfs://test/photos", "--out",
            "viewfs://test/made/out"};
        assertTrue(run(elsewhere).contains("30 done, 0 failed, 0 done before"));
        Map<String, byte[]> made = files(out);
        made.keySet().removeIf(name -> name.endsWith(".crc")); // the local files behind it
        assertEquals(30, made.size());
        assertTrue(run(elsewhere).contains("0 done, 0 failed, 30 done before"));
        run("enhance", in, folder.resolve("here"));
        assertSame(files(folder.resolve("here")), made);
    }

    @Test
    void whatIsAskedForIsCheckedFirst() {
        String[][] wrong = {{}, {"enhanced"}, {"enhance"}, {"enhance", "--in", "a"},
            {"enhance", "--in", "a", "--out", "b", "--params", "slide=1;"},
            {"enhance", "--in", "a", "--out", "b", "--params"},
            {"enhance", "--in", "a", "--out", "b", "--threshold", "1"},
            {"look", "--in", "a", "--out", "b"},
            {"look", "--in", "a", "--out", "b", "--look", "autumn"},
            {"dupes", "--in", "a", "--out", "b", "--threshold", "high"},
            {"dupes", "--in", "a", "--out", "b", "--keep", "all"},
            {"score", "--in", "a", "--out", "b", "--max-pixels", "0"},
            {"score", "--in", "a", "--out", "b", "--max-pixels", "40m"},
            {"score", "--in", "a", "--out", "b", "--max-bytes", "99999999999999999999"},
            {"score", "--in", "a", "--out", "b", "--max-scans", "0"},
            {"score", "--in", "a", "--out", "b", "--max-segments", "many"},
            {"score", "--in", "a", "--out", "b", "--timeout", "-1"}};
        for (String[] arguments : wrong) {
            assertThrows(IllegalArgumentException.class,
                    () -> new QuenbyJob.Arguments(arguments), String.join(" ", arguments));
        }
        for (Path to : List.of(in, in.resolve("out"), folder)) {
            assertTrue(assertThrows(IOException.class, () -> run("enhance", in, to)).getMessage()
                    .contains("neither may lie in the other"));
        }
        assertThrows(IOException.class, () -> run("enhance", folder.resolve("none"), out));
    }
}
