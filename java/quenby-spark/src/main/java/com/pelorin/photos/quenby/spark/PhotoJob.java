package com.pelorin.photos.quenby.spark;

import static org.apache.spark.sql.functions.col;
import static org.apache.spark.sql.functions.concat;
import static org.apache.spark.sql.functions.expr;
import static org.apache.spark.sql.functions.lit;
import static org.apache.spark.sql.functions.row_number;
import static org.apache.spark.sql.functions.when;

import com.pelorin.photos.quenby.autoenhance.NativeLibrary;
import java.io.IOException;
import java.math.BigInteger;
import java.security.MessageDigest;
import java.security.NoSuchAlgorithmException;
import java.time.ZoneOffset;
import java.time.ZonedDateTime;
import java.time.format.DateTimeFormatter;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.Iterator;
import java.util.List;
import java.util.Locale;
import java.util.UUID;
import org.apache.hadoop.fs.FileSystem;
import org.apache.hadoop.fs.Path;
import org.apache.spark.api.java.function.MapPartitionsFunction;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Encoders;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.expressions.Window;
import org.apache.spark.storage.StorageLevel;
import org.apache.spark.util.SerializableConfiguration;

/** Does some work with every photo for which it is not done, and tells of each in a manifest. */
final class PhotoJob {
    /** How a run ended. */
    static final class Tally {
        final long done;
        final long failed;
        final long before;

        Tally(long done, long failed, long before) {
            this.done = done;
            this.failed = failed;
            this.before = before;
        }

        @Override
        public String toString() {
            return done + " done, " + failed + " failed, " + before + " done before";
        }
    }

    private static final int PHOTOS_OF_A_TASK = 50;
    private static final int MOST_TASKS = 10_000;
    private static final String PARTS = "_parts";

    private final SparkSession spark;
    private final PhotoWork work;
    private final PhotoLimits limits;
    private final Path out;
    private final boolean overwrite;
    private final Manifest manifest;
    private final SerializableConfiguration hadoop;

    /**
     * Prepares a job.
     *
     * @param limits    what a photo may cost
     * @param out       the folder of the files that it makes; one job at a time works there
     * @param overwrite whether it may replace other files there
     * @param told      the folder of the manifest
     */
    PhotoJob(SparkSession spark, PhotoWork work, PhotoLimits limits, Path out, boolean overwrite,
            Path told) {
        this.spark = spark;
        this.work = work;
        this.limits = limits;
        this.out = out;
        this.overwrite = overwrite;
        this.manifest = new Manifest(spark, told, work.columns());
        this.hadoop = PhotoList.configuration(spark);
    }

    Manifest manifest() {
        return manifest;
    }

    Tally run(Dataset<Row> photos) throws IOException {
        String run = ZonedDateTime.now(ZoneOffset.UTC)
                .format(DateTimeFormatter.ofPattern("yyyyMMdd-HHmmss-")) + UUID.randomUUID();
        FileSystem files = out.getFileSystem(hadoop.value());
        files.mkdirs(out);
        Path parts = new Path(out, PARTS);
        files.delete(parts, true); // what a killed driver left
        Dataset<Row> planned = plan(photos).persist(StorageLevel.MEMORY_AND_DISK());
        long before = planned.where("done").count();
        Dataset<Row> missing = planned.where("NOT done");
        long count = missing.count();
        try {
            if (count > 0) {
                int most = Math.max(MOST_TASKS, 4 * spark.sparkContext().defaultParallelism());
                int tasks = (int) Math.min(most, 1 + (count - 1) / PHOTOS_OF_A_TASK);
                manifest.append(missing.repartition(tasks).mapPartitions(
                        new Worker(work, limits, parts.toString(), overwrite, hadoop),
                        Encoders.row(manifest.schema())), run);
            }
        } finally {
            planned.unpersist();
            files.delete(parts, true);
        }
        long done = count == 0 ? 0 : manifest.rows().where(col("run").equalTo(run))
                .where(col("status").equalTo(Manifest.DONE)).count();
        return new Tally(done, count - done, before);
    }

    /** The rows of photos that are done, as the last run told of each. */
    Dataset<Row> results(Dataset<Row> photos) throws IOException {
        return done().join(photos.select("input", "bytes", "modified"),
                new String[] {"input", "bytes", "modified"}, "left_semi")
                .dropDuplicates(new String[] {"input"});
    }

