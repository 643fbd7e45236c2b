package com.pelorin.photos.quenby.spark;

import static org.apache.spark.sql.functions.col;

import com.pelorin.photos.quenby.autoenhance.Filter;
import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import java.io.IOException;
import java.io.PrintStream;
import java.util.HashMap;
import java.util.Map;
import java.util.Set;
import org.apache.hadoop.conf.Configuration;
import org.apache.hadoop.fs.Path;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SaveMode;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/** The job that {@code spark-submit} runs. */
public final class QuenbyJob {
    private static final String USAGE = String.join("\n",
            "usage: spark-submit [OPTION...] quenby-spark.jar VERB --in DIR|LIST --out DIR [...]",
            "  enhance [--params \"slider=0.4;quality=90;\"] [--overwrite]",
            "  look --look NAME [--params \"maskAlpha=0.5;\"] [--overwrite]",
            "  score",
            "  dupes [--threshold 1.5]",
            "--in is a folder, a text file with a path a line, or NAME.parquet with a column path;",
            "enhance and look write files below --out and OUT/_manifest, score writes OUT/scores,",
            "dupes OUT/fingerprints, OUT/pairs, OUT/groups. Run again, each does what is missing.");

    private QuenbyJob() {}

    /**
     * Runs a job.
     *
     * @param arguments a verb and its options; without any it tells them
     * @throws IOException when the photos cannot be listed or the results not written
     */
    public static void main(String[] arguments) throws IOException {
        Arguments given;
        try {
            given = new Arguments(arguments);
        } catch (IllegalArgumentException error) {
            System.err.println("quenby: " + error.getMessage() + "\n" + USAGE);
            System.exit(2);
            return;
        }
        SparkSession spark = SparkSession.builder().appName("quenby " + given.verb).getOrCreate();
        try {
            run(spark, given, System.out);
        } finally {
            spark.stop();
        }
    }

    /** What is asked for; parameters are checked here, once. */
    static final class Arguments {
        private static final Map<String, Set<String>> OPTIONS = Map.of(
                "enhance", Set.of("--params", "--overwrite"),
                "look", Set.of("--look", "--params", "--overwrite"),
                "score", Set.of(),
                "dupes", Set.of("--threshold"));

        final String verb;
        final String in;
        final Path out;
        final boolean overwrite;
        private final PhotoWork work;
        private final float threshold;

        Arguments(String... arguments) {
            verb = arguments.length == 0 ? "" : arguments[0];
            if (!OPTIONS.containsKey(verb)) {
                throw new IllegalArgumentException("there is no verb '" + verb + "'");
            }
            Map<String, String> values = new HashMap<>();
            for (int i = 1; i < arguments.length; ++i) {
                String option = arguments[i];
                if (!option.equals("--in") && !option.equals("--out")
                        && !OPTIONS.get(verb).contains(option)) {
                    throw new IllegalArgumentException(verb + " has no option " + option);
                }
                boolean isFlag = option.equals("--overwrite");
                if (!isFlag && i + 1 == arguments.length) {
                    throw new IllegalArgumentException(option + " wants a value");
                }
                values.put(option, isFlag ? "" : arguments[++i]);
            }
            in = required(values, "--in");
            out = new Path(required(values, "--out"));
            overwrite = values.containsKey("--overwrite");
            work = workOf(values);
            threshold = number(values.get("--threshold"));
        }

        private static String required(Map<String, String> values, String option) {
            String value = values.get(option);
            if (value == null || value.isEmpty()) {
                throw new IllegalArgumentException(option + " is missing");
            }
            return value;
        }

        private PhotoWork workOf(Map<String, String> values) {
            switch (verb) {
                case "enhance":
                    return new FilterWork(FilterCall.of(
                            Filter.AUTO, values.getOrDefault("--params", "slider=0.4;")));
                case "look":
                    return new FilterWork(FilterCall.of(
                            FilterCall.look(required(values, "--look")), values.get("--params")));
                case "score":
                    return new ScoreWork();
                default:
                    return new FingerprintWork();
            }
        }

