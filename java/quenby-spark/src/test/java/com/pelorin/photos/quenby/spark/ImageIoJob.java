package com.pelorin.photos.quenby.spark;

import java.awt.image.BufferedImage;
import java.io.ByteArrayInputStream;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.UncheckedIOException;
import java.nio.file.Files;
import java.nio.file.Path;
import javax.imageio.ImageIO;
import org.apache.spark.api.java.function.FilterFunction;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SparkSession;

/**
 * What one would write without Quenby: the files of a folder as a column, decoded, made a little
 * brighter and written by javax.imageio. A program for spark-submit, to compare with.
 */
public final class ImageIoJob {
    private ImageIoJob() {}

    /**
     * Writes a file for each photo.
     *
     * @param arguments the folder of photos, the folder of results
     */
    public static void main(String[] arguments) throws IOException {
        String out = Files.createDirectories(Path.of(arguments[1])).toString();
        SparkSession spark = SparkSession.builder().appName("imageio").getOrCreate();
        System.out.println(spark.read().format("binaryFile").option("recursiveFileLookup", true)
                .load(arguments[0]).select("path", "content")
                .filter((FilterFunction<Row>) photo -> write(photo, out)).count());
        spark.stop();
    }

    private static boolean write(Row photo, String out) {
        String path = photo.getString(0);
        try {
            BufferedImage picture = ImageIO.read(new ByteArrayInputStream((byte[]) photo.get(1)));
            int[] row = new int[picture.getWidth()];
            for (int y = 0; y < picture.getHeight(); ++y) {
                picture.getRGB(0, y, row.length, 1, row, 0, row.length);
                for (int x = 0; x < row.length; ++x) {
                    row[x] = row[x] / 2 & 0x7F7F7F | 0x808080;
                }
                picture.setRGB(0, y, row.length, 1, row, 0, row.length);
            }
            ByteArrayOutputStream file = new ByteArrayOutputStream();
            ImageIO.write(picture, "jpeg", file);
            Files.write(Path.of(out, path.substring(path.lastIndexOf('/') + 1)),
                    file.toByteArray());
            return true;
        } catch (IOException error) {
            throw new UncheckedIOException(error);
        }
    }
}
