#pragma once
// GxView: the geometry of the view a text is shown in: its size, the size of
// the bitmap rendered for it (the view plus the effects' margins), padding,
// gravity and line limits. The setters check only for negative sizes, which
// they log (tag "GxView") and refuse; gravity and the line limits are plain
// fields the bridge writes.

#include <cstdint>

namespace Glimmer {

class GxView {
public:
    // Android gravity bits.
    static constexpr int kGravityHorizontalMask = 0x07;
    static constexpr int kGravityLeft = 0x03;
    static constexpr int kGravityRight = 0x05;
    static constexpr int kGravityVerticalMask = 0x70;
    static constexpr int kGravityCenterVertical = 0x10;
    static constexpr int kGravityTop = 0x30;
    static constexpr int kGravityBottom = 0x50;
    static constexpr int kGravityFillVertical = 0x70;

    GxView() = default;
    virtual ~GxView() = default;

    bool SetSize(int width, int height);
    bool SetBitmapWidth(int width);
    bool SetBitmapHeight(int height);
    bool SetPadding(int left, int top, int right, int bottom);

    int GetWidth() const { return width_; }
    int GetHeight() const { return height_; }
    int GetBitmapWidth() const { return bitmapSize_[0]; }
    int GetBitmapHeight() const { return bitmapSize_[1]; }
    int GetPaddingLeft() const { return paddingLeft_; }
    int GetPaddingTop() const { return paddingTop_; }
    int GetPaddingRight() const { return paddingRight_; }
    int GetPaddingBottom() const { return paddingBottom_; }
    // The (bitmap width, bitmap height) pair, owned by the view.
    int* GetDrawingBitmapSize() { return bitmapSize_; }

    int gravity = kGravityLeft;
    int lineLimit = 0;   // lines to show when 1 or more; wins over maxLines
    int maxLines = 0;

private:
    int width_ = 0;
    int height_ = 0;
    int bitmapSize_[2] = {0, 0};
    int paddingLeft_ = 0;
    int paddingTop_ = 0;
    int paddingRight_ = 0;
    int paddingBottom_ = 0;
};

}  // namespace Glimmer
