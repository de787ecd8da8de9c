// The one way the platform layer includes the Windows headers: lean, without the min/max
// macros, and with the names that collide with the seam's own functions undefined.
#pragma once

#include "tekit/platform/WinTypes.h" // lean <windows.h>, without the min/max macros

#undef GetEnvironmentVariable
