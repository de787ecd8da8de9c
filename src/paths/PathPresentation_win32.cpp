// PathBase: the abbreviation of a path to a pixel width, measured with a Windows font.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"
#include "platform/TextWidth.h"

namespace tekit {

using namespace detail;

void PathBase::GetAbbreviatedNameToFit(long pixelWidth, String& out, HFONT font,
                                       bool cutFileName) const {
    auto const fits = [pixelWidth, font](PathChars const& form) {
        long const width = platform::MeasureTextWidth(ToBytes(form).c_str(), font);
        return width >= 0 && width <= pixelWidth;
    };
    PathChars const chars = ToChars(GetPathString());
    if (chars.empty() || fits(chars)) {
        out.Assign(GetPathString());
        return;
    }
    int const top = GetTopLevel();
    PathChars result = Shorten(chars, top, HeadEnd(top), fits);
    // The last level alone is too wide as well: cut it from its end, marking the cut.
    while (cutFileName && !fits(result) && result.size() > 3) {
        result.resize(result.size() - 4);
        result.insert(result.end(), 3, '.');
    }
    AssignChars(out, result);
}

} // namespace tekit
