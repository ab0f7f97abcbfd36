import static org.junit.jupiter.api.Assertions.*;

import java.lang.reflect.Field;
import java.lang.reflect.Modifier;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;

/** Binding native objects to their Java peers through the field "nativeid". */
class BindingTest {
    @BeforeAll
    static void load() {
        TestSupport.loadTestNatives();
    }

    // One peer per bound class, in the order of TestNatives' class numbers.
    static Object[] peers() {
        return new Object[] {new ja(), new ba(), new h(), new fa(), new oa(), new wa(), new i(), new m(), new ia(),
                new ea(), new aa(), new a(), new za()};
    }

    static long nativeid(Object peer) throws ReflectiveOperationException {
        return peer.getClass().getField("nativeid").getLong(peer);
    }

    @Test
    void bindReadBackAndClearForEveryBoundClass() throws ReflectiveOperationException {
        Object[] peers = peers();
        for (int cls = 0; cls < peers.length; ++cls) {
            Object p = peers[cls];
            // a full 64-bit address, distinct per class
            long address = 0x7fedcba987654320L + 16L * cls;
            TestNatives.bind(cls, p, address);
            assertEquals(address, nativeid(p), p.getClass().getName());
            assertEquals(address, TestNatives.lookup(cls, p), p.getClass().getName());
            TestNatives.bind(cls, p, 0);
            assertEquals(0L, TestNatives.lookup(cls, p));
        }
        // peers of one class are bound independently; the Java side's own value is what the library reads
        h first = new h(), second = new h();
        TestNatives.bind(TestNatives.MODEL, second, 0x2000);
        first.nativeid = 0x3000;
        assertEquals(0x3000, TestNatives.lookup(TestNatives.MODEL, first));
        assertEquals(0x2000, TestNatives.lookup(TestNatives.MODEL, second));
    }

    @Test
    void nullPeerRaisesNullPointerWithEmptyMessage() {
        for (int cls = 0; cls <= TestNatives.CANVAS; ++cls) {
            final int c = cls;
            NullPointerException get = assertThrows(NullPointerException.class, () -> TestNatives.lookup(c, null));
            assertEquals("", get.getMessage());
            NullPointerException set = assertThrows(NullPointerException.class, () -> TestNatives.bind(c, null, 8));
            assertEquals("", set.getMessage());
        }
    }

    @Test
    void everyPeerClassHasAnInstanceLongNativeid() throws ReflectiveOperationException {
        for (String name : new String[] {"ja", "h", "i", "fa", "a", "za", "wa", "oa", "o", "m", "ea", "ia", "ba",
                "aa"}) {
            Field f = Class.forName(name).getDeclaredField("nativeid");
            assertSame(long.class, f.getType(), name);
            assertFalse(Modifier.isStatic(f.getModifiers()), name);
        }
    }
}
