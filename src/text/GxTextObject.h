#pragma once
// GxTextObject: the native state behind one text of the application: its
// text, font, paint, view geometry, line records, style bits, colours, effect
// stack and the last rendered picture. The bridge fills it piece by piece;
// RenderTextEffect turns it into one 32-bit picture of the whole text with
// all its effects.
//
// Two-phase: Construct makes the state and registers the object with the
// instance registry, whose handle it keeps. Every method of an unconstructed
// object logs "@ Native Error %ld : %d" under "GxTextObject", records code 8
// and returns false, null, 0 or -1. Objects are deleted by the registry's
// release callback (or directly); the destructor unregisters the handle.
// One thread at a time per object.

#include <cstdint>

#include "platform/Paint.h"

namespace Glimmer {

class GxEffect;
class GxFontDrawing;
class GxString;
class GxView;
class List;
struct GxTextObjectImpl;

class GxTextObject {
public:
    GxTextObject();
    virtual ~GxTextObject();
    GxTextObject(const GxTextObject&) = delete;
    GxTextObject& operator=(const GxTextObject&) = delete;

    bool Construct();

    int GetRuntimeHandle() const;
    GxEffect* GetEffect();
    GxString* GetText();
    GxFontDrawing* GetFont();
    // Of GxLineInfo*, owned by the object.
    List* GetLineInfo();
    GxView* GetView();

    Platform::Paint GetPaint();
    void SetPaint(Platform::Paint& paint);

    // Null removes the text. Setting a text registers the locale lists of
    // the scripts in it, so that the fonts for them get loaded.
    bool SetText(const GxString* text);
    bool SetText(const wchar_t* text);
    void SetTextLocaleListId();

    // The font file at `path` becomes the text's font.
    bool SetFont(const char* path);
    // The font in `data` (new[] bytes, taken in every case) becomes the
    // text's font, known under `path`.
    bool SetFont(const char* path, char* data, unsigned size);

    // Takes the records of `lines` (GxLineInfo*); the caller then empties its
    // list without deleting them. The previous records are deleted.
    bool SetLineInfo(const List* lines);

    bool SetTextStyle(bool bold, bool italic);
    bool isBoldTextStyle();
    bool isItalicTextStyle();

    void SetBackgroundColor(unsigned color, bool enabled);
    void SetTextColor(unsigned color);
    unsigned GetTextColor();

    static GxTextObject* FindGxTextObject(int handle);

    // Renders a width x height picture: the effect stack's image of every
    // line over the background boxes, inside the gravity clip. The pixels
    // are 0xAARRGGBB words, straight alpha, owned by the object until the
    // next render or its destruction. Null (code 7, and a log line) for
    // negative sizes and for a line record whose range lies outside the text.
    unsigned* RenderTextEffect(int width, int height);

private:
    bool LinesInsideText();

    GxTextObjectImpl* M = nullptr;
};

}  // namespace Glimmer
