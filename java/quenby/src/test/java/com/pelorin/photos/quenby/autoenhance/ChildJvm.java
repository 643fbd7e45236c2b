package com.pelorin.photos.quenby.autoenhance;

import java.io.File;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.concurrent.TimeUnit;

/** A virtual machine of its own, with this one's classes. */
final class ChildJvm {
    private static final int TIMEOUT_SECONDS = 300;

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
        return start(shell, options, main, arguments).await();
    }

    /** One that runs. */
    static final class Running {
        private final Process process;
        private final File output;

        private Running(Process process, File output) {
            this.process = process;
            this.output = output;
        }

        ChildJvm await() throws IOException, InterruptedException {
            boolean ended = process.waitFor(TIMEOUT_SECONDS, TimeUnit.SECONDS);
            if (!ended) {
                process.destroyForcibly().waitFor();
            }
            String text = Files.readString(output.toPath());
            Files.delete(output.toPath());
            if (!ended) {
                throw new IOException("the child did not end; so far:\n" + text);
            }
            return new ChildJvm(process.exitValue(), text);
        }
    }

    static Running start(String shell, List<String> options, Class<?> main, String... arguments)
            throws IOException {
        List<String> command = new ArrayList<>();
        command.addAll(List.of("bash", "-c", shell + " exec \"$@\"", "bash"));
        command.add(Path.of(System.getProperty("java.home"), "bin", "java").toString());
        command.addAll(List.of("-Xmx512m", "-XX:-UsePerfData", "-Djava.awt.headless=true"));
        for (String name : List.of("quenby.root", "quenby.engine", "quenby.command", "quenby.library",
                "java.io.tmpdir")) {
            if (System.getProperty(name) != null) {
                command.add("-D" + name + "=" + System.getProperty(name));
            }
        }
        command.addAll(List.of("-cp", classPath()));
        command.addAll(options);
        command.add(main.getName());
        command.addAll(List.of(arguments));
        // A file, since a pipe that nobody reads yet holds a child up.
        File output = File.createTempFile("child", ".txt");
        Process process = new ProcessBuilder(command).redirectErrorStream(true)
                .redirectOutput(output).start();
        return new Running(process, output);
    }
}
