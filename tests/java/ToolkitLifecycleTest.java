import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;

/** Creating and destroying the toolkit through its peer. */
class ToolkitLifecycleTest {
    @BeforeAll
    static void load() {
        TestSupport.load();
    }

    @Test
    void createRecreateAndDestroy() {
        ja.TextureSource none = (t, id) -> false;
        for (int round = 0; round < 3; ++round) {
            ja tk = Pavoqen.createToolkit(none, 4096);
            assertNotEquals(0L, tk.nativeid);
            assertEquals(0L, tk.nativeid & 15, "the toolkit is 16-byte aligned");
            assertSame(none, tk.getTextureSource());
            new ja().ma();  // a peer that was never bound holds 0: nothing to destroy
            tk.ma();
            assertEquals(0L, tk.nativeid);
        }
    }

    @Test
    void callbacksHaveReplaceableDefaults() {
        ja tk = new ja();
        assertFalse(tk.SA((short) 5), "no texture source: requests fail");
        int[] asked = {-1};
        tk.setTextureSource((t, id) -> {
            asked[0] = id;
            return true;
        });
        assertTrue(tk.SA((short) -2));
        assertEquals(65534, asked[0], "ids arrive unsigned");

        assertEquals(0L, ((aa) tk.WA()).nativeid);
        aa mine = new aa();
        tk.setShadowFactory(() -> mine);
        assertSame(mine, tk.WA());

        int[] collected = {0};
        tk.setGarbageCollector(() -> collected[0]++);
        tk.h();
        assertEquals(1, collected[0]);
    }
}
