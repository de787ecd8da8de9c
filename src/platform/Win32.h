// The one way the platform layer includes the Windows headers: lean, without the min/max
// macros, and with the names that collide with the seam's own functions undefined.
#pragma once

#ifndef WIN32_LEAN_AND_MEAN
#define WIN32_LEAN_AND_MEAN
#endif
#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

#undef GetEnvironmentVariable
