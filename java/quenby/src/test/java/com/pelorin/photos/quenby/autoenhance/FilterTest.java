package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertDoesNotThrow;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.List;
import java.util.stream.Collectors;
import java.util.stream.Stream;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;
import org.junit.jupiter.api.io.TempDir;

class FilterTest {
    @TempDir Path folder;

    @Test
    void isFoundByItsKey() {
        for (Filter filter : Filter.values()) {
            assertEquals(filter, Filter.of(filter.key()));
        }
        assertEquals("Auto", Filter.AUTO_8BIT.displayName());
        assertThrows(UnknownFilterException.class, () -> Filter.of("AUTO"));
    }

    @Test
    void everyFilterOfTheEngineIsThereWithItsKeys() throws IOException {
        String tool = System.getProperty("quenby.engine");
        assumeTrue(tool != null, "quenby.engine names no apply_filter to compare with");
        Process process = new ProcessBuilder(tool).start();
        List<String> expected = new String(process.getInputStream().readAllBytes()).lines()
                .collect(Collectors.toList());
        assertTrue(expected.size() >= 10, expected.toString());
        assertEquals(expected, Stream.of(Filter.values()).map(filter -> String.join(" ",
                Stream.concat(Stream.of(filter.key(), filter.displayName()),
                        filter.keys().names().stream()).collect(Collectors.toList())))
                .sorted().collect(Collectors.toList()));
    }

    private static String faultOf(Filter filter, String params) {
        try {
            filter.check(params);
            return "none";
        } catch (IllegalArgumentException error) {
            return error.getMessage();
        }
    }

    @Test
    void theCheckSaysWhichKeyOfWhichFilterWantsWhat() {
        assertEquals("params: AE0 needs slider, a number from 0 to 1, for example \"slider=0.4;\"",
                faultOf(Filter.AUTO, null));
        assertEquals("params: AE0 has no parameter 'slide'; it takes slider, gtmOnly and "
                + "gtmExtraMemory", faultOf(Filter.AUTO, "slide=0.4;"));
        assertEquals("params: slider of AE08bit wants a number from 0 to 1; 'much' is no number",
                faultOf(Filter.AUTO_8BIT, "slider=much;"));
        assertEquals("params: PassThrough takes no parameters",
                faultOf(Filter.ORIGINAL, "slider=0.4;"));
    }

    /** The bytes natives read the filters' own descriptions, and refuse the same in these words. */
    @Test
    void theCheckIsTheNativesCheck() throws IOException {
        NativeLibrary.loadPhoto();
        byte[] photo = Files.readAllBytes(Pictures.jpeg(folder.resolve("in.jpg"), 8, 8, 1));
        String[] texts = {"", ";", ";;", "slider=0.4;", "slider=0.4", "slider", "slider;",
            "slider=;", "=;", "=", "slide=1;", "slider=0.4;x", "slider=0.4;x=1", "x=1;slider=0.4;",
            "slider=0.4;slider=no;", "slider=no;slider=0.4;", "slider=.5;", "slider=5.;",
            "slider=.;", "slider=+1e-2;", "slider=1e;", "slider= 1;", "slider=1 ;", "slider=0x1;",
            "slider=1e39;", "slider=-1e39;", "slider=inf;", "slider=-Infinity;", "slider=NaN;",
            "slider=nan;", "slider=infinit;", "slider=1f;", "slider=1,5;", "slider==1;",
            "slider=1=2;", "slider=0.4;gtmOnly=maybe;", "slider=0.4;gtmOnly", "Slider=0.4;",
            "maskRadius=0.4;", "maskRadius=much;", "maskRadius;", "maskRadius", "r=0,1,;", "s1=1;",
            "s1=no;s9", "s9;", "s1=0.4;applyMask=true;b", "\u00e9=1;"};
        for (Filter filter : Filter.values()) {
            for (String params : texts) {
                String ours = faultOf(filter, params);
                String what = filter + " with \"" + params + '"';
                Executable filtered = () -> PhotoBytes.filter(photo, null, 0, photo.length, 90, 0,
                        0, null, 1, filter.key(), params, true, 0, null, 0, 0, 0, 0, false);
                if (ours.equals("none")) {
                    assertDoesNotThrow(filtered, what);
                } else {
                    assertEquals(ours, assertThrows(IllegalArgumentException.class, filtered, what)
                            .getMessage(), what);
                }
            }
        }
    }
}
