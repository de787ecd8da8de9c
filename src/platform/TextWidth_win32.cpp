// Pixel widths of text, for fitting a path into a window.
#include "platform/TextWidth.h"
#include "platform/Win32.h"

namespace tekit::platform {

long MeasureTextWidth(char const* text, HFONT font) {
    HDC const dc = ::CreateCompatibleDC(nullptr);
    if (!dc)
        return -1;
    HGDIOBJ const previous = font ? ::SelectObject(dc, font) : nullptr;
    RECT area{0, 0, 0, 0};
    int const height =
        ::DrawTextA(dc, text ? text : "", -1, &area, DT_CALCRECT | DT_SINGLELINE | DT_NOPREFIX);
    if (previous)
        ::SelectObject(dc, previous);
    ::DeleteDC(dc);
    return height == 0 ? -1 : area.right - area.left;
}

} // namespace tekit::platform
