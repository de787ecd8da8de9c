// COM error information: publishing a TEException to COM clients and raising from a failed
// HRESULT with the error information the callee left.
#include "tekit/errors/ComErrorInfo.h"

#include "platform/ErrorInfo.h"
#include "tekit/errors/Raise.h"

#include <string>

namespace tekit {

namespace {

constexpr std::uint32_t kEFail = 0x80004005;
constexpr std::uint32_t kFacilityWin32 = 0x80070000;

/// A bare Win32 error number (below 0x10000) becomes HRESULT_FROM_WIN32(n).
std::uint32_t ToHResult(std::uint32_t comCode) {
    return comCode != 0 && comCode < 0x10000 ? (kFacilityWin32 | comCode) : comCode;
}

TEError ToTEError(std::uint32_t hr) {
    TEError code = SystemErrorCodeToTEError(hr, TE_NO_ERROR);
    if (code == TE_NO_ERROR && (hr & 0xFFFF0000u) == kFacilityWin32)
        code = SystemErrorCodeToTEError(hr & 0xFFFFu, TE_NO_ERROR);
    return code == TE_NO_ERROR ? TE_OPERATION_FAILED : code;
}

} // namespace

HRESULT SetErrorInfoForTEException(GUID const& interfaceId, TEException const* exception, char*) {
    if (!exception)
        return HRESULT(kEFail);
    platform::SetThreadErrorInfo(interfaceId, exception->GetSource(), exception->GetDescription(),
                                 exception->GetWinHelpID(), exception->GetWinHelpFile());
    return HRESULT(ToHResult(GetWinErrorCode(exception->GetErrorCode())));
}

void CheckHrIErrorInfo(long hr) {
    CheckHrIErrorInfo(hr, "CheckHrIErrorInfo", nullptr);
}

void CheckHrIErrorInfo(long hr, char const* function, char const* file) {
    if (std::int32_t(hr) >= 0)
        return;
    std::uint32_t const code = std::uint32_t(hr);
    std::string source;
    std::string description;
    platform::GetThreadErrorInfo(source, description);
    // A caller that names its file cannot give its line: the line is then 0, not ours.
    TE_RAISE_FROM(ToTEError(code), description.c_str(), function, long(std::int32_t(code)),
                  source.c_str(), file, 0);
}

} // namespace tekit
