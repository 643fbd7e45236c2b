package com.pelorin.photos.quenby.spark;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.stream.Stream;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/** Spark in this process, on two cores; and the command. */
final class LocalSpark {
    private static final StructType CONTENT = new StructType()
            .add("path", DataTypes.StringType).add("content", DataTypes.BinaryType);

    private LocalSpark() {}

    static SparkSession session() {
        SparkSession spark = SparkSession.builder().master("local[2]")
                .config("spark.ui.enabled", false)
                .config("spark.sql.shuffle.partitions", 3)
                // Tables are small: to compile queries takes longer than to run them.
                .config("spark.sql.codegen.wholeStage", false)
                .config("spark.sql.codegen.factoryMode", "NO_CODEGEN")
                .config("spark.sql.adaptive.enabled", false)
                .config("spark.sql.warehouse.dir", System.getProperty("java.io.tmpdir"))
                .getOrCreate();
        return spark;
    }

    static Dataset<Row> photos(SparkSession spark, Path folder) throws IOException {
        List<Row> rows = new ArrayList<>();
        try (Stream<Path> files = Files.walk(folder)) {
            for (Path file : (Iterable<Path>) files.filter(Files::isRegularFile)::iterator) {
                rows.add(RowFactory.create(file.toString(), Files.readAllBytes(file)));
            }
        }
        return spark.createDataFrame(rows, CONTENT);
    }

    /** What the command prints. */
    static String command(int expected, String... arguments) throws Exception {
        String command = System.getProperty("quenby.command", "");
        assumeTrue(!command.isEmpty(), "quenby.command names no command to compare with");
        List<String> line = new ArrayList<>(List.of(command));
        line.addAll(List.of(arguments));
        Process process = new ProcessBuilder(line)
                .redirectError(ProcessBuilder.Redirect.DISCARD).start();
        String told = new String(process.getInputStream().readAllBytes());
        assertEquals(expected, process.waitFor(), String.join(" ", line));
        return told;
    }
}
