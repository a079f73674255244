package android.os;

/** Test stand-in: a locale list is its comma-separated language tags. */
public final class LocaleList {
    private final String tags;

    private LocaleList(String tags) { this.tags = tags; }

    public static LocaleList forLanguageTags(String tags) { return new LocaleList(tags); }

    public String toLanguageTags() { return tags; } // older: absent
}
