// Interned constant text: a DynamicString over its own constant block, registered in a
// process-wide set so that callers can share one block instead of copying a common text.
//
//   static GlobalConstantDynamicString const kYes("Yes");
//   String const* s = GlobalConstantDynamicString::GetGlobalConstantIfExists(&input);
#pragma once

#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

class TEKIT_API GlobalConstantDynamicString : public DynamicString {
public:
    /// `text` is used in place and must live as long as the constant.
    explicit GlobalConstantDynamicString(char const* text);
    GlobalConstantDynamicString(GlobalConstantDynamicString const&) = delete;
    GlobalConstantDynamicString& operator=(GlobalConstantDynamicString const&) = delete;
    ~GlobalConstantDynamicString() override;

    /// Drops this constant's memory (it becomes empty) and unregisters it.
    void ClearMemory() override;
    /// Goes through the copy-on-write path: the constant text stays untouched.
    char* GetBufferWritePtr() override;

    /// The registered constant whose text equals `s`, or `s` itself when there is none.
    static String const* GetGlobalConstantIfExists(String const* s);
    /// Empties the registry (at shutdown); the constants themselves stay usable.
    static void ClearAllMemory();

private:
    /// Removes this constant from the registry, if it is the one registered for its text.
    void Unregister();

    GlobalConstantCopyOnWriteMemory m_constant;
};

} // namespace tekit
