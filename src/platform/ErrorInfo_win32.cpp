// The Windows implementation of platform/ErrorInfo.h.
#include "platform/CodePage.h"
#include "platform/ErrorInfo.h"
#include "platform/TextConversion.h"
#include "platform/Win32.h"

#include <oleauto.h>

namespace tekit::platform {

namespace {

/// Narrow texts are in the process's ANSI code page, which is also how BSTRs come back.
struct OwnedBstr {
    BSTR value = nullptr;
    explicit OwnedBstr(char const* text) {
        std::wstring const wide = NarrowToWide(text, -1, GetAnsiCodePage());
        value = ::SysAllocStringLen(wide.data(), static_cast<UINT>(wide.size()));
    }
    OwnedBstr() = default;
    OwnedBstr(OwnedBstr const&) = delete;
    OwnedBstr& operator=(OwnedBstr const&) = delete;
    ~OwnedBstr() { ::SysFreeString(value); }
    std::string Narrow() const {
        return WideToNarrow(value, static_cast<int>(::SysStringLen(value)), GetAnsiCodePage());
    }
};

} // namespace

void SetThreadErrorInfo(GUID const& iid, char const* source, char const* description,
                        unsigned long helpContext, char const* helpFile) {
    ICreateErrorInfo* creator = nullptr;
    if (FAILED(::CreateErrorInfo(&creator)) || !creator)
        return;
    OwnedBstr const sourceText(source), descriptionText(description), helpFileText(helpFile);
    creator->SetGUID(iid);
    creator->SetSource(sourceText.value);
    creator->SetDescription(descriptionText.value);
    creator->SetHelpContext(static_cast<DWORD>(helpContext));
    creator->SetHelpFile(helpFileText.value);
    IErrorInfo* info = nullptr;
    if (SUCCEEDED(creator->QueryInterface(IID_IErrorInfo, reinterpret_cast<void**>(&info))) &&
        info) {
        ::SetErrorInfo(0, info);
        info->Release();
    }
    creator->Release();
}

bool GetThreadErrorInfo(std::string& source, std::string& description) {
    IErrorInfo* info = nullptr;
    // S_FALSE (no information) is a success code, so the pointer decides.
    if (::GetErrorInfo(0, &info) != S_OK || !info)
        return false;
    OwnedBstr sourceText, descriptionText;
    info->GetSource(&sourceText.value);
    info->GetDescription(&descriptionText.value);
    info->Release();
    source = sourceText.Narrow();
    description = descriptionText.Narrow();
    return true;
}

} // namespace tekit::platform
