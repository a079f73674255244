package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.graphics.Paint;
import android.text.Layout;
import android.widget.TextView;

/** The text class of the first Java layer: its twenty natives and the handle, nothing newer. */
public class GxText {
    private int mHandle = -1;

    native void GxText_finalize();
    native int GxText_AddInnerShadowTextEffect(float angle, float distance, float size, int color, float opacity);
    native int GxText_AddLinearGradientTextEffect(float angle, float scale, int[] colors, float[] opacities,
            float[] positions, float opacity);
    native int GxText_AddOuterGlowTextEffect(float size, int color, float opacity);
    native int GxText_AddOuterShadowTextEffect(float angle, float distance, float size, int color, float opacity);
    native int GxText_AddStrokeTextEffect(float size, int color, float opacity, int a, int position);
    native void GxText_ClearAllTextEffect();
    native int[] GxText_RenderTextEffect();
    native boolean GxText_SetFont(String fontFile);
    native boolean GxText_SetFont2(String fontName, byte[] buffer);
    native boolean GxText_SetFont3(AssetManager assetManager, String fontName);
    native boolean GxText_SetPaint(Paint paint);
    native boolean GxText_SetLayout(Layout layout);
    native boolean GxText_SetLine(int lines);
    native boolean GxText_SetView(TextView view);
    native int[] GxText_GetDrawingBitmapSize();
    native int GxText_GetEffectLeftOffset();
    native int GxText_GetEffectTopOffset();
    native int GxText_GetEffectRightOffset();
    native int GxText_GetEffectBottomOffset();
}
