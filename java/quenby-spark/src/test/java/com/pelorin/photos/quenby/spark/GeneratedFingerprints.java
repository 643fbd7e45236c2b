package com.pelorin.photos.quenby.spark;

import java.io.IOException;
import java.lang.management.ManagementFactory;
import java.nio.ByteBuffer;
import java.nio.ByteOrder;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Random;
import java.util.concurrent.atomic.AtomicLong;
import org.apache.spark.api.java.function.MapFunction;
import org.apache.spark.scheduler.SparkListener;
import org.apache.spark.scheduler.SparkListenerTaskEnd;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Encoders;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.SaveMode;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/**
 * How long the search for near-duplicates takes among photos that are only fingerprints: ten years
 * of bursts of four shots a second apart. A program for spark-submit.
 */
public final class GeneratedFingerprints {
    private static final StructType FINGERPRINT = new StructType()
            .add("path", DataTypes.StringType)
            .add("wall_clock", DataTypes.DoubleType)
            .add("utc", DataTypes.DoubleType)
            .add("orientation", DataTypes.IntegerType)
            .add("green_cdf", DataTypes.BinaryType);
    private static final int BURST = 4;
    private static final double TEN_YEARS = 3.15e8;

    /** How the light of some scenes is distributed. */
    private static final float[][] LIGHT = new float[1000][256];

    static {
        Random random = new Random(1);
        for (float[] each : LIGHT) {
            double dark = 0.3 + 2 * random.nextDouble();
            double bright = 0.3 + 2 * random.nextDouble();
            for (int i = 0; i < 256; ++i) {
                double light = i / 255.0;
                each[i] = (float) (Math.pow(light, dark)
                        * (1 - light * Math.pow(1 - light, bright)));
            }
            for (int i = 1; i < 256; ++i) {
                each[i] = Math.max(each[i - 1], each[i]);
            }
        }
    }

    private GeneratedFingerprints() {}

    /**
     * Makes a table of fingerprints and prints a line of the search in it: photos, pairs, groups,
     * seconds, processor seconds, MiB at most, bytes that are shuffled for each photo.
     *
     * @param arguments how many photos, a folder for the table
     */
    public static void main(String[] arguments) throws IOException {
        long count = Long.parseLong(arguments[0]);
        SparkSession spark = SparkSession.builder().appName("fingerprints").getOrCreate();
        AtomicLong shuffled = new AtomicLong();
        spark.sparkContext().addSparkListener(new SparkListener() {
            @Override
            public void onTaskEnd(SparkListenerTaskEnd task) {
                shuffled.addAndGet(task.taskMetrics().shuffleWriteMetrics().bytesWritten());
            }
        });
        spark.range(0, count, 1, (int) (1 + count / 50_000))
                .map((MapFunction<Long, Row>) GeneratedFingerprints::fingerprint,
                        Encoders.row(FINGERPRINT))
                .write().mode(SaveMode.Overwrite).parquet(arguments[1]);
        Dataset<Row> photos = spark.read().parquet(arguments[1]);
        long start = System.nanoTime();
        double before = processorSeconds();
        long pairs;
        long groups;
        try (NearDuplicates found = NearDuplicates.of(photos, NearDuplicates.USUAL_THRESHOLD)) {
            pairs = found.pairs().count();
            groups = found.groups().count();
        }
        System.out.printf("%d photos, %d pairs, %d groups: %.0f s, %.0f s of processors, %d MiB, "
                + "%d bytes shuffled a photo%n", count, pairs, groups,
                (System.nanoTime() - start) / 1e9, processorSeconds() - before, peakMiB(),
                shuffled.get() / count);
        spark.stop();
    }

    private static Row fingerprint(long photo) {
        long scene = photo / BURST;
        Random ofScene = new Random(scene * 0x9E3779B97F4A7C15L);
        double moment = Math.floor(ofScene.nextDouble() * TEN_YEARS) + photo % BURST;
        int orientation = ofScene.nextInt(4) == 0 ? 6 : 1;
        boolean zone = ofScene.nextInt(4) > 0;
        float[] one = LIGHT[ofScene.nextInt(LIGHT.length)];
        float[] other = LIGHT[ofScene.nextInt(LIGHT.length)];
        float share = ofScene.nextFloat() + 0.02f * (photo % BURST);
        ByteBuffer cdf = ByteBuffer.allocate(1024).order(ByteOrder.LITTLE_ENDIAN);
        for (int i = 0; i < 256; ++i) {
            float mixed = (one[i] + share * other[i]) / (1 + share);
            cdf.putFloat(Math.round(mixed * 60_000) / 60_000f);
        }
        return RowFactory.create(String.format("photos/%02x/%d.jpg", scene & 0xFF, photo), moment,
                zone ? moment - 7200 : null, orientation, cdf.array());
    }

    private static double processorSeconds() {
        return ((com.sun.management.OperatingSystemMXBean)
                ManagementFactory.getOperatingSystemMXBean()).getProcessCpuTime() / 1e9;
    }

    private static long peakMiB() throws IOException {
        return Files.readAllLines(Path.of("/proc/self/status")).stream()
                .filter(line -> line.startsWith("VmHWM:"))
                .mapToLong(line -> Long.parseLong(line.replaceAll("[^0-9]", "")) / 1024)
                .findFirst().orElse(0);
    }
}
