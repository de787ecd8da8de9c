// Shows a fatal assertion's text to the user before the process aborts.
#pragma once

namespace tekit::platform {

/// A modal message box with `caption` and `text` on Windows; `text` on standard error
/// elsewhere. Returns once the user has seen it; the caller then aborts.
void ShowAssertBox(char const* caption, char const* text);

} // namespace tekit::platform
