// Eight threads render texts of their own at once, under the locking the Java
// bridge uses: a render only reads the font manager (shared lock), setting a
// text may load font families (exclusive lock). The font configuration is
// long (31 families of three or four fonts), so walks over the family list
// go far enough to reuse earlier positions, and most families load only when
// a text first needs their script, while other threads render. A process of
// its own: the system families are taken once per process.

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cstring>
#include <mutex>
#include <shared_mutex>
#include <string>
#include <thread>
#include <vector>

#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "font/SystemFontFamilies.h"
#include "foundation/List.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

constexpr int kThreads = 8;
constexpr int kRounds = 16;
constexpr int kView = 48;

// Several fonts a family; DejaVu's files are small, so loading stays quick.
std::vector<Platform::SystemFontFamily> LongConfiguration() {
    const std::string dir = "/usr/share/fonts/truetype/dejavu/";
    const std::array<std::vector<std::string>, 3> sets = {{
        {"DejaVuSans.ttf", "DejaVuSans-Bold.ttf", "DejaVuSans-ExtraLight.ttf"},
        {"DejaVuSerif.ttf", "DejaVuSerif-Bold.ttf", "DejaVuSerifCondensed.ttf"},
        {"DejaVuSansMono.ttf", "DejaVuSansMono-Bold.ttf", "DejaVuSansCondensed.ttf"},
    }};
    std::vector<Platform::SystemFontFamily> config;
    config.push_back({"sans-serif", "", 0, {}});
    for (const char* name : {"DejaVuSans.ttf", "DejaVuSans-Bold.ttf", "DejaVuSerif.ttf", "DejaVuSansMono.ttf"}) {
        config[0].fonts.push_back({dir + name, 0, 400, false, name, ""});
    }
    // Three families for each of ten locale lists, each loaded on first need.
    const char* locales[] = {"und-Arab", "und-Grek", "und-Cyrl", "und-Hebr", "und-Thai",
                             "und-Deva", "ja",       "ko",       "zh-Hans",  "zh-Hant"};
    for (const char* locale : locales) {
        for (const auto& set : sets) {
            Platform::SystemFontFamily family{"", locale, 0, {}};
            int weight = 300;
            for (const std::string& name : set) family.fonts.push_back({dir + name, 0, weight += 100, false, name, ""});
            config.push_back(family);
        }
    }
    return config;
}

// Texts whose scripts need the families above.
const wchar_t* const kTexts[] = {
    L"\u0633\u0644\u0627\u0645 Ab", L"\u03B1\u03B2\u03B3 Cd", L"\u0434\u043E\u043C Ef",
    L"\u05E9\u05DC\u05D5\u05DD Gh", L"\u0E2A\u0E27\u0E31 Ij", L"\u0928\u092E\u0938 Kl",
    L"\u304B\u306A Mn",             L"\uD55C\uAE00 Op",       L"\u6F22\u5B57 Qr",
};

std::shared_mutex gFonts;   // the bridge's font lock, as the natives take it

using Picture = std::vector<unsigned>;

void RenderOnThread(int thread, std::vector<Picture>& last, std::atomic<int>& failures) {
    GxTextObject text;
    {
        std::unique_lock<std::shared_mutex> lock(gFonts);   // may add the font
        if (!text.Construct() || !text.SetFont(Testing::kDejaVuSans)) {
            ++failures;
            return;
        }
    }
    Platform::Paint paint;
    paint.size = 14.0f;
    text.SetPaint(paint);
    GxEffect* effect = text.GetEffect();
    if (effect->addStrokeText(2.0f, 0xFF0000FFu, 1.0f, 0, 1) < 0) ++failures;
    const int width = kView * 4 + effect->getLeftOffset() + effect->getRightOffset();
    const int height = kView + effect->getTopOffset() + effect->getBottomOffset();
    text.GetView()->SetSize(kView * 4, kView);
    text.GetView()->SetBitmapWidth(width);
    text.GetView()->SetBitmapHeight(height);
    const int texts = int(std::size(kTexts));
    for (int round = 0; round < kRounds; ++round) {
        for (int k = 0; k < texts; ++k) {
            const wchar_t* string = kTexts[(k + thread) % texts];
            {
                std::unique_lock<std::shared_mutex> lock(gFonts);   // may load families
                if (!text.SetText(string)) ++failures;
            }
            auto* line = new GxLineInfo();
            line->start = 0;
            line->end = int(std::wcslen(string));
            line->x = 2;
            line->baseline = 30;
            line->bounds = GxRect(2, 16, kView * 4 - 2, 34);
            List lines;
            lines.Construct();
            lines.Add(line);
            if (!text.SetLineInfo(&lines)) delete line;
            const unsigned* pixels;
            {
                std::shared_lock<std::shared_mutex> lock(gFonts);
                pixels = text.RenderTextEffect(width, height);
                // More of the render's walk over the families than its
                // drawing gives, so that walks overlap often.
                for (int walk = 0; walk < 8; ++walk) {
                    Platform::FontFamilies families;
                    int weight = 400;
                    FontManager::GetInstance()->GetMinikinFontFamilies(families, nullptr, &weight);
                    if (families.size() < 1) ++failures;
                }
            }
            if (pixels == nullptr) ++failures;
            else if (round == kRounds - 1) last[size_t((k + thread) % texts)].assign(pixels, pixels + size_t(width) * height);
        }
    }
}

TEST(ThreadStressTest, TextsRenderSideBySideWhileFamiliesLoad) {
    ASSERT_TRUE(InstallSystemFontFamilies(FontManager::GetInstance(), LongConfiguration()));
    const List* families = FontManager::GetInstance()->GetSystemFontFamilies();
    ASSERT_EQ(families != nullptr ? families->GetCount() : 0, 31);

    std::vector<std::vector<Picture>> last(kThreads, std::vector<Picture>(std::size(kTexts)));
    std::atomic<int> failures{0};
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
        threads.emplace_back([t, &last, &failures] { RenderOnThread(t, last[size_t(t)], failures); });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(failures.load(), 0);

    // Every family a text needed is loaded, and once all are, every thread
    // draws each text alike.
    int built = 0;
    for (int i = 0; i < families->GetCount(); ++i) built += static_cast<GxFontFamily*>(families->Get(i))->built;
    EXPECT_GE(built, 1 + 3 * 9);
    for (size_t k = 0; k < std::size(kTexts); ++k) {
        for (int t = 1; t < kThreads; ++t) {
            ASSERT_FALSE(last[size_t(t)][k].empty());
            EXPECT_TRUE(last[size_t(t)][k] == last[0][k]) << "text " << k << ", thread " << t;
        }
    }
}

}  // namespace
}  // namespace Glimmer
