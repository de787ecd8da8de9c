// A test seam of the INI store: a hook at the one moment of Ini_WriteToFile that a crash test
// needs, when the temporary file is complete and closed and the target not yet replaced.
#pragma once

namespace tekit::ini {

/// Called with the temporary file's path just before it is renamed over the target; null (the
/// default) does nothing. Not for use outside tests: it is one process-wide pointer.
extern void (*gBeforeReplaceHook)(char const* temporaryPath);

} // namespace tekit::ini
