#include "text/GxView.h"

#include "platform/Log.h"

namespace Glimmer {
namespace {
constexpr const char* kTag = "GxView";
}

bool GxView::SetSize(int width, int height) {
    if (width < 0 || height < 0) {
        Platform::LogPrint(Platform::kLogError, kTag, "SetSize() - size invalid");
        return false;
    }
    width_ = width;
    height_ = height;
    return true;
}

bool GxView::SetBitmapWidth(int width) {
    if (width < 0) {
        // The misspelling is the line's established text.
        Platform::LogPrint(Platform::kLogError, kTag, "SetBitmapWidht() - width[%d] is invalid", width);
        return false;
    }
    bitmapSize_[0] = width;
    return true;
}

bool GxView::SetBitmapHeight(int height) {
    if (height < 0) {
        Platform::LogPrint(Platform::kLogError, kTag, "SetBitmapHeight() - height[%d] is invalid", height);
        return false;
    }
    bitmapSize_[1] = height;
    return true;
}

bool GxView::SetPadding(int left, int top, int right, int bottom) {
    paddingLeft_ = left;
    paddingTop_ = top;
    paddingRight_ = right;
    paddingBottom_ = bottom;
    return true;
}

}  // namespace Glimmer
