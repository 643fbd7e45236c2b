package com.pelorin.photos.quenby.spark;

import java.awt.Color;
import java.awt.Graphics2D;
import java.awt.image.BufferedImage;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.UncheckedIOException;
import java.nio.ByteBuffer;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.time.LocalDateTime;
import java.time.ZoneOffset;
import java.time.format.DateTimeFormatter;
import java.util.Random;
import javax.imageio.ImageIO;

/** JPEG files with times, made for tests. Run as a program it writes some into a folder. */
public final class TestPhotos {
    private TestPhotos() {}

    /** The same number is the same scene; brightness is 1 for its own light. */
    static byte[] jpeg(int width, int height, int scene, float brightness) {
        Random random = new Random(scene);
        BufferedImage picture = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
        Graphics2D brush = picture.createGraphics();
        for (int i = 0; i < 24; ++i) {
            brush.setColor(new Color(light(random, brightness), light(random, brightness),
                    light(random, brightness)));
            int x = random.nextInt(width);
            int y = random.nextInt(height);
            brush.fillRect(i == 0 ? 0 : x, i == 0 ? 0 : y, width, height / (1 + i / 6));
        }
        brush.dispose();
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                int grain = random.nextInt(8) * 0x010101;
                picture.setRGB(x, y, (picture.getRGB(x, y) & 0xF8F8F8) + grain);
            }
        }
        ByteArrayOutputStream file = new ByteArrayOutputStream();
        try {
            ImageIO.write(picture, "jpeg", file);
        } catch (IOException error) {
            throw new UncheckedIOException(error);
        }
        return file.toByteArray();
    }

    private static int light(Random random, float brightness) {
        return Math.min(247, (int) (random.nextInt(230) * brightness));
    }

    /**
     * The file with an EXIF segment behind its first marker.
     *
     * @param time in the camera's zone; null for none
     * @param zone "+02:00"; null for none
     */
    static byte[] withExif(byte[] jpeg, int orientation, LocalDateTime time, String zone) {
        ByteBuffer tiff = ByteBuffer.allocate(120);
        tiff.put("MM\0*".getBytes(StandardCharsets.US_ASCII)).putInt(8);
        tiff.putShort((short) (time == null ? 1 : 2));
        entry(tiff, 0x0112, 3, 1, orientation << 16);
        if (time != null) {
            entry(tiff, 0x8769, 4, 1, 38); // where the next directory is
            tiff.putInt(0);
            tiff.putShort((short) (zone == null ? 2 : 3));
            entry(tiff, 0x9003, 2, 20, 84);
            if (zone != null) {
                entry(tiff, 0x9011, 2, 7, 104);
            }
            String tenths = time.getNano() / 100_000_000 + "\0\0\0";
            entry(tiff, 0x9291, 2, 2, ByteBuffer.wrap(
                    tenths.getBytes(StandardCharsets.US_ASCII)).getInt());
            tiff.putInt(0);
            tiff.position(84);
            tiff.put(time.format(DateTimeFormatter.ofPattern("yyyy:MM:dd HH:mm:ss"))
                    .getBytes(StandardCharsets.US_ASCII));
            tiff.position(104);
            tiff.put((zone == null ? "" : zone).getBytes(StandardCharsets.US_ASCII));
        }
        ByteArrayOutputStream file = new ByteArrayOutputStream();
        file.write(jpeg, 0, 2);
        file.writeBytes(ByteBuffer.allocate(10).putShort((short) 0xFFE1).putShort((short) (8 + 120))
                .put("Exif\0\0".getBytes(StandardCharsets.US_ASCII)).array());
        file.writeBytes(tiff.array());
        file.write(jpeg, 2, jpeg.length - 2);
        return file.toByteArray();
    }

    private static void entry(ByteBuffer tiff, int tag, int type, int count, int value) {
        tiff.putShort((short) tag).putShort((short) type).putInt(count).putInt(value);
    }

    /**
     * Bursts and single shots of an afternoon, copies of one shot, cameras that tell a zone or none
     * or no time at all, some on their side, in folders whose names do not sort like their paths.
     */
    static void library(Path folder, int photos, int width, int height, long seed) {
        Random random = new Random(seed);
        String[] folders = {"a", "a-b", "a/c", "b"};
        String[] zones = {"+02:00", "-05:00", null, null};
        LocalDateTime utc = LocalDateTime.of(2024, 6, 1, 12, 0);
        try {
            for (String name : folders) {
                Files.createDirectories(folder.resolve(name));
            }
            for (int made = 0; made < photos;) {
                int burst = random.nextInt(4) == 0 ? 1 : 1 + random.nextInt(12);
                int scene = random.nextInt(1000);
                boolean copies = random.nextInt(3) == 0;
                for (int i = 0; i < burst && made < photos; ++i, ++made) {
                    byte[] jpeg = jpeg(width, height, scene,
                            copies ? 1 : 0.7f + 0.1f * random.nextInt(4));
                    utc = utc.plusNanos(100_000_000L * new int[] {0, 0, 3, 10, 20, 51, 53}[
                            random.nextInt(7)]);
                    String zone = zones[random.nextInt(4)];
                    LocalDateTime clock = utc.plusSeconds(
                            zone == null ? 7200 : ZoneOffset.of(zone).getTotalSeconds());
                    byte[] file = random.nextInt(20) == 0 ? jpeg
                            : withExif(jpeg, random.nextInt(5) == 0 ? 6 : 1,
                                    random.nextInt(15) == 0 ? null : clock, zone);
                    // The numbers are in no order, and no two are equal.
                    String name = String.format("%s/%s%04d.jpg", folders[random.nextInt(4)],
                            random.nextBoolean() ? "p" : "\u00fc", made * 7919 % 10007);
                    Files.write(folder.resolve(name), file);
                }
                utc = utc.plusSeconds(random.nextInt(3) * 40L);
            }
        } catch (IOException error) {
            throw new UncheckedIOException(error);
        }
    }

    /**
     * Writes photos.
     *
     * @param arguments a folder, how many, their width, their height
     */
    public static void main(String[] arguments) {
        library(Path.of(arguments[0]), Integer.parseInt(arguments[1]),
                Integer.parseInt(arguments[2]), Integer.parseInt(arguments[3]), 1);
    }
}
