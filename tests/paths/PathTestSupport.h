// Helpers shared by the path tests.
#pragma once

#include "tekit/errors/TEException.h"
#include "tekit/paths/PathBase.h"
#include "tekit/strings/DynamicString.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

namespace tekit::testing {

/// The exception that `raise` throws; fails the test when it throws nothing.
inline TEException Caught(std::function<void()> const& raise) {
    try {
        raise();
    } catch (TEException const& e) {
        return e;
    }
    ADD_FAILURE() << "nothing was raised";
    return TEException();
}

/// A path that stores its text exactly as given, without the normalisation of construction:
/// to reach the rules that only such text can break.
class RawPath : public PathBase {
public:
    explicit RawPath(char const* text) : m_text(text, true) {}

protected:
    String& GetPathString() override { return m_text; }
    String const& GetPathString() const override { return m_text; }

private:
    DynamicString m_text;
};

/// The text an out-parameter operation gives.
inline std::string TextOf(std::function<void(String&)> const& get) {
    DynamicString out("unset", true);
    get(out);
    return out.GetBufferReadPtr();
}

} // namespace tekit::testing
