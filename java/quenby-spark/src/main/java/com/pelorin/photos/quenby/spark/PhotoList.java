package com.pelorin.photos.quenby.spark;

import static org.apache.spark.sql.functions.col;

import java.io.FileNotFoundException;
import java.io.IOException;
import java.util.ArrayDeque;
import java.util.Arrays;
import java.util.Iterator;
import java.util.List;
import java.util.Locale;
import java.util.NoSuchElementException;
import java.util.Set;
import org.apache.hadoop.fs.FileStatus;
import org.apache.hadoop.fs.FileSystem;
import org.apache.hadoop.fs.Path;
import org.apache.hadoop.fs.RemoteIterator;
import org.apache.spark.api.java.function.FlatMapFunction;
import org.apache.spark.api.java.function.MapFunction;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Encoders;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;
import org.apache.spark.storage.StorageLevel;
import org.apache.spark.util.SerializableConfiguration;

/**
 * The photos that a job is given: input (a path), name (what it is called below a folder of
 * results), bytes, modified (milliseconds since 1970), trouble. Listed by the executors, empty
 * files too; what cannot be found is a row that says so.
 */
final class PhotoList {
    static final StructType PHOTO = new StructType()
            .add("input", DataTypes.StringType, false)
            .add("name", DataTypes.StringType, false)
            .add("bytes", DataTypes.LongType)
            .add("modified", DataTypes.LongType)
            .add("trouble", DataTypes.StringType);
    private static final StructType ENTRY = PHOTO.add("folder", DataTypes.BooleanType, false);
    private static final Set<String> EXTENSIONS = Set.of("jpg", "jpeg", "jpe", "png");

    private PhotoList() {}

    /**
     * Lists photos.
     *
     * @param in a folder, of which all photos below count; a text file with a path a line; or a
     *           table in Parquet, called NAME.parquet, with a column path or input
     * @throws IOException when there is none
     */
    static Dataset<Row> of(SparkSession spark, String in) throws IOException {
        SerializableConfiguration hadoop = configuration(spark);
        Path path = new Path(in);
        FileSystem files = path.getFileSystem(hadoop.value());
        FileStatus status = files.getFileStatus(path);
        String name = files.makeQualified(path).toString();
        if (name.endsWith(".parquet")) {
            Dataset<Row> table = spark.read().parquet(name);
            String column = Arrays.asList(table.columns()).contains("path") ? "path" : "input";
            return named(table.select(col(column)).as(Encoders.STRING()), hadoop);
        }
        return status.isDirectory() ? below(spark, name, hadoop)
                : named(spark.read().textFile(name), hadoop);
    }

    static SerializableConfiguration configuration(SparkSession spark) {
        return new SerializableConfiguration(spark.sessionState().newHadoopConf());
    }

    private static Dataset<Row> named(Dataset<String> paths, SerializableConfiguration hadoop) {
        return paths.filter(paths.col(paths.columns()[0]).notEqual("")).distinct()
                .map((MapFunction<String, Row>) path -> stated(path, hadoop), Encoders.row(PHOTO));
    }

    private static Row stated(String path, SerializableConfiguration hadoop) {
        try {
            Path photo = new Path(path);
            FileSystem files = photo.getFileSystem(hadoop.value());
            photo = files.makeQualified(photo);
            FileStatus status = files.getFileStatus(photo);
            return RowFactory.create(photo.toString(), nameOf(photo), status.getLen(),
                    status.getModificationTime(),
                    status.isDirectory() ? "is a folder, not a photo" : null);
        } catch (FileNotFoundException error) {
            return RowFactory.create(path, path, null, null, "there is no such file");
        } catch (IOException | RuntimeException error) {
            return RowFactory.create(path, path, null, null, Outcome.reason(error));
        }
    }

    /** The whole path, since a list may name photos of equal names in many folders. */
    private static String nameOf(Path photo) {
        String name = photo.toUri().getPath().substring(1);
        String place = photo.toUri().getAuthority();
        return place == null ? name : place + "/" + name;
    }

    /** One task lists the folder itself, many the folders inside. */
    static Dataset<Row> below(SparkSession spark, String root, SerializableConfiguration hadoop) {
        Dataset<Row> top = spark.createDataset(List.of(root), Encoders.STRING())
                .flatMap((FlatMapFunction<String, Row>) folder ->
                        new Walk(root, folder, false, hadoop), Encoders.row(ENTRY))
                .persist(StorageLevel.MEMORY_AND_DISK());
        Dataset<Row> inside = top.where("folder").select("input").as(Encoders.STRING())
                .repartition(4 * spark.sparkContext().defaultParallelism())
                .flatMap((FlatMapFunction<String, Row>) folder ->
                        new Walk(root, folder, true, hadoop), Encoders.row(ENTRY));
        return top.where("NOT folder").unionAll(inside).drop("folder");
    }

    /** What systems put beside photos: ".thumbnails", "._IMG_1.jpg", "@eaDir". */
    private static boolean isHidden(String name) {
        return name.startsWith(".") || name.equals("@eaDir");
    }

    private static boolean isNamedLikeAPhoto(String name) {
        return EXTENSIONS.contains(
                name.substring(name.lastIndexOf('.') + 1).toLowerCase(Locale.ROOT));
    }

    /** The entries of a folder and, where wanted, of those inside; never all in memory. */
    private static final class Walk implements Iterator<Row> {
        private final String root;
        private final boolean deep;
        private final SerializableConfiguration hadoop;
        private final ArrayDeque<String> folders = new ArrayDeque<>();
        private String folder;
        private RemoteIterator<FileStatus> entries;
        private Row ahead;

        Walk(String root, String folder, boolean deep, SerializableConfiguration hadoop) {
            this.root = root;
            this.deep = deep;
            this.hadoop = hadoop;
            folders.add(folder);
        }

        @Override
        public boolean hasNext() {
            while (ahead == null && (entries != null || !folders.isEmpty())) {
                try {
                    if (entries == null) {
                        folder = folders.remove();
                        Path path = new Path(folder);
                        entries = path.getFileSystem(hadoop.value()).listStatusIterator(path);
                    } else if (entries.hasNext()) {
                        look(entries.next());
                    } else {
                        entries = null;
                    }
                } catch (IOException | RuntimeException error) {
                    entries = null;
                    ahead = RowFactory.create(folder, folder, null, null,
                            "cannot be listed: " + Outcome.reason(error), false);
                }
            }
            return ahead != null;
        }

        private void look(FileStatus status) {
            String path = status.getPath().toString();
            String name = status.getPath().getName();
            if (isHidden(name)) {
                return;
            }
            if (status.isDirectory() && deep) {
                folders.add(path);
            } else if (status.isDirectory() || isNamedLikeAPhoto(name)) {
                ahead = RowFactory.create(path,
                        path.substring(root.length() + (root.endsWith("/") ? 0 : 1)),
                        status.getLen(), status.getModificationTime(), null,
                        status.isDirectory());
            }
        }

        @Override
        public Row next() {
            if (!hasNext()) {
                throw new NoSuchElementException();
            }
            Row row = ahead;
            ahead = null;
            return row;
        }
    }
}
