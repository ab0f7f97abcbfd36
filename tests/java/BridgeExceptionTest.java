import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.params.ParameterizedTest;
import org.junit.jupiter.params.provider.ValueSource;

/** Native exceptions reaching Java through the entry wrapper, and zero results on failure. */
class BridgeExceptionTest {
    static final String MSG = "native message 17";

    @BeforeAll
    static void load() {
        TestSupport.loadTestNatives();
    }

    static Throwable raised(int kind, String message) {
        try {
            TestNatives.raise(kind, message);
        } catch (Throwable t) {
            return t;
        }
        return fail("kind " + kind + " raised nothing");
    }

    static void assertRaised(Class<?> cls, String message, Throwable t) {
        assertSame(cls, t.getClass(), () -> "raised " + t);
        assertEquals(message, t.getMessage());
    }

    @Test
    void eachKindReachesJavaAsItsClassWithItsMessage() {
        Object[][] cases = {{TestNatives.EXCEPTION, Exception.class, MSG}, {TestNatives.RUNTIME, RuntimeException.class, MSG},
                {TestNatives.CLASS_CAST, ClassCastException.class, MSG}, {TestNatives.OUT_OF_MEMORY, OutOfMemoryError.class, MSG},
                {TestNatives.ILLEGAL_ARGUMENT, IllegalArgumentException.class, MSG},
                {TestNatives.ILLEGAL_STATE, IllegalStateException.class, MSG},
                {TestNatives.NUMBER_FORMAT, NumberFormatException.class, MSG},
                {TestNatives.NULL_POINTER, NullPointerException.class, ""},  // always an empty message
                {TestNatives.INDEX_5_OF_3, ArrayIndexOutOfBoundsException.class, new ArrayIndexOutOfBoundsException(5).getMessage()},
                {TestNatives.STD_EXCEPTION, RuntimeException.class, "System exception occured"},
                {TestNatives.NOT_AN_EXCEPTION, RuntimeException.class, "System exception occured"}};
        for (Object[] c : cases) assertRaised((Class<?>) c[1], (String) c[2], raised((Integer) c[0], MSG));
        assertRaised(IllegalArgumentException.class, "", raised(TestNatives.ILLEGAL_ARGUMENT, ""));  // not null
        TestNatives.captureStdout();
        Throwable t;
        String out;
        try {
            t = raised(TestNatives.NATIVE_ERROR, MSG);
            raised(TestNatives.RUNTIME, "quiet");
        } finally {
            out = TestNatives.endCapture();
        }
        assertRaised(trelk3.graphics2.NativeError.class, MSG, t);
        assertEquals("Throwing: " + MSG + "\n", out, "only NativeError prints, one line");
    }

    @Test
    void successfulCallsReturnTheirResults() {
        assertEquals(42, TestNatives.intResult(TestNatives.NONE));
        assertTrue(TestNatives.booleanResult(TestNatives.NONE));
        assertArrayEquals(new int[3], TestNatives.arrayResult(TestNatives.NONE));
        Object o = new Object();
        assertSame(o, TestNatives.objectResult(o, TestNatives.NONE));
    }

    @ParameterizedTest(name = "kind {0}")
    @ValueSource(ints = {0, 3, 4, 8, 9, 10, 11})
    void failedCallsReturnZeroResults(int kind) {
        TestNatives.captureStdout(); // keep NativeError's line out of the report
        try {
            assertThrows(Throwable.class, () -> TestNatives.intResult(kind));
            assertEquals(0, TestNatives.lastInt());
            assertThrows(Throwable.class, () -> TestNatives.booleanResult(kind));
            assertFalse(TestNatives.lastBoolean());
            assertThrows(Throwable.class, () -> TestNatives.arrayResult(kind));
            assertTrue(TestNatives.lastArrayWasNull());
            assertThrows(Throwable.class, () -> TestNatives.objectResult(new Object(), kind));
            assertTrue(TestNatives.lastObjectWasNull());
        } finally {
            TestNatives.endCapture();
        }
    }

    @Test
    void productEntriesWithNullPeerOrNoToolkitRaiseInsteadOfCrashing() {
        TestSupport.load();
        ja tk = Pavoqen.createToolkit(null, 0);
        try {
            assertEquals("", assertThrows(NullPointerException.class, () -> tk.n(null)).getMessage());
        } finally {
            tk.ma();
        }
        assertThrows(IllegalStateException.class, () -> tk.r(0, 0, 1, 1));
        assertThrows(IllegalStateException.class, () -> tk.AA(new float[16]));
    }
}
