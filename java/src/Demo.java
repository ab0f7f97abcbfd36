import java.io.File;
import java.util.Arrays;

/** Demo client: loads the library, creates the toolkit, reports its state and shuts down. */
public class Demo {
    public static void main(String[] args) throws Exception {
        Pavoqen.loadLibrary();
        ja tk = Pavoqen.createToolkit(null, 0);
        System.out.println("pavoqen: toolkit created, nativeid 0x" + Long.toHexString(tk.nativeid));
        tk.A(0, 0, 640, 480);
        tk.GA(0f, 1f);
        System.out.println("pavoqen: viewport " + Arrays.toString(Pavoqen.viewport(tk)));
        System.out.println("pavoqen: clipping " + Arrays.toString(Pavoqen.clipping(tk)));
        File card = new File("out/demo.png");
        TestCard2D.renderPng(tk, 320, 240, card);
        System.out.println("pavoqen: 2D test card written to " + card);
        tk.ma();
        System.out.println("pavoqen: toolkit destroyed");
    }
}
