package android.content.res;

/**
 * Test stand-in: an application's assets. On Linux the library reads them from the folder this object
 * names through getAssetRoot.
 */
public final class AssetManager {
    private final String root;

    public AssetManager(String root) { this.root = root; }

    public String getAssetRoot() { return root; }
}
