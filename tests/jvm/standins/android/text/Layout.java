package android.text;

/**
 * Test stand-in: a layout whose lines are given, not computed. Each line is (start, visible end, end,
 * top, baseline, bottom, ascent, descent, left, width), in the layout's own coordinates (y down from 0).
 * Asking for a line that does not exist throws, as on a device.
 */
public class Layout {
    public static final class Line {
        final int start, visibleEnd, end, top, baseline, bottom, ascent, descent;
        final float left, width;

        public Line(int start, int visibleEnd, int end, int top, int baseline, int bottom, int ascent,
                int descent, float left, float width) {
            this.start = start;
            this.visibleEnd = visibleEnd;
            this.end = end;
            this.top = top;
            this.baseline = baseline;
            this.bottom = bottom;
            this.ascent = ascent;
            this.descent = descent;
            this.left = left;
            this.width = width;
        }
    }

    private final CharSequence text;
    private final int width;
    private final Line[] lines;

    public Layout(CharSequence text, int width, Line... lines) {
        this.text = text;
        this.width = width;
        this.lines = lines.clone();
    }

    public int getWidth() { return width; }
    public int getHeight() { return lines.length == 0 ? 0 : lines[lines.length - 1].bottom; }
    public int getTopPadding() { return 0; }
    public int getBottomPadding() { return 0; }
    public int getLineCount() { return lines.length; }
    public int getParagraphDirection(int line) { at(line); return 1; }
    public int getParagraphLeft(int line) { at(line); return 0; }
    public int getParagraphRight(int line) { at(line); return width; }
    public int getLineBaseline(int line) { return at(line).baseline; }
    public int getLineTop(int line) { return at(line).top; }
    public int getLineBottom(int line) { return at(line).bottom; }
    public int getLineAscent(int line) { return at(line).ascent; }
    public int getLineDescent(int line) { return at(line).descent; }
    public int getLineStart(int line) { return at(line).start; }
    public int getLineEnd(int line) { return at(line).end; }
    public int getLineVisibleEnd(int line) { return at(line).visibleEnd; }
    public float getLineLeft(int line) { return at(line).left; }
    public float getLineRight(int line) { return at(line).left + at(line).width; }
    public float getLineMax(int line) { return at(line).width; } // older: absent
    public float getLineWidth(int line) { return at(line).width; }
    public CharSequence getText() { return text; }

    private Line at(int line) { return lines[line]; }
}
