package com.pelorin.photos.quenby.desktop;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;

import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.attribute.PosixFilePermissions;
import java.util.ArrayList;
import java.util.List;
import java.util.Map;
import java.util.TreeMap;
import java.util.concurrent.CyclicBarrier;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.Future;
import java.util.stream.Collectors;
import java.util.stream.Stream;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class UnpackedLibrariesTest {
    @TempDir Path folder;
    private final Map<String, byte[]> libraries =
            new TreeMap<>(Map.of("liba.so", new byte[5000], "libb.so", new byte[] {1, 2, 3}));

    private void checkWhole(Path target) throws IOException {
        try (Stream<Path> files = Files.list(target)) {
            assertEquals(List.of("liba.so", "libb.so"), files.map(file -> file.getFileName() + "")
                    .sorted().collect(Collectors.toList()));
        }
        for (Map.Entry<String, byte[]> library : libraries.entrySet()) {
            assertArrayEquals(
                    library.getValue(), Files.readAllBytes(target.resolve(library.getKey())));
        }
    }

    @Test
    void manyMayUnpackAtOnce() throws Exception {
        int count = 8;
        ExecutorService threads = Executors.newFixedThreadPool(count);
        for (int round = 0; round < 50; ++round) {
            Path target = folder.resolve("round" + round);
            CyclicBarrier start = new CyclicBarrier(count);
            List<Future<Void>> results = new ArrayList<>();
            for (int i = 0; i < count; ++i) {
                results.add(threads.submit(() -> {
                    start.await();
                    UnpackedLibraries.into(target, libraries);
                    return null;
                }));
            }
            for (Future<Void> result : results) {
                result.get();
            }
            checkWhole(target);
        }
        threads.shutdown();
    }

    @Test
    void damagedAndMissingFilesAreReplaced() throws IOException {
        Path target = folder.resolve("target");
        UnpackedLibraries.into(target, libraries);
        Files.write(target.resolve("libb.so"), new byte[] {1, 2, 4});
        Files.delete(target.resolve("liba.so"));
        UnpackedLibraries.into(target, libraries);
        checkWhole(target);
    }

    @Test
    void aNameStandsForOneContent() {
        String name = UnpackedLibraries.folderName(libraries);
        assertEquals(name, UnpackedLibraries.folderName(new TreeMap<>(libraries)));
        libraries.put("libb.so", new byte[] {1, 2, 4});
        assertNotEquals(name, UnpackedLibraries.folderName(libraries));
        // The same bytes, cut elsewhere.
        Map<String, byte[]> one = Map.of("a", new byte[1], "b", new byte[2]);
        Map<String, byte[]> other = Map.of("a", new byte[2], "b", new byte[1]);
        assertNotEquals(UnpackedLibraries.folderName(new TreeMap<>(one)),
                UnpackedLibraries.folderName(new TreeMap<>(other)));
    }

    @Test
    void foldersThatOthersMayWriteToAreRefused() throws IOException {
        Path open = Files.createDirectory(folder.resolve("open"));
        Files.setPosixFilePermissions(open, PosixFilePermissions.fromString("rwxrwxrwx"));
        assertThrows(IOException.class, () -> UnpackedLibraries.into(open, libraries));
        Path link = Files.createSymbolicLink(folder.resolve("link"), folder);
        assertThrows(IOException.class, () -> UnpackedLibraries.into(link, libraries));
        Path file = Files.createFile(folder.resolve("file"));
        assertThrows(IOException.class, () -> UnpackedLibraries.into(file, libraries));
    }
}
