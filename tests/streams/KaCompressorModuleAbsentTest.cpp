// Runs only in scratch copies of the test program (CheckModuleAbsent.cmake) where the module
// is missing ("absent") or is no module ("broken"), as TEKIT_TEST_COMPRESSION_MODULE says.
#include "tekit/streams/KaCompressor.h"

#include "support/Raises.h"
#include "tekit/environment/KnownDirectories.h"
#include "tekit/streams/OVMemoryStream.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

namespace {

using namespace tekit;
using namespace tekit::testing;

TEST(KaCompressorWithoutModule, RaisesNamingTheFilesAndLeavesStreamsAlone) {
    char const* const mode = std::getenv("TEKIT_TEST_COMPRESSION_MODULE");
    ASSERT_NE(mode, nullptr) << "runs in a scratch copy without the module";
    std::string const development =
        std::string(GetDevelopmentBinariesDirectory().CStr()) + KaCompressor::kModuleFileName;
    std::string const expected =
        std::string(mode) == "absent"
            ? "Unable to find the compression module: neither '" +
                  std::string(GetBinariesDirectory().CStr()) + KaCompressor::kModuleFileName +
                  "' nor '" + development + "' exists."
            : "Unable to load the compression module '" + development + "'. ";
    KaCompressor compressor;
    for (int attempt = 0; attempt < 2; ++attempt) { // it stays unloaded: the same again
        TEException const e = Raised([&] { compressor.CompressBound(10); });
        EXPECT_EQ(e.GetErrorCode(), TE_DLL_NOT_LOADABLE);
        EXPECT_EQ(std::string(e.GetDescription()).substr(0, expected.size()), expected);
    }
    EXPECT_EQ(compressor.ObsoleteCompressBound(10), TE_DLL_NOT_LOADABLE);
    OVMemoryStream stream;
    stream.WriteInt("n", 5);
    EXPECT_RAISES(stream.Compress(), TE_DLL_NOT_LOADABLE);
    EXPECT_EQ(stream.GetSize(), 4u);
}

} // namespace