    private Dataset<Row> done() throws IOException {
        return manifest.rows()
                .where(col("status").equalTo(Manifest.DONE))
                .where(col("parameters").equalTo(work.parameters()))
                .where(col("engine").equalTo(NativeLibrary.version()));
    }

    /** Each photo once, with its output and whether it is done. */
    private Dataset<Row> plan(Dataset<Row> photos) throws IOException {
        Dataset<Row> known = done().select(col("input"), col("bytes"), col("modified"),
                col("output"), lit(true).as("known")).distinct();
        if (!work.writesFiles()) {
            return photos.withColumn("output", lit(null).cast("string"))
                    .join(known.drop("output"), new String[] {"input", "bytes", "modified"}, "left")
                    .selectExpr("input", "bytes", "modified", "output", "trouble",
                            "known IS NOT NULL AS done");
        }
        String folder = out.getFileSystem(hadoop.value()).makeQualified(out).toString();
        Dataset<Row> there = PhotoList.below(spark, folder, hadoop).select("input")
                .withColumnRenamed("input", "output").withColumn("there", lit(true));
        Dataset<Row> named = photos.withColumn("output", concat(lit(folder + "/"),
                expr("IF(lower(name) RLIKE '[.](jpe?g|jpe|png)$', name, concat(name, '.jpg'))")));
        return named
                .withColumn("nth", row_number().over(
                        Window.partitionBy("output").orderBy("input")))
                .withColumn("trouble", when(col("nth").gt(1),
                        lit("another photo has the same output")).otherwise(col("trouble")))
                .withColumn("trouble", when(col("input").startsWith(folder + "/"),
                        lit("lies in the folder of results")).otherwise(col("trouble")))
                .join(known, new String[] {"input", "bytes", "modified", "output"}, "left")
                .join(there, new String[] {"output"}, "left")
                .selectExpr("input", "bytes", "modified", "output", "trouble",
                        "known IS NOT NULL AND there IS NOT NULL AS done");
    }

    /** Works on the photos of a task, one after another. */
    private static final class Worker implements MapPartitionsFunction<Row, Row> {
        private static final long serialVersionUID = 1;
        private final PhotoWork work;
        private final PhotoLimits limits;
        private final String parts;
        private final boolean overwrite;
        private final SerializableConfiguration hadoop;
        private final int columns;

        Worker(PhotoWork work, PhotoLimits limits, String parts, boolean overwrite,
                SerializableConfiguration hadoop) {
            this.work = work;
            this.limits = limits;
            this.parts = parts;
            this.overwrite = overwrite;
            this.hadoop = hadoop;
            this.columns = work.columns().length();
        }

        @Override
        public Iterator<Row> call(Iterator<Row> photos) {
            String engine = NativeLibrary.version();
            return new Iterator<>() {
                @Override
                public boolean hasNext() {
                    return photos.hasNext();
                }

                @Override
                public Row next() {
                    return work(photos.next(), engine);
                }
            };
        }

        private Row work(Row photo, String engine) {
            long start = System.nanoTime();
            String input = photo.getString(0);
            String output = photo.getString(3);
            String error = photo.getString(4);
            String hash = null;
            Object[] made = new Object[columns];
            if (error == null) {
                try {
                    byte[] content =
                            ResultFile.read(new Path(input), limits.bytes(), hadoop.value());
                    hash = sha256(content);
                    made = limits.apply(content, it -> work.run(isPng(output) ? it.png() : it,
                            file -> ResultFile.write(new Path(output), file, new Path(parts),
                                    overwrite, hadoop.value())));
                } catch (IOException | RuntimeException failure) {
                    error = Outcome.reason(failure);
                }
            }
            List<Object> row = new ArrayList<>(Arrays.asList(input, photo.get(1), photo.get(2),
                    hash, work.parameters(), error == null ? output : null,
                    error == null ? Manifest.DONE : Manifest.FAILED, error,
                    (System.nanoTime() - start) / 1_000_000, engine));
            row.addAll(Arrays.asList(made));
            return RowFactory.create(row.toArray());
        }

        /** Its name says what a file is, as everywhere. */
        private static boolean isPng(String output) {
            return output != null && output.toLowerCase(Locale.ROOT).endsWith(".png");
        }

        private static String sha256(byte[] content) {
            try {
                byte[] digest = MessageDigest.getInstance("SHA-256").digest(content);
                return String.format("%064x", new BigInteger(1, digest));
            } catch (NoSuchAlgorithmException error) {
                throw new IllegalStateException("every Java platform has SHA-256", error);
            }
        }
    }
}
