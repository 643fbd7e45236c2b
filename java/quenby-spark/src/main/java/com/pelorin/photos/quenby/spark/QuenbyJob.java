package com.pelorin.photos.quenby.spark;

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
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.types.StructType;
import org.apache.spark.storage.StorageLevel;

/** The job that {@code spark-submit} runs. */
public final class QuenbyJob {
    private static final String USAGE = String.join("\n",
            "usage: spark-submit [OPTION...] quenby-spark.jar VERB --in DIR|LIST --out DIR [...]",
            "  enhance [--params \"slider=0.4;quality=90;\"] [--overwrite]",
            "  look --look NAME [--params \"maskAlpha=0.5;\"] [--overwrite]",
            "  score",
            "  dupes [--threshold 1.5] [--assume-mtime] [--keep best]",
            "each, of a photo: [--max-bytes 1074M] [--max-pixels 268M] [--max-scans 100]",
            "  [--max-segments 4096] [--timeout SECONDS]",
            "--in is a folder, a text file with a path a line, or NAME.parquet with a column path;",
            "enhance and look write files below --out and OUT/_manifest, score writes OUT/scores,",
            "dupes OUT/fingerprints, OUT/pairs, OUT/groups and, of the best, OUT/ranking.",
            "Run again, each does what is missing.");

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
                "dupes", Set.of("--threshold", "--assume-mtime", "--keep"));
        private static final Set<String> OF_ALL = Set.of("--in", "--out");
        private static final Set<String> FLAGS = Set.of("--overwrite", "--assume-mtime");

        final String verb;
        final String in;
        final Path out;
        final boolean overwrite;
        final PhotoLimits limits;
        final float threshold;
        final boolean assumeFileTime;
        final boolean ranks;
        private final PhotoWork work;

        Arguments(String... arguments) {
            verb = arguments.length == 0 ? "" : arguments[0];
            if (!OPTIONS.containsKey(verb)) {
                throw new IllegalArgumentException("there is no verb '" + verb + "'");
            }
            Map<String, String> values = new HashMap<>();
            for (int i = 1; i < arguments.length; ++i) {
                String option = arguments[i];
                if (!OF_ALL.contains(option) && !PhotoLimits.OPTIONS.contains(option)
                        && !OPTIONS.get(verb).contains(option)) {
                    throw new IllegalArgumentException(verb + " has no option " + option);
                }
                boolean isFlag = FLAGS.contains(option);
                if (!isFlag && i + 1 == arguments.length) {
                    throw new IllegalArgumentException(option + " wants a value");
                }
                values.put(option, isFlag ? "" : arguments[++i]);
            }
            in = required(values, "--in");
            out = new Path(required(values, "--out"));
            overwrite = values.containsKey("--overwrite");
            limits = PhotoLimits.of(values);
            work = workOf(values);
            threshold = number(values.get("--threshold"));
            assumeFileTime = values.containsKey("--assume-mtime");
            ranks = values.containsKey("--keep");
            if (ranks && !values.get("--keep").equals("best")) {
                throw new IllegalArgumentException("--keep: is not best: " + values.get("--keep"));
            }
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
        Dataset<Row> photos = PhotoList.of(spark, given.in).persist(StorageLevel.MEMORY_AND_DISK());
        Path told = new Path(given.out, given.verb.equals("score") ? "scores"
                : given.verb.equals("dupes") ? "fingerprints" : "_manifest");
        PhotoJob job = new PhotoJob(spark, given.work, given.limits, given.out, given.overwrite,
                told);
        talk.println("quenby " + given.verb + ": " + job.run(photos) + "; see " + told);
        if (given.verb.equals("dupes")) {
            DupesJob.run(spark, given, job.results(photos), talk);
        }
        photos.unpersist();
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
        public Object[] run(PhotoBytes photo, Output output) throws IOException {
            output.write(call.apply(photo));
            return new Object[0];
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
        public Object[] run(PhotoBytes photo, Output output) throws IOException {
            return PhotoRows.fingerprintValues(photo);
        }
    }
}
