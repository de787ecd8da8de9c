// A fixture for tests that switch multibyte mode or the lead-byte code page: both are
// process-wide, so every test gets them back as it found them.
#pragma once

#include "tekit/strings/MultiByte.h"
#include "tekit/strings/String.h"

#include <gtest/gtest.h>

namespace tekit::testing {

class MultiByteFixture : public ::testing::Test {
protected:
    void SetUp() override {
        m_savedCodePage = GetMultiByteCodePage();
        m_savedMode = String::IsMultiByteSupportEnabled();
    }
    void TearDown() override {
        String::EnableMultiByteSupport(m_savedMode);
        SetMultiByteCodePage(m_savedCodePage);
    }
    /// Shift-JIS lead bytes with multibyte mode on: "\x82\xA0" is one character.
    static void UseShiftJis() {
        SetMultiByteCodePage(932);
        String::EnableMultiByteSupport(true);
    }

private:
    unsigned m_savedCodePage = 0;
    bool m_savedMode = false;
};

/// Runs each case of a parameterised test twice: with multibyte mode off (false) and with
/// Shift-JIS lead bytes and multibyte mode on (true).
class BothByteModes : public MultiByteFixture, public ::testing::WithParamInterface<bool> {
protected:
    void SetUp() override {
        MultiByteFixture::SetUp();
        if (GetParam())
            UseShiftJis();
    }
};

} // namespace tekit::testing
