// Pixel widths of text, for fitting a path into a window (Windows only).
#pragma once

#include "tekit/platform/WinTypes.h"

namespace tekit::platform {

#if defined(_WIN32)
/// Width in pixels of `text` drawn on one line with `font` (null: the system font); -1 when
/// it cannot be measured.
long MeasureTextWidth(char const* text, HFONT font);
#endif

} // namespace tekit::platform
