// String::Append of a COM VARIANT: its numbers, booleans and text, as the typed Append members
// write them.
#include "tekit/errors/Raise.h"
#include "tekit/strings/String.h"

#include <comdef.h>

namespace tekit {

namespace {

/// Appends the value of `v`, following VT_BYREF and VARIANTs held by reference.
void AppendVariant(String& s, VARIANT const& v, kDecimalPointLocalizationOptions options) {
    bool const ref = (v.vt & VT_BYREF) != 0;
    if (ref && v.byref == nullptr)
        TE_RAISE(TE_INVALID_POINTER, "", "String::Append");
    switch (v.vt & ~VT_BYREF) {
    case VT_EMPTY:
    case VT_NULL:
        return;
    case VT_I1:
        return s.Append(long(ref ? *v.pcVal : v.cVal));
    case VT_UI1:
        return s.Append((unsigned long)(ref ? *v.pbVal : v.bVal));
    case VT_I2:
        return s.Append(long(ref ? *v.piVal : v.iVal));
    case VT_UI2:
        return s.Append((unsigned long)(ref ? *v.puiVal : v.uiVal));
    case VT_I4:
        return s.Append(long(ref ? *v.plVal : v.lVal));
    case VT_UI4:
        return s.Append((unsigned long)(ref ? *v.pulVal : v.ulVal));
    case VT_INT:
        return s.Append(int(ref ? *v.pintVal : v.intVal));
    case VT_UINT:
        return s.Append((unsigned int)(ref ? *v.puintVal : v.uintVal));
    case VT_I8:
        return s.Append((long long)(ref ? *v.pllVal : v.llVal));
    case VT_UI8:
        return s.Append((unsigned long long)(ref ? *v.pullVal : v.ullVal));
    case VT_R4:
        return s.Append(double(ref ? *v.pfltVal : v.fltVal), options);
    case VT_R8:
        return s.Append(ref ? *v.pdblVal : v.dblVal, options);
    case VT_BOOL:
        s += (ref ? *v.pboolVal : v.boolVal) != VARIANT_FALSE ? "True" : "False";
        return;
    case VT_BSTR: {
        BSTR const text = ref ? *v.pbstrVal : v.bstrVal;
        if (text != nullptr)
            s += static_cast<wchar_t const*>(text);
        return;
    }
    case VT_VARIANT:
        if (ref)
            return AppendVariant(s, *v.pvarVal, options);
        break;
    default:
        break;
    }
    TE_RAISE(TE_UNEXPECTED_TYPE, "", "String::Append");
}

} // namespace

void String::Append(VARIANT const& value, kDecimalPointLocalizationOptions options) {
    AppendVariant(*this, value, options);
}

} // namespace tekit
