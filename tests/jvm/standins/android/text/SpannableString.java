package android.text;

import java.lang.reflect.Array;
import java.util.ArrayList;
import java.util.List;

/** Test stand-in: text with spans; making one of another SpannableString copies its spans. */
public class SpannableString implements CharSequence {
    private static final class Span {
        final Object what;
        final int start, end;

        Span(Object what, int start, int end) {
            this.what = what;
            this.start = start;
            this.end = end;
        }
    }

    private final String text;
    private final List<Span> spans = new ArrayList<>();

    public SpannableString(CharSequence source) {
        text = source.toString();
        if (source instanceof SpannableString) {
            spans.addAll(((SpannableString) source).spans);
        }
    }

    public void setSpan(Object what, int start, int end, int flags) {
        spans.add(new Span(what, start, end));
    }

    /** The spans of that kind overlapping start..end, in the order they were set. */
    @SuppressWarnings("unchecked")
    public <T> T[] getSpans(int start, int end, Class<T> kind) {
        List<T> found = new ArrayList<>();
        for (Span s : spans) {
            if (kind.isInstance(s.what) && s.start <= end && s.end >= start) {
                found.add((T) s.what);
            }
        }
        return found.toArray((T[]) Array.newInstance(kind, found.size()));
    }

    @Override public int length() { return text.length(); }
    @Override public char charAt(int index) { return text.charAt(index); }
    @Override public CharSequence subSequence(int start, int end) { return text.subSequence(start, end); }
    @Override public String toString() { return text; }
}
