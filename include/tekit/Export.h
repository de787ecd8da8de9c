// Export and calling-convention macros shared by every public header.
//
//   class TEKIT_API DynamicString ...;                  // exported class
//   extern "C" TEKIT_API int TEKIT_STDCALL Foo(int);    // flat function
#pragma once

#if defined(_WIN32)
#if defined(TEKIT_BUILDING)
#define TEKIT_API __declspec(dllexport)
#elif defined(TEKIT_STATIC)
#define TEKIT_API
#else
#define TEKIT_API __declspec(dllimport)
#endif
#else
#define TEKIT_API __attribute__((visibility("default")))
#endif

/// Standard call on 32-bit Windows (the flat interface's convention), nothing elsewhere.
#if defined(_WIN32) && !defined(_WIN64)
#define TEKIT_STDCALL __stdcall
#define TEKIT_CDECL __cdecl
#else
#define TEKIT_STDCALL
#define TEKIT_CDECL
#endif

/// True where the OLE Automation types (_bstr_t, BSTR, VARIANT, SAFEARRAY) exist.
#if defined(_WIN32)
#define TEKIT_HAS_OLE 1
#else
#define TEKIT_HAS_OLE 0
#endif
