package com.pelorin.photos.quenby.spark;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertNull;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.pelorin.photos.quenby.autoenhance.Filter;
import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.time.LocalDateTime;
import java.util.Arrays;
import java.util.Map;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SparkSession;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class QuenbyTest {
    private final SparkSession spark = LocalSpark.session();
    private final byte[] photo = TestPhotos.withExif(TestPhotos.jpeg(120, 100, 4, 1), 6,
            LocalDateTime.of(2024, 6, 1, 12, 30, 15), "+02:00");
    @TempDir Path folder;

    @BeforeEach
    void register() throws Exception {
        Quenby.register(spark);
        Files.write(folder.resolve("a.jpg"), photo);
        LocalSpark.photos(spark, folder).createOrReplaceTempView("photos");
    }

    private Row first(String expression) {
        return spark.sql("SELECT " + expression + " AS made FROM photos").select("made.*").head();
    }

    private byte[] bytes(String expression) {
        Row made = first(expression);
        assertNull(made.get(1));
        return (byte[]) made.get(0);
    }

    private String error(String expression) {
        Row made = first(expression);
        assertNull(made.get(0));
        return made.getString(1);
    }

    @Test
    void filesAreThoseOfPhotoBytes() throws Exception {
        PhotoBytes known = PhotoBytes.of(photo);
        assertArrayEquals(known.filter(Filter.AUTO, "slider=0.4;"),
                bytes("quenby_enhance(content, 'slider=0.4;')"));
        assertArrayEquals(known.quality(70).filter(Filter.AUTO, "slider=0.4;"),
                bytes("quenby_enhance(content, 'quality=70;slider=0.4')"));
        assertArrayEquals(known.sourceQuality().filter(Filter.AUTO, "slider=0.4;"),
                bytes("quenby_enhance(content, 'slider=0.4;quality=auto')"));
        assertArrayEquals(known.filter(Filter.WINTER, ""),
                bytes("quenby_look(content, 'winter', '')"));
        assertArrayEquals(known.filter(Filter.STARFISH, "s1=0.7;"),
                bytes("quenby_look(content, 'LowDimRGBCurve', 's1=0.7;')"));
    }

    @Test
    void factsAndMeasuresAreThoseOfPhotoBytes() throws Exception {
        PhotoBytes known = PhotoBytes.of(photo);
        assertEquals(known.niqe(), first("quenby_score(content)").getFloat(0));
        Row info = first("quenby_info(content)").getStruct(0);
        assertEquals("[120,100,6,1.717245015E9,1.717237815E9]", info.toString());
        assertArrayEquals(known.greenCdf().toBytes(), bytes("quenby_green_cdf(content)"));
        assertEquals(known.greenCdf().distanceTo(known.greenCdf()), first(
                "quenby_cdf_distance(quenby_green_cdf(content).result, "
                + "quenby_green_cdf(content).result)").getFloat(0));
        Row fingerprint = first("quenby_fingerprint(content)").getStruct(0);
        assertEquals(6, fingerprint.getInt(2));
        assertArrayEquals(known.greenCdf().toBytes(), (byte[]) fingerprint.get(5));
    }

    @Test
    void whatFailsIsARowThatSaysWhy() throws Exception {
        Path bad = Files.createDirectory(folder.resolve("bad"));
        Files.write(bad.resolve("cut.jpg"), Arrays.copyOf(photo, photo.length * 2 / 3));
        Files.write(bad.resolve("empty.jpg"), new byte[0]);
        Files.write(bad.resolve("text.jpg"), "no photo".getBytes(StandardCharsets.UTF_8));
        LocalSpark.photos(spark, bad).createOrReplaceTempView("photos");
        for (String function : new String[] {"quenby_enhance(content, 'slider=0.4;')",
            "quenby_look(content, 'winter', NULL)", "quenby_score(content)",
            "quenby_green_cdf(content)", "quenby_fingerprint(content)"}) {
            assertEquals(0, spark.sql("SELECT " + function + " AS made FROM photos")
                    .where("made.result IS NOT NULL OR length(made.error) < 5").count(), function);
        }
        assertTrue(error("quenby_look(content, 'autumn', '')").contains("winter"));
        assertTrue(error("quenby_enhance(content, 'slide=1;')").contains("'slide'"));
        assertTrue(error("quenby_enhance(content, 'slider=1;quality=0;')").contains("quality"));
        assertTrue(error("quenby_enhance(content, 'slider=1;quality=x;')").contains("quality"));
        assertTrue(error("quenby_cdf_distance(content, content)").contains("1024"));
    }

    @Test
    void limitsAreThoseThatAreNamed() {
        Quenby.register(spark, Map.of("--max-pixels", "11999"));
        for (String call : new String[] {"enhance(content, 'slider=0.4;')",
            "look(content, 'winter', '')", "score(content)", "info(content)",
            "green_cdf(content)", "fingerprint(content)"}) {
            assertTrue(error("quenby_" + call).contains("120 x 100 pixels"), call);
        }
        assertThrows(IllegalArgumentException.class,
                () -> Quenby.register(spark, Map.of("--max-pixels", "few")));
        assertThrows(IllegalArgumentException.class,
                () -> Quenby.register(spark, Map.of("--quality", "9")));
        Quenby.register(spark);
    }

    @Test
    void exhaustedMemoryIsNoPhotosFailure() {
        assertThrows(OutOfMemoryError.class, () -> Outcome.of(() -> {
            throw new OutOfMemoryError("as the natives throw it");
        }));
    }

    @Test
    void nullStaysNull() {
        for (String call : new String[] {"enhance(NULL, '')", "look(NULL, '', '')", "score(NULL)",
            "info(NULL)", "green_cdf(NULL)", "cdf_distance(NULL, NULL)", "fingerprint(NULL)"}) {
            assertEquals(1, spark.sql("SELECT quenby_" + call + " AS made")
                    .where("made IS NULL").count());
        }
    }
}
