// The help-file members of TEException that take a Path. They live with the paths, which sit
// above the exception: the errors subsystem never includes a path header.
#include "tekit/errors/TEException.h"
#include "tekit/paths/Path.h"

namespace tekit {

void TEException::SetWinHelpFile(Path const& helpFile) {
    SetWinHelpFile(helpFile.GetString());
}

void TEException::GetWinHelpFile(Path& helpFile) const {
    helpFile.SetPathName(GetWinHelpFile());
}

} // namespace tekit
