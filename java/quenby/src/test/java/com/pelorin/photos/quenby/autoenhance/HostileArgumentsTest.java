package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assertions.fail;

import android.graphics.Bitmap;
import android.graphics.RectF;
import com.pelorin.photos.quenby.desktop.NativeLog;
import java.io.IOException;
import java.lang.reflect.InvocationTargetException;
import java.lang.reflect.Method;
import java.lang.reflect.Modifier;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.Random;
import org.junit.jupiter.api.AfterAll;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** Every native with every kind of argument that its types allow. */
class HostileArgumentsTest {
    private static final int CALLS_OF_EACH = 400;

    @TempDir Path folder;
    private final QuenbyEngine engine = Natives.engine();
    private final Bitmap photo = Pictures.photo(20, 16, 3);

    @BeforeAll
    static void beQuiet() {
        NativeLog.setPriority(NativeLog.SILENT);
    }

    @AfterAll
    static void talkAgain() {
        NativeLog.setPriority(NativeLog.INFO);
    }

    @Test
    void nothingCrashes() throws Exception {
        List<Method> natives = new ArrayList<>();
        for (Class<?> owner : List.of(QuenbyEngine.class, ImageDupeDetector.class)) {
            for (Method method : owner.getDeclaredMethods()) {
                if (Modifier.isNative(method.getModifiers())) {
                    natives.add(method);
                }
            }
        }
        assertEquals(6, natives.size());
        natives.sort((a, b) -> a.getName().compareTo(b.getName()));
        Object[][] values = values();
        Random random = new Random(7);
        int raised = 0;
        for (Method method : natives) {
            for (int call = 0; call < CALLS_OF_EACH; ++call) {
                Object[] arguments = new Object[method.getParameterCount()];
                for (int i = 0; i < arguments.length; ++i) {
                    Object[] pool = poolFor(method.getParameterTypes()[i], values);
                    arguments[i] = pool[random.nextInt(pool.length)];
                }
                raised += call(method, arguments) ? 1 : 0;
            }
        }
        assertTrue(raised > 0, "nothing was hostile enough for an exception");
        for (Object bitmap : values[0]) {
            if (bitmap != null) {
                assertEquals(0, ((Bitmap) bitmap).getLockCount());
            }
        }
    }

    /** Whether the native raised one of the documented exceptions. */
    private boolean call(Method method, Object[] arguments) throws IllegalAccessException {
        try {
            method.invoke(engine, arguments);
            return false;
        } catch (InvocationTargetException error) {
            Throwable cause = error.getCause();
            if (cause instanceof IllegalArgumentException || cause instanceof IOException
                    || cause instanceof OutOfMemoryError
                    || cause.getClass() == RuntimeException.class) {
                return true;
            }
            return fail(method + " raised", cause);
        }
    }

    private Object[][] values() throws IOException {
        Bitmap recycled = Pictures.photo(3, 3, 0);
        recycled.recycle();
        Object[] bitmaps = {null, photo, recycled, Pictures.sameSize(photo),
            Bitmap.createBitmap(1, 1, Bitmap.Config.ARGB_8888),
            Bitmap.createBitmap(20, 16, Bitmap.Config.RGB_565),
            Bitmap.createBitmap(20, 16, Bitmap.Config.ALPHA_8),
            Bitmap.createBitmap(20, 16, Bitmap.Config.RGBA_F16),
            photo.copy(Bitmap.Config.HARDWARE, false),
            Bitmap.createBitmap(20, 16, Bitmap.Config.ARGB_8888, 99)};
        long open = engine.init(photo);
        engine.preprocess(null, open);
        long unprepared = engine.init(photo);
        long released = engine.init(photo);
        engine.releaseSession(released);
        engine.releaseSession(released);
        Object[] longs = {open, open, unprepared, released, 0L, 1L, -1L, open + 1, open - 16,
            Long.MIN_VALUE, Long.MAX_VALUE, 0x5DEECE66DL};
        Object[] ints = {0, 0, 0, 1, 2, 8, -1, 90, -90, 180, 45, 7, Integer.MIN_VALUE,
            Integer.MAX_VALUE};
        Object[] doubles = {0.0, -0.0, 1.5, Double.NaN, Double.POSITIVE_INFINITY,
            Double.NEGATIVE_INFINITY, Double.MAX_VALUE, -Double.MAX_VALUE, Double.MIN_VALUE};
        float infinity = Float.POSITIVE_INFINITY;
        Object[] faces = {null, new RectF[0], new RectF[] {null},
            new RectF[] {new RectF(0.1f, 0.1f, 0.5f, 0.5f), null, new RectF()},
            new RectF[] {new RectF(Float.NaN, Float.NaN, Float.NaN, Float.NaN)},
            new RectF[] {new RectF(-infinity, -infinity, infinity, infinity)},
            new RectF[] {new RectF(infinity, infinity, -infinity, -infinity)},
            new RectF[] {new RectF(-1e30f, 1e30f, 1e30f, -1e30f)}};
        String input = Pictures.jpeg(folder.resolve("in.jpg"), 40, 30, 1).toString();
        String output = folder.resolve("out.jpg").toString();
        Object[] strings = {null, "", input, input, output, output, folder.toString(), "AE0",
            "AE08bit", "ZebraBW", "LowDimRGBCurve", "PassThrough", "slider=0.4;", "slider=NaN;",
            "slider=1e38;", "slider=-inf;", "slider=0.4;gtmOnly=true;", "s1=1e30;s2=nan;",
            "maskRadius=-1;maskAlpha=1e9;applyMask=1;", "=;=;;=", "\0", "a\0b", "\ud83d",
            "\ud83d\udcf7", "%s%n%d", "x".repeat(70000)};
        return new Object[][] {bitmaps, longs, ints, doubles, faces, strings};
    }

    private static Object[] poolFor(Class<?> type, Object[][] values) {
        Class<?>[] types =
                {Bitmap.class, long.class, int.class, double.class, RectF[].class, String.class};
        for (int i = 0; i < types.length; ++i) {
            if (types[i] == type) {
                return values[i];
            }
        }
        return fail("no values of " + type);
    }
}
