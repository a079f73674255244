package android.text;

/** Test stand-in: the system's font configuration, as families of fonts. */
public class FontConfig {
    public static class Font {
        private final String fontName;
        private final int ttcIndex;
        private final int weight;
        private final boolean italic;
        private final String fallbackFor;

        public Font(String fontName, int ttcIndex, int weight, boolean italic, String fallbackFor) {
            this.fontName = fontName;
            this.ttcIndex = ttcIndex;
            this.weight = weight;
            this.italic = italic;
            this.fallbackFor = fallbackFor;
        }

        public String getFontName() { return fontName; }
        public int getTtcIndex() { return ttcIndex; }
        public int getWeight() { return weight; }
        public boolean isItalic() { return italic; }
        public String getFallbackFor() { return fallbackFor; } // older: absent
    }

    public static class Family {
        private final String name;
        private final Font[] fonts;
        private final String languages;
        private final int variant;

        public Family(String name, String languages, int variant, Font... fonts) {
            this.name = name;
            this.fonts = fonts;
            this.languages = languages;
            this.variant = variant;
        }

        public String getName() { return name; }
        public Font[] getFonts() { return fonts; }
        public String getLanguages() { return languages; }
        public int getVariant() { return variant; }
    }

    protected final Family[] families;

    public FontConfig(Family... families) { this.families = families; }

    public Family[] getFamilies() { return families; } // older: absent
}
