// The two conversions behind _bstr_t's narrow-text members. MinGW-w64's comutil.h declares
// them but ships no library that defines them (the role of comsupp on other toolchains), so the
// library defines and exports them: callers that use _bstr_t with narrow text link through it.
#include "platform/CodePage.h"
#include "platform/TextConversion.h"
#include "platform/Win32.h"

#include <comutil.h>

#include <new>

#if defined(TEKIT_BUILDING)
#define TEKIT_COMSUPPORT_EXPORT __declspec(dllexport)
#else
#define TEKIT_COMSUPPORT_EXPORT
#endif

namespace _com_util {

/// Narrow text in the ANSI code page to a new BSTR; null for null. Raises through
/// _com_issue_error when memory runs out, as _bstr_t expects.
TEKIT_COMSUPPORT_EXPORT BSTR WINAPI ConvertStringToBSTR(char const* text) {
    if (!text)
        return nullptr;
    std::wstring const wide =
        tekit::platform::NarrowToWide(text, -1, tekit::platform::GetAnsiCodePage());
    BSTR const result = ::SysAllocStringLen(wide.data(), static_cast<UINT>(wide.size()));
    if (!result)
        _com_issue_error(E_OUTOFMEMORY);
    return result;
}

/// A BSTR to new narrow text in the ANSI code page, freed by _bstr_t with delete[]; null for
/// null.
TEKIT_COMSUPPORT_EXPORT char* WINAPI ConvertBSTRToString(BSTR text) {
    if (!text)
        return nullptr;
    std::string const narrow = tekit::platform::WideToNarrow(
        text, static_cast<int>(::SysStringLen(text)), tekit::platform::GetAnsiCodePage());
    char* const result = new (std::nothrow) char[narrow.size() + 1];
    if (!result) {
        _com_issue_error(E_OUTOFMEMORY);
        return nullptr;
    }
    narrow.copy(result, narrow.size());
    result[narrow.size()] = '\0';
    return result;
}

} // namespace _com_util
