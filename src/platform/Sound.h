// The system's sound output, for audible operator signals.
#pragma once

namespace tekit::platform {

/// Plays the default alert sound; false where there is none the library may use.
bool PlayAlertSound();
/// Plays a tone of `frequency` Hz for `milliseconds` and returns when it ends; false where
/// tones cannot be played.
bool PlayTone(unsigned frequency, unsigned milliseconds);

} // namespace tekit::platform
