package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.util.List;
import java.util.regex.Matcher;
import java.util.regex.Pattern;
import org.junit.jupiter.api.Test;

/** The other tests, in a virtual machine that checks every call of the natives. */
class CheckedJniTest {
    /** Complaints of Java's own writer of JPEG files are none of ours. */
    private static final Pattern COMPLAINT = Pattern.compile(
            "(?:WARNING in native method|FATAL ERROR in native|WARNING: JNI)"
            + "(?![^\n]*\n\tat com\\.sun\\.imageio\\.)");

    @Test
    void complaintsAreRecognised() {
        for (String line : List.of(
                "WARNING in native method: JNI call made without checking exceptions when required",
                "FATAL ERROR in native method: Bad global or local ref passed to JNI",
                "WARNING: JNI local refs: 33, exceeds capacity: 32")) {
            assertTrue(COMPLAINT.matcher(line).find(), line);
        }
    }

    @Test
    void theVirtualMachineHasNoComplaint() throws Exception {
        ChildJvm child = ChildJvm.run(List.of("-Xcheck:jni"), RunTests.class,
                QuenbyEngineTest.class.getName(), EnhanceSessionTest.class.getName(),
                JpegFileTest.class.getName(), DuplicatesTest.class.getName(),
                PhotoBytesTest.class.getName(), HostileArgumentsTest.class.getName());
        assertEquals(0, child.exitCode, child.output);
        assertFalse(COMPLAINT.matcher(child.output).find(), child.output);
        Matcher succeeded = Pattern.compile("(\\d+) tests succeeded").matcher(child.output);
        assertTrue(succeeded.find() && Integer.parseInt(succeeded.group(1)) >= 55, child.output);
        System.out.println(succeeded.group() + " under -Xcheck:jni without a complaint");
    }
}
