package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertTrue;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.List;
import java.util.regex.Matcher;
import java.util.regex.Pattern;
import org.junit.jupiter.api.Test;

class ManySessionsTest {
    private static final int SESSIONS = 100_000;

    /** Resident memory of this process in pages of 4 KiB. */
    private static long residentPages() throws IOException {
        return Long.parseLong(Files.readString(Path.of("/proc/self/statm")).split(" ")[1]);
    }

    private static void openAndRelease(int count) {
        QuenbyEngine engine = Natives.engine();
        Bitmap photo = Pictures.photo(8, 8, 1);
        Bitmap output = Pictures.sameSize(photo);
        RectF[] faces = {new RectF(0, 0, 1, 1)};
        for (int i = 0; i < count; ++i) {
            long handle = engine.init(photo);
            engine.preprocess(faces, handle);
            engine.applyAutoEnhanceFilter(handle, output, "PassThrough", "");
            engine.releaseSession(handle);
        }
    }

    /** Prints by how many pages resident memory grew. */
    static final class Count {
        private Count() {}

        public static void main(String[] arguments) throws IOException {
            openAndRelease(SESSIONS / 2);
            long before = residentPages();
            openAndRelease(SESSIONS);
            System.out.println("grown by " + (residentPages() - before) + " pages");
        }
    }

    @Test
    void leaveMemoryWhereItWas() throws Exception {
        // A Java heap of a fixed size, touched before the start, does not move; code that is compiled
        // meanwhile would take pages.
        ChildJvm child = ChildJvm.run(List.of("-Xms256m", "-Xmx256m", "-XX:+AlwaysPreTouch",
                "-XX:+UseSerialGC", "-Xint"), Count.class);
        Matcher grown = Pattern.compile("grown by (-?\\d+) pages").matcher(child.output);
        assertTrue(grown.find(), child.output);
        System.out.println(SESSIONS + " sessions: resident memory has " + grown.group());
        // 64 KiB; a byte lost a session would be 24 pages.
        assertTrue(Long.parseLong(grown.group(1)) <= 16, child.output);
    }
}
