package com.pelorin.photos.quenby.spark;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.io.IOException;
import java.net.URI;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.Future;
import java.util.stream.Stream;
import org.apache.hadoop.conf.Configuration;
import org.apache.hadoop.fs.RawLocalFileSystem;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class ResultFileTest {
    private final Configuration hadoop = new Configuration();
    @TempDir Path folder;

    private void write(String name, byte[] content, boolean overwrite) throws IOException {
        ResultFile.write(path(name), content, path("parts"), overwrite, hadoop);
    }

    private org.apache.hadoop.fs.Path path(String name) {
        return new org.apache.hadoop.fs.Path(folder.resolve(name).toUri());
    }

    private int partsLeft() throws IOException {
        try (Stream<Path> parts = Files.list(folder.resolve("parts"))) {
            return (int) parts.count();
        }
    }

    @Test
    void attemptsAtOnceLeaveOneFile() throws Exception {
        ExecutorService threads = Executors.newFixedThreadPool(8);
        byte[] content = new byte[100_000];
        for (boolean overwrite : new boolean[] {false, true}) {
            content[0] = (byte) (overwrite ? 1 : 0);
            List<Future<?>> attempts = new ArrayList<>();
            for (int i = 0; i < 40; ++i) {
                attempts.add(threads.submit(() -> {
                    write("below/made.jpg", content, overwrite);
                    return null;
                }));
            }
            for (Future<?> attempt : attempts) {
                attempt.get();
            }
            assertArrayEquals(content, Files.readAllBytes(folder.resolve("below/made.jpg")));
        }
        threads.shutdown();
        assertEquals(0, partsLeft());
        try (Stream<Path> made = Files.list(folder.resolve("below"))) {
            assertEquals(1, made.count());
        }
    }

    /** A store of objects, of which none can be renamed. */
    public static final class Bucket extends RawLocalFileSystem {
        @Override
        public URI getUri() {
            return URI.create("gs://bucket");
        }

        @Override
        public boolean rename(org.apache.hadoop.fs.Path from, org.apache.hadoop.fs.Path to) {
            throw new IllegalStateException("renamed " + from);
        }
    }

    @Test
    void objectsAreWrittenInPlace() throws IOException {
        hadoop.set("fs.gs.impl", Bucket.class.getName());
        org.apache.hadoop.fs.Path target =
                new org.apache.hadoop.fs.Path("gs://bucket" + folder + "/made.jpg");
        for (byte[] made : new byte[][] {{1, 2, 3}, {1, 2, 3}, {4}}) {
            ResultFile.write(target, made, path("parts"), made.length == 1, hadoop);
            assertArrayEquals(made, ResultFile.read(target, 9, hadoop));
        }
        assertThrows(IOException.class,
                () -> ResultFile.write(target, new byte[2], path("parts"), false, hadoop));
        assertThrows(IOException.class, () -> ResultFile.read(target, 0, hadoop));
        assertFalse(Files.exists(folder.resolve("parts")));
    }

    @Test
    void anotherFileStays() throws IOException {
        byte[] old = {1, 2, 3};
        Files.write(folder.resolve("old.jpg"), old);
        for (byte[] made : new byte[][] {{}, {1, 2}, {1, 2, 4}, {1, 2, 3, 4}}) {
            assertTrue(assertThrows(IOException.class, () -> write("old.jpg", made, false))
                    .getMessage().contains("--overwrite"));
            assertArrayEquals(old, Files.readAllBytes(folder.resolve("old.jpg")));
        }
        write("old.jpg", old, false);
        write("old.jpg", new byte[] {4}, true);
        assertArrayEquals(new byte[] {4}, Files.readAllBytes(folder.resolve("old.jpg")));
        assertEquals(0, partsLeft());
    }
}
