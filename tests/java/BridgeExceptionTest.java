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
        TestNatives.captureStdout(); // NativeError's line is checked below
        try {
            eachKind();
        } finally {
            TestNatives.endCapture();
        }
    }

    static void eachKind() {
        assertRaised(Exception.class, MSG, raised(TestNatives.EXCEPTION, MSG));
        assertRaised(RuntimeException.class, MSG, raised(TestNatives.RUNTIME, MSG));
        assertRaised(ClassCastException.class, MSG, raised(TestNatives.CLASS_CAST, MSG));
        assertRaised(OutOfMemoryError.class, MSG, raised(TestNatives.OUT_OF_MEMORY, MSG));
        assertRaised(IllegalArgumentException.class, MSG, raised(TestNatives.ILLEGAL_ARGUMENT, MSG));
        assertRaised(IllegalStateException.class, MSG, raised(TestNatives.ILLEGAL_STATE, MSG));
        assertRaised(NumberFormatException.class, MSG, raised(TestNatives.NUMBER_FORMAT, MSG));
        assertRaised(trelk3.graphics2.NativeError.class, MSG, raised(TestNatives.NATIVE_ERROR, MSG));
        // empty messages stay empty, not null
        assertRaised(IllegalArgumentException.class, "", raised(TestNatives.ILLEGAL_ARGUMENT, ""));
    }

    @Test
    void nullPointerAlwaysHasAnEmptyMessage() {
        assertRaised(NullPointerException.class, "", raised(TestNatives.NULL_POINTER, MSG));
        assertRaised(NullPointerException.class, "", raised(TestNatives.NULL_POINTER, ""));
    }

    @Test
    void indexOutOfBoundsCarriesOnlyTheIndex() {
        Throwable t = raised(TestNatives.INDEX_5_OF_3, MSG);
        assertRaised(ArrayIndexOutOfBoundsException.class, new ArrayIndexOutOfBoundsException(5).getMessage(), t);
    }

    @Test
    void failuresOutsideTheFamilyBecomeSystemException() {
        assertRaised(RuntimeException.class, "System exception occured", raised(TestNatives.STD_EXCEPTION, MSG));
        assertRaised(RuntimeException.class, "System exception occured",
                raised(TestNatives.NOT_AN_EXCEPTION, MSG));
    }

    @Test
    void nativeErrorPrintsItsLineOnStandardOutput() {
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
    void productEntryWithNullPeerRaisesEmptyNullPointer() {
        TestSupport.load();
        ja tk = Pavoqen.createToolkit(null, 0);
        try {
            NullPointerException e = assertThrows(NullPointerException.class, () -> tk.n(null));
            assertEquals("", e.getMessage());
        } finally {
            tk.ma();
        }
    }

    @Test
    void entriesWithoutToolkitRaiseInsteadOfCrashing() {
        TestSupport.load();
        ja tk = Pavoqen.createToolkit(null, 0);
        tk.ma();
        assertThrows(IllegalStateException.class, () -> tk.r(0, 0, 1, 1));
        assertThrows(IllegalStateException.class, () -> tk.AA(new float[16]));
        assertThrows(IllegalStateException.class, () -> tk.qa(new int[4]));
    }
}
