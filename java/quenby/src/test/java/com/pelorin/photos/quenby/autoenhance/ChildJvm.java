package com.pelorin.photos.quenby.autoenhance;

import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.concurrent.TimeUnit;

/** A virtual machine of its own, with this one's classes. */
final class ChildJvm {
    final int exitCode;
    /** Standard output and standard error as they came. */
    final String output;

    private ChildJvm(int exitCode, String output) {
        this.exitCode = exitCode;
        this.output = output;
    }

    static String classPath() {
        String own = System.getProperty("java.class.path");
        return System.getProperty("surefire.test.class.path", own);
    }

    static ChildJvm run(List<String> options, Class<?> main, String... arguments)
            throws IOException, InterruptedException {
        return run("", options, main, arguments);
    }

    /** {@code shell} is run before the virtual machine takes its place: "ulimit -f 8;". */
    static ChildJvm run(String shell, List<String> options, Class<?> main, String... arguments)
            throws IOException, InterruptedException {
        List<String> command = new ArrayList<>();
        command.addAll(List.of("bash", "-c", shell + " exec \"$@\"", "bash"));
        command.add(Path.of(System.getProperty("java.home"), "bin", "java").toString());
        command.addAll(List.of("-Xmx512m", "-XX:-UsePerfData", "-Djava.awt.headless=true"));
        for (String name : List.of("quenby.engine", "quenby.library", "java.io.tmpdir")) {
            if (System.getProperty(name) != null) {
                command.add("-D" + name + "=" + System.getProperty(name));
            }
        }
        command.addAll(List.of("-cp", classPath()));
        command.addAll(options);
        command.add(main.getName());
        command.addAll(List.of(arguments));
        Process process = new ProcessBuilder(command).redirectErrorStream(true).start();
        String output =
                new String(process.getInputStream().readAllBytes(), StandardCharsets.UTF_8);
        if (!process.waitFor(5, TimeUnit.MINUTES)) {
            process.destroyForcibly();
            throw new IOException("the child did not end; so far:\n" + output);
        }
        return new ChildJvm(process.exitValue(), output);
    }
}
