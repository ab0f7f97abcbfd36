import static org.junit.jupiter.api.Assertions.*;

import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;

import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/** Memory pools and the texture cache driven from Java. */
class MemoryTexturesTest {
    @BeforeAll
    static void load() {
        TestSupport.loadTestNatives();
    }

    private final List<Integer> requests = new ArrayList<>();
    private ja.TextureSource source;
    private ja tk;

    @BeforeEach
    void createToolkit() {
        source = (t, id) -> false;
        tk = Pavoqen.createToolkit((t, id) -> {
            requests.add(id);
            return source.requestTexture(t, id);
        }, 100);
    }

    @AfterEach
    void destroyToolkit() {
        tk.ma();
    }

    private ba pool(int capacity) {
        ba p = new ba();
        p.sa(0, capacity);
        return p;
    }

    @Test
    void poolAsksForACollectionBeforeGrowing() {
        ba p = pool(1000);
        try {
            int[] capacityAtCollection = {-1};
            tk.setGarbageCollector(() -> capacityAtCollection[0] = MemoryTexturesNatives.capacity(p));
            long a = MemoryTexturesNatives.allocate(p, 800);
            assertEquals(-1, capacityAtCollection[0]);
            long b = MemoryTexturesNatives.allocate(p, 800);
            assertEquals(1000, capacityAtCollection[0], "asked before growing");
            assertTrue(MemoryTexturesNatives.capacity(p) >= 1600);
            assertTrue(MemoryTexturesNatives.intact(a));
            assertTrue(MemoryTexturesNatives.intact(b));
            MemoryTexturesNatives.release(a);
            MemoryTexturesNatives.release(b);
        } finally {
            p.ma();
        }
        assertEquals(0L, p.nativeid);
    }

    private static wa mask(ba pool, int rows) {
        wa m = new wa();
        m.l(null, pool, 64, rows, new int[rows], new int[rows]);
        return m;
    }

    @Test
    void allocationStatisticFollowsAllocationsAndPoolRelease() {
        // Clipping masks copy their two row arrays into the pool through the product library.
        ba p = pool(4096);
        wa a = null, b = null;
        try {
            int before = tk.za();
            a = mask(p, 50);
            b = mask(p, 100);
            assertEquals(before + 1200, tk.za());
            a.ma();
            assertEquals(before + 800, tk.za());
            p.ha();  // empties the blocks still held
            assertEquals(before, tk.za());
            b.ma();
            assertEquals(before, tk.za());
        } finally {
            if (a != null) a.ma();
            if (b != null) b.ma();
            p.ma();
        }
    }

    @Test
    void poolEntriesRefuseBadInput() {
        ba p = new ba();
        assertThrows(IllegalArgumentException.class, () -> p.sa(0, -1));
        assertEquals(0L, p.nativeid);
        assertThrows(NullPointerException.class, () -> p.ha());
        p.ma();  // unbound: nothing to destroy
        p.u();
        assertThrows(NullPointerException.class, () -> tk.n(null));

        ba q = pool(2048);
        try {
            tk.n(q);
            assertEquals(MemoryTexturesNatives.poolAddress(q), MemoryTexturesNatives.toolkitPool(tk.nativeid));
        } finally {
            q.ma();
        }
        assertEquals(0L, MemoryTexturesNatives.toolkitPool(tk.nativeid), "a destroyed pool is forgotten");
    }

    private static int[] flat(int argb) {
        int[] px = new int[128 * 128];
        Arrays.fill(px, argb);
        return px;
    }

    private static void upload(ja t, int id, int[] pixels, int hsl, int scrollu) {
        t.F(id, pixels, hsl, 0, 0, 0, 0, 0, 0, 0, scrollu, 0, 0, 0, 0, 1, 1, 0, 0, 0, 0);
    }

    @Test
    void texturesAreRequestedAndAnUploadDuringTheRequestIsFound() {
        source = (t, id) -> {
            upload(t, id, flat(0xFF808080), 1000 + id, 64);
            return true;
        };
        int[] s = MemoryTexturesNatives.gettex(tk.nativeid, 7);
        assertArrayEquals(new int[] {0xFF808080, 0xFF808080, 1007, 0}, s);
        assertNotNull(MemoryTexturesNatives.gettex(tk.nativeid, 7));  // resident: not requested again
        // The scroll update reaches the fetched slot: 64 units for 0.5 s = 64 texels.
        tk.Y(500);
        assertEquals(64, MemoryTexturesNatives.gettex(tk.nativeid, 7)[3]);
        source = (t, id) -> false;
        assertNull(MemoryTexturesNatives.gettex(tk.nativeid, 8));
        assertNull(MemoryTexturesNatives.gettex(tk.nativeid, 100));  // beyond the id count: never requested
        assertEquals(List.of(7, 8), requests);
    }

    @Test
    void metricsAndUploadChecks() {
        tk.V(5, 0x1234, 1, 2, 3, 4, 5, 6, 7, -8, 9, 1, 0, 1, 7, 0, 1, 0, 1, 2);
        assertArrayEquals(new int[] {0x1234, 1, 1, -8}, MemoryTexturesNatives.metrics(tk.nativeid, 5));
        assertNull(MemoryTexturesNatives.metrics(tk.nativeid, 100), "beyond the id count");
        assertThrows(ArrayIndexOutOfBoundsException.class,
                () -> tk.V(100, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> upload(tk, 3, new int[128 * 128 - 1], 0, 0));
        assertThrows(NullPointerException.class, () -> upload(tk, 3, null, 0, 0));

        ja plain = new ja();
        plain.q(null, 0);
        try {
            assertThrows(IllegalStateException.class, () -> upload(plain, 1, flat(0), 0, 0));
        } finally {
            plain.ma();
            // the product toolkit instance is the newest one; recreate ours for tearDown
            tk.ma();
            tk = Pavoqen.createToolkit((t, id) -> false, 100);
        }
    }
}
