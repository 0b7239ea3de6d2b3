package android.view;

/** What the native side knows of the platform's class: one private field. */
public class Surface {
    private int mNativeSurface;

    public Surface(int nativeSurface) {
        mNativeSurface = nativeSurface;
    }
}
