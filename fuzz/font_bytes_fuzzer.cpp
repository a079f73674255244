// Font bytes through the text object's font-from-bytes path, then a render
// of a short text with a stroke: the bytes must be refused or drawn, never
// crash the face loading, shaping or glyph drawing. Input: paint settings,
// up to 12 UTF-16 units of text, then the font's bytes.

#include <cstdint>
#include <cstring>
#include <string>

#include "FuzzInput.h"
#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace {

using namespace Glimmer;

constexpr const char* kKey = "fuzz-font";

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Fuzz::Input in(data, size);
    Platform::Paint paint;
    paint.size = 1.0f + float(in.Below(64));
    paint.scaleX = 0.5f + float(in.Below(7)) * 0.25f;
    paint.skewX = float(in.Below(5)) * 0.25f - 0.5f;
    paint.SetJavaFlags(in.Byte());
    const uint8_t style = in.Byte();
    wchar_t text[13] = {};
    const int length = 1 + in.Below(12);
    for (int i = 0; i < length; ++i) {
        const uint16_t unit = uint16_t(in.Byte() << 8 | in.Byte());
        text[i] = unit != 0 ? wchar_t(unit) : L'A';
    }
    size_t fontSize = 0;
    const uint8_t* font = in.Rest(&fontSize);

    {
        GxTextObject object;
        if (!object.Construct()) return 0;
        char* bytes = fontSize > 0 ? new char[fontSize] : nullptr;
        if (bytes != nullptr) std::memcpy(bytes, font, fontSize);
        if (object.SetFont(kKey, bytes, unsigned(fontSize)) && object.SetText(text)) {
            object.SetPaint(paint);
            object.SetTextStyle((style & 1) != 0, (style & 2) != 0);
            GxEffect* effect = object.GetEffect();
            if (effect != nullptr) effect->addStrokeText(2.0f, 0xFF0000FFu, 1.0f, 0, style >> 2 & 3);
            const int viewWidth = 160, viewHeight = 80;
            auto* line = new GxLineInfo();
            line->start = 0;
            line->end = length;
            line->x = 4;
            line->baseline = 56;
            line->bounds = GxRect(4, 8, viewWidth - 4, 72);
            List lines;
            lines.Construct();
            lines.Add(line);
            if (!object.SetLineInfo(&lines)) delete line;
            const int width = viewWidth + (effect != nullptr ? effect->getLeftOffset() + effect->getRightOffset() : 0);
            const int height = viewHeight + (effect != nullptr ? effect->getTopOffset() + effect->getBottomOffset() : 0);
            object.GetView()->SetSize(viewWidth, viewHeight);
            object.GetView()->SetBitmapWidth(width);
            object.GetView()->SetBitmapHeight(height);
            object.RenderTextEffect(width, height);
        }
    }
    FontManager::GetInstance()->ForgetMinikinFont(kKey, 0);
    return 0;
}
