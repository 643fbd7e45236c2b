package com.pelorin.photos.quenby.spark;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.fasterxml.jackson.databind.JsonNode;
import com.fasterxml.jackson.databind.ObjectMapper;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.PrintStream;
import java.io.UncheckedIOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import java.util.List;
import java.util.Map;
import java.util.Set;
import java.util.TreeMap;
import java.util.TreeSet;
import java.util.stream.Collectors;
import java.util.stream.Stream;
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

    @Test
    void groupsAreTheCommands() throws Exception {
        assertTrue(run("dupes", in, out).contains("30 done"));
        Set<String> expected = new TreeSet<>();
        new ObjectMapper().readTree(LocalSpark.command(0, "dupes", "-r", in.toString(), "--json"))
                .get("groups").forEach(group -> expected.add(group.findValuesAsText("file")
                        .stream().map(file -> "file:" + file).collect(Collectors.toList()) + ""));
        Set<String> told = new TreeSet<>();
        spark.read().parquet(out + "/groups").collectAsList()
                .forEach(group -> told.add(group.getList(0) + ""));
        assertFalse(expected.isEmpty());
        assertEquals(expected, told);
        Files.delete(Path.of(spark.read().parquet(out + "/groups").selectExpr("photos[0]")
                .as(Encoders.STRING()).head().substring("file:".length())));
        assertTrue(run("dupes", in, out).contains("0 done, 0 failed, 29 done before"));
    }

    @Test
    void whatIsAskedForIsCheckedFirst() {
        String[][] wrong = {{}, {"enhanced"}, {"enhance"}, {"enhance", "--in", "a"},
            {"enhance", "--in", "a", "--out", "b", "--params", "slide=1;"},
            {"enhance", "--in", "a", "--out", "b", "--params"},
            {"enhance", "--in", "a", "--out", "b", "--threshold", "1"},
            {"look", "--in", "a", "--out", "b"},
            {"look", "--in", "a", "--out", "b", "--look", "autumn"},
            {"dupes", "--in", "a", "--out", "b", "--threshold", "high"}};
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
