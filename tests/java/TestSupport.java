/** Loading of the product library and of the test-only natives for the JVM tests. */
final class TestSupport {
    private static boolean testNativesLoaded;

    private TestSupport() {}

    /** Loads libpavoqen_sse. */
    static void load() {
        Pavoqen.loadLibrary();
    }

    /** Loads libpavoqen_sse and libpavoqen_testnatives. */
    static synchronized void loadTestNatives() {
        load();
        if (!testNativesLoaded) {
            System.loadLibrary("pavoqen_testnatives");
            testNativesLoaded = true;
        }
    }
}
