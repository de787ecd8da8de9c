// The string family's COM text: _bstr_t and BSTR, converted through wide text.
#include "strings/WideText.h"
#include "tekit/strings/String.h"

#include <comdef.h>

namespace tekit {

String& String::operator+=(_bstr_t const& text) {
    return *this += static_cast<wchar_t const*>(text);
}

void String::Assign(_bstr_t const& text) {
    Assign(static_cast<wchar_t const*>(text));
}

BSTR String::AllocSysString() const {
    std::wstring const text = detail::ToWide(GetBufferReadPtr(), GetNumBytes());
    return ::SysAllocStringLen(text.data(), static_cast<UINT>(text.size()));
}

String::operator _bstr_t() const {
    std::wstring const text = detail::ToWide(GetBufferReadPtr(), GetNumBytes());
    return _bstr_t(text.c_str());
}

} // namespace tekit
