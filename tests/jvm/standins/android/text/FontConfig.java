package android.text;

/** Test stand-in: the system's font configuration, as families of fonts. */
public class FontConfig {
    public static class Font {
        private final String fontName, fallbackFor;
        private final int weight;
        private final boolean italic;

        public Font(String fontName, int weight, boolean italic, String fallbackFor) {
            this.fontName = fontName;
            this.weight = weight;
            this.italic = italic;
            this.fallbackFor = fallbackFor;
        }

        public String getFontName() { return fontName; }
        public int getTtcIndex() { return 0; }
        public int getWeight() { return weight; }
        public boolean isItalic() { return italic; }
        public String getFallbackFor() { return fallbackFor; } // older: absent
    }

    public static class Family {
        private final String name, languages;
        private final Font[] fonts;

        public Family(String name, String languages, Font... fonts) {
            this.name = name;
            this.languages = languages;
            this.fonts = fonts;
        }

        public String getName() { return name; }
        public Font[] getFonts() { return fonts; }
        public String getLanguages() { return languages; }
        public int getVariant() { return 0; }
    }

    protected final Family[] families;

    public FontConfig(Family... families) { this.families = families; }

    public Family[] getFamilies() { return families; } // older: absent
}
