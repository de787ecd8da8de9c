// The library's debug output: warnings, exception dumps and diagnostics for developers.
//
//   WriteToCDebug("cache rebuilt\n");
//   std::ostringstream out;
//   out << "entries: " << count << '\n';
//   FlushStringStreamToCDebug(out);     // written, and `out` is empty again
//
// Writers are serialised, so each text arrives whole. By default the text goes to the
// platform's debug channel (standard error on POSIX, the debugger on Windows); a host or a
// test may install its own sink.
#pragma once

#include "tekit/Export.h"

#include <sstream>

namespace tekit {

/// Receives each text written to the debug output, with the context given at installation.
using DebugOutputSink = void (*)(char const* text, void* context);

/// Installs `sink` (null restores the platform's debug channel). Called under the debug-output
/// lock, so it never runs beside a write that holds the lock.
TEKIT_API void SetDebugOutputSink(DebugOutputSink sink, void* context);

/// Writes `text` (null: nothing). Takes the debug-output lock if it can within a bounded
/// wait; when it cannot, the text is written all the same.
TEKIT_API void WriteToCDebug(char const* text);

/// Writes what `stream` holds and empties it.
TEKIT_API void FlushStringStreamToCDebug(std::ostringstream& stream);

} // namespace tekit
