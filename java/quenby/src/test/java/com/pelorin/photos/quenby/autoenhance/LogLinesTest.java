package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertTrue;

import android.graphics.Bitmap;
import android.graphics.RectF;
import com.pelorin.photos.quenby.desktop.NativeLog;
import java.util.List;
import java.util.regex.Pattern;
import java.util.stream.Collectors;
import org.junit.jupiter.api.Test;

class LogLinesTest {
    /** Provokes lines of both priorities. */
    static final class Talk {
        private Talk() {}

        public static void main(String[] priority) throws Exception {
            if (priority.length > 0) {
                NativeLog.setPriority(Integer.parseInt(priority[0]));
            }
            QuenbyEngine engine = Natives.engine();
            Bitmap photo = Bitmap.createBitmap(400, 300, Bitmap.Config.ARGB_8888);
            long handle = engine.init(photo);
            engine.preprocess(new RectF[] {new RectF(0.25f, 0.1f, 0.75f, 0.6f), null}, handle);
            engine.releaseSession(handle);
            engine.init(null);
            photo.recycle();
            engine.init(photo);
            engine.applyAutoEnhanceFilterToJpegFile(
                    "/no/such/file.jpg", "/no/out.jpg", 0, null, 1, "AE0", "slider=0.4;");
        }
    }

    private static final List<String> PROGRESS =
            List.of("D QuenbyLib: == QBE: init [400, 300]",
                    "D QuenbyLib: face bb: [100 300 180 30]");
    private static final List<String> FAILURES =
            List.of("E QuenbyLib: AndroidBitmap_getInfo failed: -1",
                    "E QuenbyLib: AndroidBitmap_lockPixels failed",
                    "E QuenbyLib: image decoding/scaling failed for /no/such/file.jpg");

    private static List<String> linesAt(String... priority) throws Exception {
        ChildJvm child = ChildJvm.run(List.of(), Talk.class, priority);
        assertEquals(0, child.exitCode, child.output);
        Pattern time = Pattern.compile("^[0-9-]+ [0-9:.]+ ");
        return child.output.lines().filter(line -> line.contains("QuenbyLib: "))
                .map(line -> time.matcher(line).replaceFirst("")).collect(Collectors.toList());
    }

    @Test
    void progressIsQuietAtFirst() throws Exception {
        assertEquals(FAILURES, linesAt());
    }

    @Test
    void everythingCanBeHeard() throws Exception {
        List<String> lines = linesAt("3");
        assertEquals(PROGRESS, lines.subList(0, 2));
        assertEquals(FAILURES, lines.subList(2, lines.size()));
    }

    @Test
    void nothingNeedBeHeard() throws Exception {
        assertTrue(linesAt("8").isEmpty());
        assertFalse(linesAt("6").isEmpty());
    }
}
