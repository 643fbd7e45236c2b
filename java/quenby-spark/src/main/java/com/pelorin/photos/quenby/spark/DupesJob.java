package com.pelorin.photos.quenby.spark;

import static org.apache.spark.sql.functions.col;
import static org.apache.spark.sql.functions.count;
import static org.apache.spark.sql.functions.expr;
import static org.apache.spark.sql.functions.lit;
import static org.apache.spark.sql.functions.row_number;

import java.io.IOException;
import java.io.PrintStream;
import org.apache.hadoop.fs.Path;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SaveMode;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.expressions.Window;

/** What the verb dupes does with fingerprints: pairs, groups and, where wanted, the best photos. */
final class DupesJob {
    private DupesJob() {}

    /** Writes the tables OUT/pairs, OUT/groups and OUT/ranking. */
    static void run(SparkSession spark, QuenbyJob.Arguments given, Dataset<Row> fingerprints,
            PrintStream talk) throws IOException {
        Path groups = new Path(given.out, "groups");
        Dataset<Row> timed = given.assumeFileTime ? withFileTimes(fingerprints) : fingerprints;
        try (NearDuplicates found =
                NearDuplicates.of(timed.withColumnRenamed("input", "path"), given.threshold)) {
            write(found.pairs(), new Path(given.out, "pairs"));
            write(found.groups(), groups);
            long count = spark.read().parquet(groups.toString()).select("photos").count();
            talk.println("quenby dupes: " + count + " groups; " + found.untimed()
                    + " photos tell no time and are in none; see " + groups);
        }
        if (given.ranks) {
            Path ranking = new Path(given.out, "ranking");
            write(ranking(spark, given, fingerprints, spark.read().parquet(groups.toString()),
                    talk), ranking);
            talk.println("quenby dupes: the best photo of each group stands in " + ranking);
        }
    }

    private static void write(Dataset<Row> table, Path folder) {
        table.write().mode(SaveMode.Overwrite).parquet(folder.toString());
    }

    /** Photos without a time take that of their file, whose clock on the wall is the session's. */
    private static Dataset<Row> withFileTimes(Dataset<Row> fingerprints) {
        return fingerprints
                .withColumn("utc", expr("IF(wall_clock IS NULL, modified / 1000D, utc)"))
                .withColumn("wall_clock", expr("coalesce(wall_clock, CAST(from_utc_timestamp("
                        + "timestamp_millis(modified), current_timezone()) AS DOUBLE))"));
    }

    /**
     * Ranks the photos of each group by the command's rule: by resolution, then by how natural
     * they look, then by the size of the file, then by their order.
     *
     * @return group (its first photo), photo, place (from 1), keep, pixels, bytes, niqe (null where
     *         it was not needed or could not be told)
     */
    private static Dataset<Row> ranking(SparkSession spark, QuenbyJob.Arguments given,
            Dataset<Row> fingerprints, Dataset<Row> groups, PrintStream talk) throws IOException {
        Dataset<Row> members = groups
                .selectExpr("photos[0] AS group", "posexplode(photos) AS (listed, input)")
                .join(fingerprints.selectExpr("input", "bytes", "modified",
                        "CAST(width AS BIGINT) * height AS pixels"), "input")
                .withColumn("as_large", count(lit(1)).over(
                        Window.partitionBy("group", "pixels")));
        Dataset<Row> undecided = members.where("as_large > 1").selectExpr("input",
                "input AS name", "bytes", "modified", "CAST(NULL AS STRING) AS trouble");
        PhotoJob job = new PhotoJob(spark, new ScoreWork(), given.limits, given.out, false,
                new Path(given.out, "scores"));
        talk.println("quenby dupes: photos of equal size are scored: " + job.run(undecided));
        return members
                .join(job.results(undecided).selectExpr("input",
                        "IF(isnan(niqe), NULL, niqe) AS niqe"), new String[] {"input"}, "left")
                .withColumn("place", row_number().over(Window.partitionBy("group").orderBy(
                        col("pixels").desc(), col("niqe").asc_nulls_last(), col("bytes").desc(),
                        col("listed").asc())))
                .selectExpr("group", "input AS photo", "place", "place = 1 AS keep", "pixels",
                        "bytes", "niqe");
    }
}
