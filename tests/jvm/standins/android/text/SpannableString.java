package android.text;

import java.lang.reflect.Array;
import java.util.ArrayList;
import java.util.List;

/** Test stand-in: text with spans, each over the whole text; a copy of one keeps its spans. */
public class SpannableString implements CharSequence {
    private final String text;
    private final List<Object> spans = new ArrayList<>();

    public SpannableString(CharSequence source) {
        text = source.toString();
        if (source instanceof SpannableString) {
            spans.addAll(((SpannableString) source).spans);
        }
    }

    public void setSpan(Object what, int start, int end, int flags) { spans.add(what); }

    /** The spans of that kind, in the order they were set. */
    @SuppressWarnings("unchecked")
    public <T> T[] getSpans(int start, int end, Class<T> kind) {
        return spans.stream().filter(kind::isInstance).toArray(n -> (T[]) Array.newInstance(kind, n));
    }

    @Override public int length() { return text.length(); }
    @Override public char charAt(int index) { return text.charAt(index); }
    @Override public CharSequence subSequence(int start, int end) { return text.subSequence(start, end); }
    @Override public String toString() { return text; }
}
