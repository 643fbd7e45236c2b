package com.pelorin.photos.quenby.autoenhance;

import java.io.PrintWriter;
import org.junit.platform.engine.discovery.DiscoverySelectors;
import org.junit.platform.launcher.core.LauncherDiscoveryRequestBuilder;
import org.junit.platform.launcher.core.LauncherFactory;
import org.junit.platform.launcher.listeners.SummaryGeneratingListener;

/** Runs test classes by name; exit code 1 when a test fails or there is none. */
final class RunTests {
    private RunTests() {}

    public static void main(String[] classes) {
        LauncherDiscoveryRequestBuilder request = LauncherDiscoveryRequestBuilder.request();
        for (String name : classes) {
            request.selectors(DiscoverySelectors.selectClass(name));
        }
        SummaryGeneratingListener listener = new SummaryGeneratingListener();
        LauncherFactory.create().execute(request.build(), listener);
        listener.getSummary().printFailuresTo(new PrintWriter(System.out));
        long succeeded = listener.getSummary().getTestsSucceededCount();
        System.out.println(succeeded + " tests succeeded");
        System.exit(listener.getSummary().getTotalFailureCount() == 0 && succeeded > 0 ? 0 : 1);
    }
}
