// KaCompressor: compressed strings to and from COM SAFEARRAYs of bytes.
#include "tekit/errors/Raise.h"
#include "tekit/streams/KaCompressor.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <comdef.h>

#include <cstring>
#include <memory>

namespace tekit {

namespace {

/// Gives back SafeArrayAccessData's pointer when it goes.
class ArrayAccess {
public:
    ArrayAccess(SAFEARRAY* array, char const* function) : m_array(array) {
        HRESULT const hr = SafeArrayAccessData(array, &m_data);
        if (FAILED(hr))
            TE_RAISE_API(TE_INVALID_OR_OUT_OF_RANGE, static_cast<char const*>(nullptr), function,
                         "SafeArrayAccessData", hr);
    }
    ~ArrayAccess() { SafeArrayUnaccessData(m_array); }
    ArrayAccess(ArrayAccess const&) = delete;
    ArrayAccess& operator=(ArrayAccess const&) = delete;
    unsigned char* Data() const { return static_cast<unsigned char*>(m_data); }

private:
    SAFEARRAY* m_array;
    void* m_data = nullptr;
};

} // namespace

void KaCompressor::BinarySafeArrayToString(SAFEARRAY* array, DynamicString& out) {
    char const* const function = "KaCompressor::BinarySafeArrayToString";
    VARTYPE type = VT_EMPTY;
    if (!array || SafeArrayGetDim(array) != 1 || FAILED(SafeArrayGetVartype(array, &type)) ||
        type != VT_UI1)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, static_cast<char const*>(nullptr), function);
    LONG low = 0, high = -1;
    SafeArrayGetLBound(array, 1, &low);
    SafeArrayGetUBound(array, 1, &high);
    auto const count = static_cast<unsigned int>(static_cast<long long>(high) - low + 1);
    ArrayAccess const access(array, function);
    BinaryBytesToCompressedString(access.Data(), count, out);
}

void KaCompressor::StringToBinarySafeArray(DynamicString& text, SAFEARRAY** array) {
    char const* const function = "KaCompressor::StringToBinarySafeArray";
    if (!array)
        TE_RAISE(TE_INVALID_POINTER, static_cast<char const*>(nullptr), function);
    unsigned char* bytes = nullptr;
    unsigned long count = 0;
    CompressedStringToBinaryBytes(text, bytes, count);
    std::unique_ptr<unsigned char, void (*)(void*)> const owned(bytes, [](void* p) { TBFree(p); });
    SAFEARRAY* const result = SafeArrayCreateVector(VT_UI1, 0, static_cast<ULONG>(count));
    if (!result)
        TE_RAISE(TE_OUT_OF_MEMORY, static_cast<char const*>(nullptr), function);
    try {
        ArrayAccess const access(result, function);
        if (count > 0)
            std::memcpy(access.Data(), bytes, count);
    } catch (...) {
        SafeArrayDestroy(result);
        throw;
    }
    *array = result;
}

} // namespace tekit
