// The library's one seam to the operating system.
//
// Every call that touches the OS goes through these functions; each has one implementation per
// platform family (*_posix.cpp, *_win32.cpp), chosen by CMake. No other folder includes
// <windows.h>, <unistd.h> or <pthread.h>.
#pragma once

#include <cstdint>
#include <string>

namespace tekit::platform {

// ---- Threads ----------------------------------------------------------------------------
/// A small number that identifies the calling thread while it lives.
std::uint32_t CurrentThreadId();

// ---- Debug output -----------------------------------------------------------------------
/// Writes text to the platform's debug channel: standard error on POSIX, the debugger
/// (OutputDebugStringA) on Windows. The replaceable sink sits above this, in the errors module.
void WriteDebugText(char const* text);

// ---- Environment ------------------------------------------------------------------------
/// The value of an environment variable; false when it is not set.
bool GetEnvironmentVariable(char const* name, std::string& value);

// ---- Code pages -------------------------------------------------------------------------
/// The process's ANSI code page: GetACP() on Windows; 0 (single-byte) elsewhere.
unsigned GetAnsiCodePage();
/// Fills `isLead` with the lead bytes of `codePage`; false when the code page is unknown.
bool GetLeadBytes(unsigned codePage, bool (&isLead)[256]);

// ---- Text conversion --------------------------------------------------------------------
/// Narrow text of `numBytes` bytes in `codePage` (0: single-byte Latin-1) to wide text.
std::wstring NarrowToWide(char const* text, int numBytes, unsigned codePage);
/// Wide text to narrow text in `codePage`; characters it cannot hold become '?'.
std::string WideToNarrow(wchar_t const* text, int numChars, unsigned codePage);

} // namespace tekit::platform
