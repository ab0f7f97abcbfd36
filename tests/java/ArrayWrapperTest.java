import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;

/**
 * Copied and pinned Java arrays: read-only ones leave the Java array unchanged
 * even when native code writes through them, read-write ones carry changes back,
 * pins are released when an exception passes, and short or null arrays are
 * refused with a Java exception.
 *
 * Under -Xcheck:jni the JVM hands out checked copies for pinned access too, so
 * a read-only pinned array stays unchanged only because it is released with
 * JNI_ABORT.
 */
class ArrayWrapperTest {
    @BeforeAll
    static void load() {
        TestSupport.loadTestNatives();
    }

    @Test
    void copiedAndPinnedArraysOfEachElementKind() {
        for (boolean ro : new boolean[] {true, false}) {
            int[] ints = {1, -2, 0x7fffffff}, pinned = {5, 6, 7, 8};
            byte[] bytes = {1, -2, 0x7f};
            boolean[] bools = {true, false}, pinnedBools = {false, false, true};
            float[] floats = {1.5f, -2f};
            assertEquals(3, TestNatives.copiedInts(ints, ro));
            assertEquals(3, TestNatives.copiedBytes(bytes, ro));
            assertEquals(2, TestNatives.copiedBooleans(bools, ro));
            assertEquals(2, TestNatives.copiedFloats(floats, ro));
            assertEquals(4, TestNatives.pinnedInts(pinned, ro));
            assertEquals(3, TestNatives.pinnedBooleans(pinnedBools, ro));
            assertArrayEquals(ro ? new int[] {1, -2, 0x7fffffff} : new int[] {2, -1, 0x80000000}, ints);
            assertArrayEquals(ro ? new byte[] {1, -2, 0x7f} : new byte[] {2, -1, (byte) 0x80}, bytes);
            assertArrayEquals(ro ? new boolean[] {true, false} : new boolean[] {false, true}, bools);
            assertArrayEquals(ro ? new float[] {1.5f, -2f} : new float[] {2.5f, -1f}, floats);
            assertArrayEquals(ro ? new int[] {5, 6, 7, 8} : new int[] {6, 7, 8, 9}, pinned);
            assertArrayEquals(ro ? new boolean[] {false, false, true} : new boolean[] {true, true, false}, pinnedBools);
            assertEquals(0, TestNatives.pinCount());
            // null and empty arrays are accepted
            assertEquals(0, TestNatives.copiedBooleans(null, ro));
            assertEquals(0, TestNatives.pinnedInts(null, ro));
            assertEquals(0, TestNatives.copiedFloats(new float[0], ro));
        }
        assertArrayEquals(new int[] {0, 1, 0}, TestNatives.pinnedNull(), "length 0, no elements, pin count unchanged");
    }

    @Test
    void pinIsReleasedWhenAnExceptionPasses() {
        int[] a = {1, 2};
        assertThrows(IllegalStateException.class, () -> TestNatives.pinThenRaise(a, TestNatives.ILLEGAL_STATE));
        assertEquals(1, TestNatives.pinsInside());
        assertEquals(0, TestNatives.pinCount());
        assertArrayEquals(new int[] {99, 2}, a, "a read-write pin copies back on the way out: no rollback");

        // the critical region is left before the Java exception object is built
        assertThrows(ArrayIndexOutOfBoundsException.class,
                () -> TestNatives.pinThenRaise(new int[1], TestNatives.INDEX_5_OF_3));
        assertEquals(0, TestNatives.pinCount());

        assertThrows(NullPointerException.class, () -> TestNatives.pinThenRaise(null, TestNatives.ILLEGAL_STATE));
        assertEquals(0, TestNatives.pinCount());
    }

    @Test
    void severalArraysArePinnedOnlyAfterAllAreChecked() {
        int[] a = {1, 2, 3};
        float[] b = {0.5f, 1.5f, 2.5f};
        TestNatives.pinTwo(a, b, 3);
        assertEquals(2, TestNatives.pinsInside());
        assertArrayEquals(new int[] {2, 3, 4}, a);
        assertArrayEquals(new float[] {1.5f, 2.5f, 3.5f}, b);
        assertEquals(0, TestNatives.pinCount());

        assertThrows(ArrayIndexOutOfBoundsException.class, () -> TestNatives.pinTwo(a, new float[2], 3));
        assertEquals(-1, TestNatives.pinsInside(), "refused before pinning");
        assertThrows(NullPointerException.class, () -> TestNatives.pinTwo(a, null, 1));
        assertArrayEquals(new int[] {2, 3, 4}, a);
        assertEquals(0, TestNatives.pinCount());
        TestNatives.pinTwo(null, null, 0);
        int[] c = {1, 2};  // a copied array is written back when an exception passes
        assertThrows(IllegalArgumentException.class, () -> TestNatives.copyThenRaise(c, TestNatives.ILLEGAL_ARGUMENT));
        assertArrayEquals(new int[] {99, 2}, c);
    }

    static String indexMessage(int index) {
        return new ArrayIndexOutOfBoundsException(index).getMessage();
    }

    @Test
    void shortAndNullArraysAreRefused() {
        int[] three = {1, 2, 3};
        TestNatives.need(three, 3);
        TestNatives.need(null, 0);
        assertEquals(indexMessage(3),
                assertThrows(ArrayIndexOutOfBoundsException.class, () -> TestNatives.need(three, 4)).getMessage());
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> TestNatives.need(three, Integer.MAX_VALUE));
        assertEquals("", assertThrows(NullPointerException.class, () -> TestNatives.need(null, 1)).getMessage());

        TestNatives.needRange(three, 1, 2);
        assertEquals(indexMessage(3), assertThrows(ArrayIndexOutOfBoundsException.class,
                () -> TestNatives.needRange(three, 2, 2)).getMessage());
        assertEquals(indexMessage(-1), assertThrows(ArrayIndexOutOfBoundsException.class,
                () -> TestNatives.needRange(three, -1, 1)).getMessage());
        assertThrows(ArrayIndexOutOfBoundsException.class,
                () -> TestNatives.needRange(three, Integer.MAX_VALUE, 2));
        assertThrows(NullPointerException.class, () -> TestNatives.needRange(null, 0, 1));
        assertEquals(0, TestNatives.pinCount());
        assertArrayEquals(new int[] {1, 2, 3}, three);
    }
}
