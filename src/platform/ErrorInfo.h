// COM error information of the calling thread: SetErrorInfo/GetErrorInfo on Windows, a
// thread-local record elsewhere.
#pragma once

#include "tekit/platform/WinTypes.h"

#include <string>

namespace tekit::platform {

/// Publishes error information for the calling thread. Null texts are taken as empty.
void SetThreadErrorInfo(GUID const& iid, char const* source, char const* description,
                        unsigned long helpContext, char const* helpFile);
/// Takes the calling thread's error information (it is consumed); false when there is none.
bool GetThreadErrorInfo(std::string& source, std::string& description);

} // namespace tekit::platform
