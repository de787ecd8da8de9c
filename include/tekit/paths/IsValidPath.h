// IsValidPath: the flat, undecorated entry point of path validation.
//
//   if (!IsValidPath("C:\\data\\*.ini", 1)) ...
//
// False at once for a text longer than 259 bytes; otherwise the text, as a Path, must pass
// PathBase::IsValid. A null text is the empty text, which is not valid.
#pragma once

#include "tekit/Export.h"

extern "C" TEKIT_API bool TEKIT_STDCALL IsValidPath(char const* path, int allowWildcards);
