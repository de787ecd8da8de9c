// StringVector to and from COM SAFEARRAYs of BSTR.
#include "strings/ErrDescr.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/StringVector.h"

#include <comdef.h>

namespace tekit {

void StringVector::CreateSafeArray(SAFEARRAY** array) const {
    if (!array)
        return;
    *array = nullptr;
    SAFEARRAY* result = SafeArrayCreateVector(VT_BSTR, 0, static_cast<ULONG>(size()));
    if (!result)
        ThrowOutOfMemory();
    for (LONG i = 0; i < static_cast<LONG>(size()); ++i) {
        BSTR text = (*this)[static_cast<size_t>(i)].AllocSysString();
        HRESULT const hr = SafeArrayPutElement(result, &i, text); // stores a copy
        SysFreeString(text);
        if (FAILED(hr)) {
            SafeArrayDestroy(result);
            TE_RAISE_API(TE_UNEXPECTED_SYSTEM_ERROR, static_cast<char const*>(nullptr),
                         "StringVector::CreateSafeArray", "SafeArrayPutElement", hr);
        }
    }
    *array = result;
}

void StringVector::SetFromSafeArray(SAFEARRAY* array) {
    StringVector items;
    if (array) {
        VARTYPE type = VT_EMPTY;
        if (SafeArrayGetDim(array) != 1 || FAILED(SafeArrayGetVartype(array, &type)) ||
            type != VT_BSTR)
            TE_RAISE(TE_TYPE_MISMATCH_ERROR, DescribeError("STRING_VECTOR_NEEDS_STRING_ARRAY"),
                     "StringVector::SetFromSafeArray");
        LONG low = 0, high = -1;
        SafeArrayGetLBound(array, 1, &low);
        SafeArrayGetUBound(array, 1, &high);
        for (LONG i = low; i <= high; ++i) {
            BSTR text = nullptr;
            HRESULT const hr = SafeArrayGetElement(array, &i, &text); // a copy we free
            if (FAILED(hr))
                TE_RAISE_API(TE_UNEXPECTED_SYSTEM_ERROR, static_cast<char const*>(nullptr),
                             "StringVector::SetFromSafeArray", "SafeArrayGetElement", hr);
            items.emplace_back(text ? static_cast<wchar_t const*>(text) : L"");
            SysFreeString(text);
        }
    }
    swap(items);
}

} // namespace tekit
