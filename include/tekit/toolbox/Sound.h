// Audible signals for operator attention.
//
//   TBBeep();                 // the system's alert sound
//   TBTone(880, 200);         // 880 Hz for 200 ms
//
// On Windows they play through the system (MessageBeep, Beep). Elsewhere there is no sound
// device the library may assume, and both do nothing and return 0 at once.
#pragma once

#include "tekit/Export.h"

/// Plays the system's default alert sound; 1 when played, else 0.
extern "C" TEKIT_API int TEKIT_STDCALL TBBeep(void);
/// Plays a tone of `frequency` Hz (37 to 32767) for `milliseconds` (0 to 10000) and returns
/// when it ends; 1 when played, else 0 (also for arguments out of range).
extern "C" TEKIT_API int TEKIT_STDCALL TBTone(int frequency, int milliseconds);
