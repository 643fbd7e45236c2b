package com.pelorin.photos.quenby.spark;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.fasterxml.jackson.databind.JsonNode;
import com.fasterxml.jackson.databind.ObjectMapper;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.time.LocalDateTime;
import java.util.ArrayList;
import java.util.List;
import java.util.Set;
import java.util.TreeSet;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SparkSession;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class NearDuplicatesTest {
    private final SparkSession spark = LocalSpark.session();
    @TempDir Path folder;

    /** Photos, lowest and highest score, seconds; of pairs photos, score, distance, seconds. */
    private static Set<String> told(Path folder, String list, String threshold) throws Exception {
        JsonNode report = new ObjectMapper().readTree(LocalSpark.command(0, "dupes", "-r",
                folder.toString(), "--json", "--pairs", "--quiet", "--threshold", threshold));
        Set<String> told = new TreeSet<>();
        for (JsonNode group : report.get("groups")) {
            if (list.equals("pairs")) {
                for (JsonNode pair : group.get("pairs")) {
                    told.add(pair.get("a").asText() + " " + pair.get("b").asText() + " "
                            + (float) pair.get("score").asDouble() + " "
                            + (float) pair.get("distance").asDouble() + " "
                            + pair.get("timeDifference").asDouble());
                }
                continue;
            }
            List<String> photos = new ArrayList<>();
            group.get("photos").forEach(photo -> photos.add(photo.get("file").asText()));
            told.add(photos + " " + (float) group.get("lowestScore").asDouble() + " "
                    + (float) group.get("highestScore").asDouble() + " "
                    + group.get("seconds").asDouble());
        }
        return told;
    }

    private static Set<String> groups(NearDuplicates found) {
        Set<String> told = new TreeSet<>();
        for (Row group : found.groups().collectAsList()) {
            told.add(group.getList(0) + " " + group.get(1) + " " + group.get(2) + " "
                    + group.get(3));
        }
        return told;
    }

    @Test
    void groupsAndPairsAreTheCommands() throws Exception {
        TestPhotos.library(folder, 400, 24, 16, 1);
        Dataset<Row> fingerprints = NearDuplicates.fingerprints(
                LocalSpark.photos(spark, folder)).cache();
        for (String threshold : new String[] {"1.5", "2.6", "-9"}) {
            Set<String> expected = told(folder, "groups", threshold);
            assertTrue(!expected.isEmpty(), expected.toString());
            boolean usual = threshold.equals("1.5");
            int lot = usual ? TimeCells.LOT : 16; // crowds everywhere
            try (NearDuplicates found = NearDuplicates.of(
                    fingerprints, Float.parseFloat(threshold), lot)) {
                assertEquals(expected, groups(found), threshold);
                assertTrue(found.untimed() > 10);
                Set<String> pairs = new TreeSet<>();
                List<Row> rows = found.pairs().collectAsList();
                rows.forEach(pair -> pairs.add(pair.get(0) + " " + pair.get(1) + " "
                        + pair.get(2) + " " + pair.get(3) + " " + pair.get(4)));
                assertEquals(rows.size(), pairs.size(), "no pair is found twice");
                assertTrue(pairs.containsAll(told(folder, "pairs", threshold)));
            }
        }
        fingerprints.unpersist();
    }

    @Test
    void aThousandPhotosOfOneSecondAreComparedOnce() throws IOException {
        for (int scene = 0; scene < 20; ++scene) {
            Files.write(folder.resolve(scene + ".jpg"), TestPhotos.jpeg(24, 16, scene, 1));
        }
        Dataset<Row> scenes = NearDuplicates.fingerprints(LocalSpark.photos(spark, folder))
                .coalesce(1).cache();
        Dataset<Row> crowd = spark.range(50).crossJoin(scenes).selectExpr(
                "concat(path, id) AS path", "1.7e9D AS wall_clock",
                "CAST(NULL AS DOUBLE) AS utc", "1 AS orientation", "green_cdf");
        assertEquals(1000, crowd.count());
        try (NearDuplicates found = NearDuplicates.of(crowd, 3.6f, 200)) { // little but copies
            List<Row> groups = found.groups().collectAsList();
            assertEquals(20, groups.size());
            groups.forEach(group -> assertEquals(50, group.getList(0).size()));
            assertEquals(20 * 50 * 49 / 2, found.pairs().count());
        }
        scenes.unpersist();
    }

    @Test
    void contentWillDoAndPhotosThatFailAreInNoGroup() throws IOException {
        byte[] shot = TestPhotos.withExif(TestPhotos.jpeg(24, 16, 1, 1), 1,
                LocalDateTime.of(2024, 6, 1, 12, 0), null);
        Files.write(folder.resolve("a.jpg"), shot);
        Files.write(folder.resolve("b.jpg"), shot);
        Files.write(folder.resolve("c.jpg"), new byte[0]);
        Files.write(folder.resolve("d.jpg"), TestPhotos.jpeg(24, 16, 1, 1));
        try (NearDuplicates found = NearDuplicates.of(LocalSpark.photos(spark, folder),
                NearDuplicates.USUAL_THRESHOLD)) {
            List<Row> groups = found.groups().collectAsList();
            assertEquals(1, groups.size());
            assertEquals(List.of(folder + "/a.jpg", folder + "/b.jpg"), groups.get(0).getList(0));
            assertEquals(1, found.untimed());
        }
    }

    @Test
    void nothingReachesAnImpossibleThreshold() throws IOException {
        TestPhotos.library(folder, 20, 24, 16, 3);
        try (NearDuplicates found = NearDuplicates.of(LocalSpark.photos(spark, folder), 9)) {
            assertEquals(0, found.groups().count());
        }
        assertThrows(IllegalArgumentException.class,
                () -> NearDuplicates.of(LocalSpark.photos(spark, folder), Float.NaN));
    }
}
