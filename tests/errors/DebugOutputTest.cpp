#include "tekit/errors/DebugOutput.h"

#include "support/DebugCapture.h"

#include <gtest/gtest.h>

#include <set>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

using namespace tekit;
using tekit::testing::DebugCapture;

TEST(DebugOutput, ManyWritersLoseNothingAndNeverInterleave) {
    constexpr int kThreads = 8;
    constexpr int kLines = 250;
    DebugCapture capture;
    std::vector<std::thread> writers;
    for (int t = 0; t < kThreads; ++t)
        writers.emplace_back([t] {
            for (int i = 0; i < kLines; ++i) {
                std::string const line =
                    "writer " + std::to_string(t) + " line " + std::to_string(i) + "\n";
                WriteToCDebug(line.c_str());
            }
        });
    for (std::thread& writer : writers)
        writer.join();

    EXPECT_FALSE(capture.SawOverlap());
    std::istringstream text(capture.Text());
    std::set<std::string> lines;
    int count = 0;
    for (std::string line; std::getline(text, line); ++count)
        lines.insert(line);
    EXPECT_EQ(count, kThreads * kLines);
    EXPECT_EQ(lines.size(), size_t(kThreads * kLines));
}

TEST(DebugOutput, FlushingAStreamWritesItAndEmptiesIt) {
    DebugCapture capture;
    std::ostringstream stream;
    stream << "first " << 1 << '\n';
    FlushStringStreamToCDebug(stream);
    EXPECT_EQ(stream.str(), "");
    WriteToCDebug(nullptr);
    EXPECT_EQ(capture.Text(), "first 1\n");
}

namespace {

/// A sink that writes debug output itself: the lock must let the same thread in again.
void EchoingSink(char const* text, void* context) {
    auto* received = static_cast<std::string*>(context);
    *received += text;
    if (std::string(text) == "outer\n")
        WriteToCDebug("inner\n");
}

} // namespace

TEST(DebugOutput, ASinkMayWriteDebugOutputItself) {
    std::string received;
    SetDebugOutputSink(&EchoingSink, &received);
    WriteToCDebug("outer\n");
    SetDebugOutputSink(nullptr, nullptr);
    EXPECT_EQ(received, "outer\ninner\n");
}
