// The POSIX implementation of platform/ErrorInfo.h.
#include "platform/ErrorInfo.h"

#include <utility>

namespace tekit::platform {

namespace {

/// The calling thread's pending error information: what SetErrorInfo keeps per thread on
/// Windows.
struct ThreadErrorInfo {
    bool present = false;
    GUID iid{};
    std::string source;
    std::string description;
    unsigned long helpContext = 0;
    std::string helpFile;
};

thread_local ThreadErrorInfo tErrorInfo;

} // namespace

void SetThreadErrorInfo(GUID const& iid, char const* source, char const* description,
                        unsigned long helpContext, char const* helpFile) {
    tErrorInfo.present = true;
    tErrorInfo.iid = iid;
    tErrorInfo.source = source ? source : "";
    tErrorInfo.description = description ? description : "";
    tErrorInfo.helpContext = helpContext;
    tErrorInfo.helpFile = helpFile ? helpFile : "";
}

bool GetThreadErrorInfo(std::string& source, std::string& description) {
    if (!tErrorInfo.present)
        return false;
    source = std::move(tErrorInfo.source);
    description = std::move(tErrorInfo.description);
    tErrorInfo = ThreadErrorInfo{};
    return true;
}

} // namespace tekit::platform
