// Lock levels: every concrete lock carries one in its type.
//
//   void Refresh(CriticalSectionLevelValidation<kUltraFiniteLockLevel>& lock);  // only level 4
//
// A level is a signed 32-bit template argument. Nothing checks the order in which locks of
// different levels are taken; the level makes each family of locks a distinct type, and code
// built on the library names those types.
#pragma once

#include "tekit/sync/Lockable.h"

#include <cstdint>
#include <limits>

namespace tekit {

/// The levels in use: the three lowest integers for the general locks, small positive ones
/// for the per-object pools.
inline constexpr std::int32_t kGeneralLockLevel = std::numeric_limits<std::int32_t>::min();
inline constexpr std::int32_t kSubpropertiesLockLevel = kGeneralLockLevel + 1;
inline constexpr std::int32_t kTestObjectArrayLockLevel = kGeneralLockLevel + 2;
inline constexpr std::int32_t kTestObjectMemberLockLevel = 3;
inline constexpr std::int32_t kUltraFiniteLockLevel = 4;

/// Carries `level`; no state and no behaviour of its own.
template <std::int32_t level> class CriticalSectionLevelValidation : public Lockable {
protected:
    constexpr CriticalSectionLevelValidation() = default;
};

} // namespace tekit
