// The few Windows types that public signatures name.
//
// On Windows these come from the system headers. Elsewhere the library defines the handful it
// needs, with the same values, so that signatures and constants read the same on every platform.
#pragma once

#include <cstdint>

#if defined(_WIN32)
#ifndef WIN32_LEAN_AND_MEAN
#define WIN32_LEAN_AND_MEAN
#endif
#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

// The OLE Automation types that signatures name, declared only: code that calls one of those
// overloads includes <comdef.h> (or <oleauto.h>) itself, as the library's COM sources do.
class _bstr_t;
struct tagVARIANT;
typedef tagVARIANT VARIANT;
struct tagSAFEARRAY;
typedef tagSAFEARRAY SAFEARRAY;
typedef wchar_t* BSTR;
#else
using HANDLE = void*;
/// A module: on POSIX any address inside the shared object (null: the program).
using HINSTANCE = void*;
using HMODULE = HINSTANCE;
using DWORD = std::uint32_t;
using HRESULT = std::int32_t;
using ULONG = std::uint32_t;

struct GUID {
    std::uint32_t Data1;
    std::uint16_t Data2;
    std::uint16_t Data3;
    std::uint8_t Data4[8];
};
using IID = GUID;
using REFIID = IID const&;

inline bool operator==(GUID const& a, GUID const& b) {
    if (a.Data1 != b.Data1 || a.Data2 != b.Data2 || a.Data3 != b.Data3)
        return false;
    for (int i = 0; i < 8; ++i)
        if (a.Data4[i] != b.Data4[i])
            return false;
    return true;
}

/// The minimal COM ABI: reference counting and interface queries.
struct IUnknown {
    virtual HRESULT QueryInterface(REFIID riid, void** object) = 0;
    virtual ULONG AddRef() = 0;
    virtual ULONG Release() = 0;

protected:
    ~IUnknown() = default;
};

inline constexpr DWORD WAIT_OBJECT_0 = 0;
inline constexpr DWORD WAIT_TIMEOUT = 258;
inline constexpr DWORD WAIT_FAILED = 0xFFFFFFFF;
inline constexpr DWORD INFINITE = 0xFFFFFFFF;
#endif
