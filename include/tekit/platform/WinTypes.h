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
// <windows.h> must come first: the OLE headers depend on it.
// clang-format off
#include <windows.h>
#include <oaidl.h>
#include <comdef.h> // _bstr_t, with the _com_error it raises on failure
// clang-format on
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