        private static float number(String text) {
            float value;
            try {
                value = text == null ? NearDuplicates.USUAL_THRESHOLD : Float.parseFloat(text);
            } catch (NumberFormatException error) {
                value = Float.NaN;
            }
            if (!Float.isFinite(value)) {
                throw new IllegalArgumentException("--threshold: is no number: " + text);
            }
            return value;
        }
    }

    static void run(SparkSession spark, Arguments given, PrintStream talk) throws IOException {
        requireApart(spark, given);
        Dataset<Row> photos = PhotoList.of(spark, given.in);
        Path told = new Path(given.out, given.verb.equals("score") ? "scores"
                : given.verb.equals("dupes") ? "fingerprints" : "_manifest");
        PhotoJob job = new PhotoJob(spark, given.work, given.out, given.overwrite, told);
        talk.println("quenby " + given.verb + ": " + job.run(photos) + "; see " + told);
        if (given.verb.equals("dupes")) {
            findDuplicates(job.results(photos), given, talk);
        }
    }

    /** Results among the photos would be photos of the next run. */
    private static void requireApart(SparkSession spark, Arguments given) throws IOException {
        Configuration hadoop = spark.sessionState().newHadoopConf();
        String in = folder(new Path(given.in), hadoop);
        String out = folder(given.out, hadoop);
        if (in.startsWith(out) || out.startsWith(in)) {
            throw new IOException("--out " + given.out + " and --in " + given.in
                    + ": neither may lie in the other");
        }
    }

    private static String folder(Path path, Configuration hadoop) throws IOException {
        return path.getFileSystem(hadoop).makeQualified(path) + "/";
    }

    private static void findDuplicates(Dataset<Row> fingerprints, Arguments given,
            PrintStream talk) {
        Path groups = new Path(given.out, "groups");
        try (NearDuplicates found = NearDuplicates.of(
                fingerprints.withColumnRenamed("input", "path"), given.threshold)) {
            found.pairs().write().mode(SaveMode.Overwrite)
                    .parquet(new Path(given.out, "pairs").toString());
            found.groups().write().mode(SaveMode.Overwrite).parquet(groups.toString());
            long count = fingerprints.sparkSession().read().parquet(groups.toString())
                    .select(col("photos")).count();
            talk.println("quenby dupes: " + count + " groups; " + found.untimed()
                    + " photos tell no time and are in none; see " + groups);
        }
    }

    private static final class FilterWork implements PhotoWork {
        private static final long serialVersionUID = 1;
        private final FilterCall call;

        FilterWork(FilterCall call) {
            this.call = call;
        }

        @Override
        public String parameters() {
            return call.toString();
        }

        @Override
        public boolean writesFiles() {
            return true;
        }

        @Override
        public StructType columns() {
            return new StructType();
        }

        @Override
        public Object[] run(byte[] content, Output output) throws IOException {
            output.write(call.apply(content));
            return new Object[0];
        }
    }

    private static final class ScoreWork implements PhotoWork {
        private static final long serialVersionUID = 1;

        @Override
        public String parameters() {
            return "niqe";
        }

        @Override
        public StructType columns() {
            return new StructType().add("niqe", DataTypes.FloatType);
        }

        @Override
        public Object[] run(byte[] content, Output output) throws IOException {
            return new Object[] {PhotoBytes.of(content).niqe()};
        }
    }

    private static final class FingerprintWork implements PhotoWork {
        private static final long serialVersionUID = 1;

        @Override
        public String parameters() {
            return "fingerprint";
        }

        @Override
        public StructType columns() {
            return PhotoRows.FINGERPRINT;
        }

        @Override
        public Object[] run(byte[] content, Output output) throws IOException {
            return PhotoRows.fingerprintValues(content);
        }
    }
}
