import static org.junit.jupiter.api.Assertions.*;

import java.io.IOException;
import java.lang.reflect.Method;
import java.lang.reflect.Modifier;
import java.nio.file.DirectoryStream;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.Paths;
import java.util.ArrayList;
import java.util.List;
import org.junit.jupiter.api.Test;

/**
 * Every exported entry listed in tests/exports/*.txt is the JNI name of a native
 * method declared in its peer class, so the JVM can bind it; and the library's
 * callbacks exist on the toolkit peer with their exact signatures.
 */
class PeerDeclarationTest {
    static List<String> exportedJavaNames() throws IOException {
        String dir = System.getProperty("pavoqen.exports");
        assertNotNull(dir, "run with -Dpavoqen.exports=<tests/exports>");
        List<String> names = new ArrayList<>();
        try (DirectoryStream<Path> files = Files.newDirectoryStream(Paths.get(dir), "*.txt")) {
            for (Path f : files)
                for (String line : Files.readAllLines(f)) {
                    String s = line.replaceAll("#.*", "").trim();
                    if (s.startsWith("Java_")) names.add(s);
                }
        }
        return names;
    }

    @Test
    void everyExportedEntryIsADeclaredNativeMethod() throws Exception {
        List<String> names = exportedJavaNames();
        assertFalse(names.isEmpty());
        List<String> missing = new ArrayList<>();
        for (String symbol : names) {
            String[] parts = symbol.split("_");
            // Java_<class>_<method>; none of the short names contains '_'
            assertEquals(3, parts.length, symbol);
            Class<?> cls = Class.forName(parts[1]);
            boolean found = false;
            for (Method m : cls.getDeclaredMethods())
                if (m.getName().equals(parts[2]) && Modifier.isNative(m.getModifiers())) found = true;
            if (!found) missing.add(symbol);
        }
        assertTrue(missing.isEmpty(), "exported but not declared: " + missing);
    }

    @Test
    void nativeMethodNamesAreUniquePerClass() throws Exception {
        // JNI short names carry no signature, so an overload could not be bound
        for (String name : new String[] {"ja", "h", "i", "fa", "a", "za", "wa", "oa", "o", "m", "ea", "ia", "ba",
                "aa"}) {
            List<String> seen = new ArrayList<>();
            for (Method m : Class.forName(name).getDeclaredMethods()) {
                if (!Modifier.isNative(m.getModifiers())) continue;
                assertFalse(seen.contains(m.getName()), name + "." + m.getName() + " is overloaded");
                assertFalse(Modifier.isStatic(m.getModifiers()), name + "." + m.getName() + " must be an instance method");
                seen.add(m.getName());
            }
        }
    }

    @Test
    void toolkitCallbacksHaveTheirSignatures() throws Exception {
        assertSame(boolean.class, ja.class.getMethod("SA", short.class).getReturnType());
        assertSame(void.class, ja.class.getMethod("h").getReturnType());
        assertSame(Object.class, ja.class.getMethod("WA").getReturnType());
        assertTrue(RuntimeException.class.isAssignableFrom(trelk3.graphics2.NativeError.class));
        assertEquals("m", new trelk3.graphics2.NativeError("m").getMessage());
    }
}
