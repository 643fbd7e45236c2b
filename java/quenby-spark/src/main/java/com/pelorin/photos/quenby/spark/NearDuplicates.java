package com.pelorin.photos.quenby.spark;

import static org.apache.spark.sql.functions.col;
import static org.apache.spark.sql.functions.count;
import static org.apache.spark.sql.functions.lit;
import static org.apache.spark.sql.functions.xxhash64;

import com.pelorin.photos.quenby.autoenhance.Duplicates;
import java.util.Arrays;
import java.util.stream.Stream;
import org.apache.spark.sql.Column;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Encoders;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.storage.StorageLevel;

/**
 * The near-duplicates among photos: the pairs and groups that {@code quenby dupes} tells of the
 * same ones, found by all of a cluster. Photos that tell no time are in none.
 *
 * <p>Nothing of a photo or pair comes to the driver. Fingerprints and pairs are kept on the
 * executors, to disk where memory does not suffice, until {@link #close}.
 */
public final class NearDuplicates implements AutoCloseable {
    /** The least score of a pair where nobody says another; see docs/duplicates.md. */
    public static final float USUAL_THRESHOLD = 1.5f;

    private final Dataset<Row> fingerprints;
    private final Dataset<Row> pairs;
    private final long untimed;

    private NearDuplicates(Dataset<Row> fingerprints, Dataset<Row> pairs, long untimed) {
        this.fingerprints = fingerprints;
        this.pairs = pairs;
        this.untimed = untimed;
    }

    /**
     * Searches photos. Each is decoded once. A table of fingerprints is read three times, so one
     * that is not stored had better be cached.
     *
     * @param photos    each with a path of its own, by which ties are settled, and either content
     *                  or orientation, wall_clock, utc, green_cdf as of {@link #fingerprints}
     * @param threshold the least score of a pair
     * @return what is found
     * @throws IllegalArgumentException when the threshold is not finite
     */
    public static NearDuplicates of(Dataset<Row> photos, float threshold) {
        return of(photos, threshold, TimeCells.LOT);
    }

    static NearDuplicates of(Dataset<Row> photos, float threshold, int lot) {
        if (!Float.isFinite(threshold)) {
            throw new IllegalArgumentException("the threshold is " + threshold);
        }
        boolean known = Arrays.asList(photos.columns()).contains("green_cdf");
        Dataset<Row> fingerprints = (known ? photos : fingerprints(photos))
                .select("path", "wall_clock", "utc", "orientation", "green_cdf")
                .where("green_cdf IS NOT NULL");
        if (!known) {
            fingerprints = fingerprints.persist(StorageLevel.MEMORY_AND_DISK());
        }
        Row counts = fingerprints.agg(count(lit(1)), count(col("wall_clock")), count(col("utc")))
                .head();
        long timed = counts.getLong(1);
        long zoned = counts.getLong(2);
        Dataset<Row> pairs = pairs(fingerprints, threshold, zoned > 1, zoned < timed, lot)
                .persist(StorageLevel.MEMORY_AND_DISK());
        return new NearDuplicates(fingerprints, pairs, counts.getLong(0) - timed);
    }

    /**
     * Reduces photos to what the search needs.
     *
     * @param photos with path and content
     * @return path, width, height, orientation, wall_clock, utc, green_cdf (1 KiB), error; of what
     *         cannot be read only the path and the error
     */
    public static Dataset<Row> fingerprints(Dataset<Row> photos) {
        Quenby.register(photos.sparkSession());
        return photos.selectExpr("path", "quenby_fingerprint(content) AS fingerprint")
                .select("path", "fingerprint.result.*", "fingerprint.error");
    }

    private static Dataset<Row> pairs(Dataset<Row> fingerprints, float threshold, boolean utc,
            boolean wall, int lot) {
        SparkSession spark = fingerprints.sparkSession();
        double same = Duplicates.window(threshold, true);
        double different = Duplicates.window(threshold, false);
        double longest = Math.max(same, different);
        if (!(longest >= 0) || !utc && !wall) {
            return spark.emptyDataFrame().selectExpr("'' AS first", "'' AS second",
                    "0F AS score", "0F AS distance", "0D AS seconds",
                    "true AS same_orientation").limit(0);
        }
        Column[] cell = {col("clock"), col("stretch"), col("low"), col("high")};
        return TimeCells.of(fingerprints.where("wall_clock IS NOT NULL"), longest, utc, wall, lot)
                .repartition(partitions(spark), cell)
                .sortWithinPartitions(Stream.concat(Stream.of(cell), Stream.of(col("moment")))
                        .toArray(Column[]::new))
                .select(columns(PairSweep.COLUMNS))
                .mapPartitions(new PairSweep(threshold, same, different),
                        Encoders.row(PairSweep.PAIR));
    }

    /**
     * Gives the pairs that reach the threshold.
     *
     * @return first, second (paths), score, distance, seconds, same_orientation
     */
    public Dataset<Row> pairs() {
        return pairs;
    }

    /**
     * Gives the groups: every two photos of a group are a pair, and no photo is in two.
     *
     * @return photos (their paths, in order), lowest_score, highest_score, seconds (the longest
     *         time between two)
     */
    public Dataset<Row> groups() {
        SparkSession spark = pairs.sparkSession();
        // Photos with equal hashes only come together to the task that groups them.
        Dataset<Row> roots = pairs
                .selectExpr("xxhash64(first) AS node", "xxhash64(second) AS root")
                .mapPartitions(new Forest(), Encoders.row(Forest.EDGE))
                .repartition(1)
                .mapPartitions(new Forest(), Encoders.row(Forest.EDGE));
        return pairs.withColumn("node", xxhash64(col("first")))
                .join(roots, "node")
                .repartition(partitions(spark), col("root"))
                .sortWithinPartitions("root")
                .select(columns(WholeGroups.COLUMNS))
                .mapPartitions(new WholeGroups(), Encoders.row(WholeGroups.GROUP));
    }

    /**
     * Tells how many photos tell no time.
     *
     * @return those that were compared with none
     */
    public long untimed() {
        return untimed;
    }

    /** Gives free what is kept of fingerprints and pairs. */
    @Override
    public void close() {
        pairs.unpersist();
        fingerprints.unpersist();
    }

    private static Column[] columns(String... names) {
        return Stream.of(names).map(name -> col(name)).toArray(Column[]::new);
    }

    private static int partitions(SparkSession spark) {
        return Integer.parseInt(spark.conf().get("spark.sql.shuffle.partitions"));
    }
}
