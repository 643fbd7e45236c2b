package com.pelorin.photos.quenby.spark;

import java.io.IOException;
import java.util.List;
import org.apache.hadoop.fs.Path;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SaveMode;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/**
 * What became of each photo, as a table in Parquet to which each run adds. A task's rows stand as
 * soon as it ends, so that little is lost with a driver that is killed.
 */
final class Manifest {
    static final String DONE = "done";
    static final String FAILED = "failed";
    static final StructType COMMON = new StructType()
            .add("input", DataTypes.StringType)
            .add("bytes", DataTypes.LongType)
            .add("modified", DataTypes.LongType)
            .add("hash", DataTypes.StringType)
            .add("parameters", DataTypes.StringType)
            .add("output", DataTypes.StringType)
            .add("status", DataTypes.StringType)
            .add("error", DataTypes.StringType)
            .add("milliseconds", DataTypes.LongType)
            .add("engine", DataTypes.StringType);

    private final SparkSession spark;
    private final Path folder;
    private final StructType schema;

    Manifest(SparkSession spark, Path folder, StructType more) {
        this.spark = spark;
        this.folder = folder;
        this.schema = with(more);
    }

    static StructType with(StructType more) {
        StructType schema = COMMON;
        for (var field : more.fields()) {
            schema = schema.add(field);
        }
        return schema;
    }

    StructType schema() {
        return schema;
    }

    /** All rows there are, with the run that made each. */
    Dataset<Row> rows() throws IOException {
        StructType all = schema.add("run", DataTypes.StringType);
        return folder.getFileSystem(spark.sessionState().newHadoopConf()).exists(folder)
                ? spark.read().schema(all).parquet(folder.toString())
                : spark.createDataFrame(List.of(), all);
    }

    void append(Dataset<Row> rows, String run) {
        rows.write().mode(SaveMode.Append)
                .option("mapreduce.fileoutputcommitter.algorithm.version", "2")
                .parquet(new Path(folder, "run=" + run).toString());
    }
}
