package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.text.FontConfig;
import com.vantrel.android.sdk.gxe.font.FontManager;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.Paths;
import java.util.List;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/** Fonts by path, by bytes, from assets, and the system's font configuration. */
public class FontTest {
    private static final String MANAGER = "Init_GxFontManager_JNI";

    private static byte[] bytes(String path) {
        try {
            return Files.readAllBytes(Paths.get(path));
        } catch (IOException e) {
            throw new AssertionError(e);
        }
    }

    /** A text of one BLOCK with paint, view and layout but no font of its own. */
    private static GxText withoutFont() {
        GxText text = new GxText();
        Check.isTrue(text.GxText_SetPaint(Fixtures.paint(20f)), "SetPaint");
        Check.isTrue(text.GxText_SetView(Fixtures.view(60, 50)), "SetView");
        Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 0f, 12f)), "SetLayout");
        return text;
    }

    /** Whether the text draws its BLOCK where a DejaVu Sans block goes. */
    private static boolean drawsBlock(GxText text) {
        return java.util.Arrays.equals(Fixtures.blockAt(0, 30), Fixtures.inkBox(text.render()));
    }

    @Test
    public void insertedFontDataIsKeptByNameAndUsedByTexts() {
        List<String> log = LogTap.capture(() -> {
            Check.isTrue(!FontManager.insertFontData(null, new byte[1]), "null name");
            Check.isTrue(!FontManager.insertFontData("inserted", null), "null bytes");
        });
        Check.isTrue(LogTap.contains(log, 'E', MANAGER, "GxFontManager_InsertFontData() - fontName is NULL"),
                "log " + log);
        Check.isTrue(LogTap.contains(log, 'E', MANAGER, "GxFontManager_InsertFontData() - buffer is NULL"),
                "log " + log);
        Check.isTrue(!FontManager.insertFontData("not-a-font", new byte[] {1, 2, 3, 4}), "garbage");
        Check.isTrue(!FontManager.insertFontData("empty", new byte[0]), "empty");
        byte[] sans = bytes(Fixtures.SANS);
        Check.isTrue(FontManager.insertFontData("inserted", sans), "font");
        Check.isTrue(FontManager.insertFontData("inserted", new byte[] {9}), "a second time keeps the first");
        try (GxText text = withoutFont()) {
            Check.isTrue(text.setFont("inserted"), "SetFont by name");
            Check.isTrue(drawsBlock(text), "draws with it");
        }
    }

    @Test
    public void fontByPathOrBytes() {
        try (GxText text = withoutFont()) {
            List<String> log = LogTap.capture(() -> {
                Check.isTrue(!text.GxText_SetFont(null), "null path");
                Check.isTrue(!text.GxText_SetFont2(null, new byte[1]), "null name");
                Check.isTrue(!text.GxText_SetFont2("by-bytes", null), "null bytes");
            });
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetFont() - Fail to get fontFile string"),
                    "log " + log);
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetFont2() - fontName is NULL"), "log");
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetFont2() - buffer is NULL"), "log");
            Check.isTrue(!text.GxText_SetFont("/nonexistent/font.ttf"), "missing file");
            Check.isTrue(!text.GxText_SetFont2("by-garbage", new byte[] {0, 1, 0, 0}), "garbage bytes");
            Check.isNull(Fixtures.inkBox(text.render()), "still no font");
            Check.isTrue(text.GxText_SetFont2("by-bytes", bytes(Fixtures.SANS)), "bytes");
            Check.isTrue(drawsBlock(text), "draws with the bytes");
        }
        try (GxText text = withoutFont()) {
            Check.isTrue(text.GxText_SetFont(Fixtures.SANS), "path");
            Check.isTrue(drawsBlock(text), "draws with the file");
        }
    }

    @Test
    public void fontFromAssets() throws IOException {
        Path root = Files.createTempDirectory("gxe-assets");
        Path fonts = Files.createDirectories(root.resolve("fonts"));
        Files.copy(Paths.get(Fixtures.SANS), fonts.resolve("Asset Sans.ttf"));
        try (GxText text = withoutFont()) {
            AssetManager assets = new AssetManager(root.toString());
            List<String> log = LogTap.capture(() -> {
                Check.isTrue(!text.GxText_SetFont3(null, "fonts/Asset Sans.ttf"), "null assets");
                Check.isTrue(!text.GxText_SetFont3(assets, null), "null name");
                Check.isTrue(!text.GxText_SetFont3(assets, "fonts/Missing.ttf"), "missing asset");
                Check.isTrue(!text.GxText_SetFont3(assets, "../" + root.getFileName() + "/fonts/Asset Sans.ttf"),
                        "a name climbing out of the assets");
            });
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetFont3() - assetManager is NULL"), "log");
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetFont3() - fontName is NULL"), "log");
            Check.equal(2, LogTap.count(log, "E/GxText_JNI: GxText_SetFont3() - _ASSET_NOT_FOUND_"), "log " + log);
            Check.isNull(Fixtures.inkBox(text.render()), "no font yet");
            Check.isTrue(text.setFont(assets, "fonts/Asset Sans.ttf"), "asset");
            Check.isTrue(drawsBlock(text), "draws with the asset");
        } finally {
            Files.delete(fonts.resolve("Asset Sans.ttf"));
            Files.delete(fonts);
            Files.delete(root);
        }
        // A name the font manager knows needs no asset at all.
        Check.isTrue(FontManager.insertFontData("known-by-name", bytes(Fixtures.SANS)), "insert");
        try (GxText text = withoutFont()) {
            Check.isTrue(text.GxText_SetFont3(new AssetManager("/nonexistent"), "known-by-name"), "known name");
            Check.isTrue(drawsBlock(text), "draws with it");
        }
    }

    @Test
    public void fontsThatCannotBeUsedSayWhyWithoutAnErrorCode() throws Exception {
        Path dir = Files.createTempDirectory("gxe-fonts");
        Path notes = Files.write(dir.resolve("notes.ttf"), "not a font at all".getBytes("UTF-8"));
        Path pipe = dir.resolve("pipe.ttf");
        Check.equal(0, new ProcessBuilder("mkfifo", pipe.toString()).start().waitFor(), "mkfifo");
        Path locked = Files.copy(Paths.get(Fixtures.SANS), dir.resolve("locked.ttf"));
        Check.isTrue(locked.toFile().setReadable(false, false), "chmod");
        int none = com.vantrel.android.sdk.gxe.util.GxError.NONE;
        try (GxText text = withoutFont()) {
            String missing = dir.resolve("missing.ttf").toString();
            Fixtures.onFreshThread(() -> text.setFont(missing))
                    .failed(false, missing + ": cannot be opened (No such file or directory)", none, "missing");
            // A file is tried once per process.
            Fixtures.onFreshThread(() -> text.setFont(missing))
                    .failed(false, missing + ": could not be read when it was first asked for", none, "again");
            Fixtures.onFreshThread(() -> text.setFont(dir.toString()))
                    .failed(false, "not a regular file", none, "folder");
            // A pipe is refused at once, not read (which would wait for a writer).
            Fixtures.onFreshThread(() -> text.setFont(pipe.toString()))
                    .failed(false, "not a regular file", none, "pipe");
            Fixtures.onFreshThread(() -> text.setFont(notes.toString()))
                    .failed(false, "notes.ttf: not a font", none, "not a font");
            if (!Files.isReadable(locked)) { // root reads it all the same
                Fixtures.onFreshThread(() -> text.setFont(locked.toString()))
                        .failed(false, "Permission denied", none, "unreadable");
            }
            Fixtures.onFreshThread(() -> text.setFont("garbage", new byte[] {1, 2, 3, 4}))
                    .failed(false, "garbage: not a font", none, "garbage bytes");
            Fixtures.onFreshThread(() -> FontManager.insertFontData("no-bytes", new byte[0]))
                    .failed(false, "no-bytes: no font bytes", none, "no bytes");
            Fixtures.onFreshThread(() -> text.setFont(new AssetManager(dir.toString()), "missing.ttf"))
                    .failed(false, "missing.ttf: no such asset", none, "missing asset");
            Fixtures.onFreshThread(() -> text.setFont((AssetManager) null, "x.ttf"))
                    .failed(false, "no asset manager", none, "null assets");
            Fixtures.onFreshThread(() -> text.setFont((String) null))
                    .failed(false, "no font path", none, "null path");
            // A call that works starts without a reason and leaves none.
            Fixtures.Outcome works = Fixtures.onFreshThread(() -> {
                text.setFont("/nonexistent/font.ttf");
                return text.setFont(Fixtures.SANS);
            });
            Check.equal(true, works.result, "font");
            Check.isNull(works.reason, "reason after success");
        } finally {
            for (Path p : new Path[] {notes, pipe, locked, dir}) {
                Files.delete(p);
            }
        }
    }

    /** A family that counts how often its fonts are asked for. */
    private static final class CountingFamily extends FontConfig.Family {
        int fontsAsked;

        CountingFamily(String name, String languages, FontConfig.Font... fonts) {
            super(name, languages, 0, fonts);
        }

        @Override
        public FontConfig.Font[] getFonts() {
            fontsAsked++;
            return super.getFonts();
        }
    }

    /** A configuration that counts how often its families are asked for. */
    private static final class CountingConfig extends FontConfig {
        int familiesAsked;

        CountingConfig(FontConfig.Family... families) {
            super(families);
        }

        @Override
        public FontConfig.Family[] getFamilies() {
            familiesAsked++;
            return super.getFamilies();
        }
    }

    private static FontConfig.Font font(String path, boolean italic, String fallbackFor) {
        return new FontConfig.Font(path, 0, 400, italic, fallbackFor);
    }

    @Test
    public void systemFamiliesAreTakenOncePerProcess() {
        // Before: a text without a font of its own has nothing to draw with.
        try (GxText text = withoutFont()) {
            Check.isNull(Fixtures.inkBox(text.render()), "no families yet");
        }
        List<String> log = LogTap.capture(() -> Check.isTrue(!FontManager.setFontConfig(null), "null"));
        Check.isTrue(LogTap.contains(log, 'E', MANAGER, "GxFontManager_SetFontConfig - jFontConfig is NULL"), "log");

        CountingFamily laterNamed = new CountingFamily("serif", null, font(Fixtures.SERIF, false, null));
        CountingConfig config = new CountingConfig(
                new FontConfig.Family("sans-serif", null, 0,
                        font("/usr/share/fonts/truetype/dejavu/DejaVuSans-Oblique.ttf", true, null),
                        font(Fixtures.SANS, false, null)),
                null,
                laterNamed,
                new FontConfig.Family(null, "und-Thai", 0, font(Fixtures.SERIF, true, null)),
                new FontConfig.Family(null, "und-Arab", 0, font("/nonexistent/font.ttf", false, null),
                        font(Fixtures.SERIF, false, "serif")),
                new FontConfig.Family(null, "und-Zsym", 0, font(Fixtures.SERIF, false, ""), null));
        Check.isTrue(FontManager.setFontConfig(config), "first configuration");
        Check.equal(1, config.familiesAsked, "families read");
        Check.equal(0, laterNamed.fontsAsked, "a later named family is dropped before its fonts are read");

        try (GxText text = withoutFont()) {
            Check.isTrue(drawsBlock(text), "the named family draws");
        }

        CountingConfig second = new CountingConfig(new FontConfig.Family("other", null, 0,
                font(Fixtures.SERIF, false, null)));
        Check.isTrue(FontManager.setFontConfig(second), "second configuration");
        Check.equal(0, second.familiesAsked, "the second configuration is not read");
        Check.isTrue(FontManager.setFontConfig(null), "null after the first is fine too");
    }
}
