package android.text;

/**
 * Test stand-in: a layout whose lines are given, not computed, each as {start, end, baseline, ascent
 * (negative), descent, left, width} in the layout's own coordinates (y down from 0). Asking for a line that
 * does not exist throws, as on a device.
 */
public class Layout {
    private final CharSequence text;
    private final float[][] lines;

    public Layout(CharSequence text, float[]... lines) {
        this.text = text;
        this.lines = lines.clone();
    }

    // Looked up with the rest, never called.
    public int getWidth() { return 0; }
    public int getHeight() { return 0; }
    public int getTopPadding() { return 0; }
    public int getBottomPadding() { return 0; }
    public int getParagraphDirection(int line) { return 0; }
    public int getParagraphLeft(int line) { return 0; }
    public int getParagraphRight(int line) { return 0; }

    public int getLineCount() { return lines.length; }
    public int getLineStart(int line) { return (int) lines[line][0]; }
    public int getLineEnd(int line) { return (int) lines[line][1]; }
    public int getLineVisibleEnd(int line) { return (int) lines[line][1]; }
    public int getLineBaseline(int line) { return (int) lines[line][2]; }
    public int getLineAscent(int line) { return (int) lines[line][3]; }
    public int getLineDescent(int line) { return (int) lines[line][4]; }
    public int getLineTop(int line) { return getLineBaseline(line) + getLineAscent(line); }
    public int getLineBottom(int line) { return getLineBaseline(line) + getLineDescent(line); }
    public float getLineLeft(int line) { return lines[line][5]; }
    public float getLineRight(int line) { return lines[line][5] + lines[line][6]; }
    public float getLineMax(int line) { return lines[line][6]; } // older: absent
    public float getLineWidth(int line) { return lines[line][6]; }
    public CharSequence getText() { return text; }
}
