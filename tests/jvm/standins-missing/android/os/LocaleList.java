package android.os;

/** Test stand-in of another framework version: no toLanguageTags. */
public final class LocaleList {
    private final String tags;

    private LocaleList(String tags) { this.tags = tags; }

    public static LocaleList forLanguageTags(String tags) { return new LocaleList(tags); }

}
