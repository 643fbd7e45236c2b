package com.pelorin.photos.quenby.autoenhance;

import static java.util.Map.entry;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertNotNull;
import static org.junit.jupiter.api.Assertions.assertTrue;
import static org.junit.jupiter.api.Assertions.fail;

import android.graphics.Bitmap;
import android.graphics.RectF;
import com.pelorin.photos.quenby.desktop.NativeLog;
import java.io.IOException;
import java.lang.reflect.InvocationTargetException;
import java.lang.reflect.Method;
import java.lang.reflect.Modifier;
import java.nio.ByteBuffer;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.Map;
import java.util.Random;
import java.util.concurrent.CancellationException;
import java.util.stream.Collectors;
import java.util.stream.Stream;
import java.util.zip.ZipEntry;
import java.util.zip.ZipFile;
import org.junit.jupiter.api.AfterAll;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** Every native with every kind of argument that its types allow. */
class HostileArgumentsTest {
    private static final int CALLS_OF_EACH = 200;

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
        NativeLibrary.loadPhoto();
        List<Method> natives = new ArrayList<>();
        for (Class<?> owner : List.of(QuenbyEngine.class, NativeLog.class)) {
            natives.addAll(nativesBeside(owner));
        }
        natives.sort((a, b) -> a.toString().compareTo(b.toString()));
        assertTrue(natives.size() >= 19, natives.toString());
        Map<Class<?>, Object[]> values = values();
        Random random = new Random(7);
        int raised = 0;
        for (Method method : natives) {
            method.setAccessible(true);
            for (int call = 0; call < CALLS_OF_EACH; ++call) {
                Object[] arguments = new Object[method.getParameterCount()];
                for (int i = 0; i < arguments.length; ++i) {
                    Object[] pool = values.get(method.getParameterTypes()[i]);
                    assertNotNull(pool, "no values of " + method.getParameterTypes()[i]);
                    arguments[i] = pool[random.nextInt(pool.length)];
                }
                raised += call(method, arguments) ? 1 : 0;
            }
        }
        beQuiet(); // one of them chose how loud to be
        assertTrue(raised > 0, "nothing was hostile enough for an exception");
        for (Object bitmap : values.get(Bitmap.class)) {
            if (bitmap != null) {
                assertEquals(0, ((Bitmap) bitmap).getLockCount());
            }
        }
        System.out.println(natives.size() + " natives, " + natives.size() * CALLS_OF_EACH
                + " calls, of which " + raised + " raised an exception");
    }

    /** The natives of all classes that stand where this one does. */
    private static List<Method> nativesBeside(Class<?> one) throws Exception {
        Path home = Path.of(one.getProtectionDomain().getCodeSource().getLocation().toURI());
        List<Method> natives = new ArrayList<>();
        for (String name : Files.isDirectory(home) ? filesIn(home) : entriesOf(home)) {
            if (!name.endsWith(".class") || name.endsWith("-info.class")) {
                continue;
            }
            String binaryName = name.substring(0, name.length() - 6).replace('/', '.');
            for (Method method : Class.forName(binaryName, false, one.getClassLoader())
                    .getDeclaredMethods()) {
                if (Modifier.isNative(method.getModifiers())) {
                    natives.add(method);
                }
            }
        }
        return natives;
    }

    private static List<String> filesIn(Path folder) throws IOException {
        try (Stream<Path> files = Files.walk(folder)) {
            return files.map(file -> folder.relativize(file).toString()).collect(Collectors.toList());
        }
    }

    private static List<String> entriesOf(Path jar) throws IOException {
        try (ZipFile file = new ZipFile(jar.toFile())) {
            return file.stream().map(ZipEntry::getName).collect(Collectors.toList());
        }
    }

    /** Whether the native raised one of the documented exceptions. */
    private boolean call(Method method, Object[] arguments) throws IllegalAccessException {
        try {
            Object result = method.invoke(engine, arguments);
            if (method.getName().equals("newCancel")) {
                PhotoBytes.freeCancel((long) result);
            }
            return false;
        } catch (InvocationTargetException error) {
            Throwable cause = error.getCause();
            if (cause instanceof IllegalArgumentException || cause instanceof IOException
                    || cause instanceof OutOfMemoryError || cause instanceof PhotoException
                    || cause instanceof CancellationException
                    || cause.getClass() == RuntimeException.class) {
                return true;
            }
            return fail(method + " raised", cause);
        }
    }

    private Map<Class<?>, Object[]> values() throws IOException {
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
        long cancel = PhotoBytes.newCancel();
        long cancelled = PhotoBytes.newCancel();
        PhotoBytes.cancel(cancelled);
        Path file = Pictures.jpeg(folder.resolve("in.jpg"), 40, 30, 1);
        byte[] bytes = Files.readAllBytes(file);
        Object[] longs = {open, open, unprepared, released, cancel, cancelled, 0L, 0L, 1L, -1L, open + 1, open - 16,
            Long.MIN_VALUE, Long.MAX_VALUE, 0x5DEECE66DL};
        Object[] ints = {0, 0, 0, 0, bytes.length, bytes.length, 1, 2, 8, -1, 90, -90, 180, 45, 7, Integer.MIN_VALUE,
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
        String input = file.toString();
        String output = folder.resolve("out.jpg").toString();
        Object[] strings = {null, "", input, input, output, output, folder.toString(), "AE0",
            "AE08bit", "ZebraBW", "LowDimRGBCurve", "PassThrough", "slider=0.4;", "slider=NaN;",
            "slider=1e38;", "slider=-inf;", "slider=0.4;gtmOnly=true;", "s1=1e30;s2=nan;",
            "maskRadius=-1;maskAlpha=1e9;applyMask=1;", "=;=;;=", "\0", "a\0b", "\ud83d",
            "\ud83d\udcf7", "%s%n%d", "x".repeat(70000)};
        Object[] floats = {0f, -0f, 1.5f, Float.NaN, infinity, -infinity, Float.MAX_VALUE,
            Float.MIN_VALUE};
        float[] numbers = new float[256];
        float[] none = new float[256];
        Arrays.fill(none, Float.NaN);
        Object[] floatArrays = {null, new float[0], new float[] {0.1f, 0.1f, 0.5f, 0.5f}, new float[3],
            new float[] {Float.NaN, infinity, -infinity, 1e30f}, numbers, numbers, none, new float[257]};
        ByteBuffer direct = ByteBuffer.allocateDirect(bytes.length).put(bytes);
        Object[] buffers = {null, null, null, direct, direct.asReadOnlyBuffer(),
            ByteBuffer.allocateDirect(0), ByteBuffer.wrap(bytes)};
        Object[] arrays = {null, bytes, bytes, bytes, new byte[0], new byte[3], "text".getBytes()};
        Object[] arraysOfArrays = {null, new byte[1][], new byte[0][], new byte[][] {null, bytes}};
        return Map.ofEntries(entry(Bitmap.class, bitmaps), entry(long.class, longs),
                entry(int.class, ints), entry(double.class, doubles), entry(RectF[].class, faces),
                entry(String.class, strings), entry(float.class, floats),
                entry(float[].class, floatArrays), entry(ByteBuffer.class, buffers),
                entry(byte[].class, arrays), entry(byte[][].class, arraysOfArrays),
                entry(boolean.class, new Object[] {false, true}));
    }
}
