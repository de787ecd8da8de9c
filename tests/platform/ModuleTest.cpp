// Loading shared modules and looking up their symbols, through the fault seam.
#include "platform/Module.h"
#include "support/FaultInjection.h"

#include <gtest/gtest.h>

#include <string>

namespace tekit::platform {
namespace {

using testing::ScopedFault;

#if defined(_WIN32)
constexpr char kSystemModule[] = "kernel32.dll";
constexpr char kSystemSymbol[] = "GetTickCount";
constexpr char kMissingModule[] = "tekit-no-such-module.dll";
#else
constexpr char kSystemModule[] = "libc.so.6";
constexpr char kSystemSymbol[] = "strlen";
constexpr char kMissingModule[] = "libtekit-no-such-module.so";
#endif

TEST(ModuleTest, ASystemModuleLoadsAndFindsItsSymbols) {
    ModuleHandle module = nullptr;
    ASSERT_FALSE(OpenModule(kSystemModule, module));
    ASSERT_NE(module, nullptr);
    void* address = nullptr;
    EXPECT_FALSE(FindSymbol(module, kSystemSymbol, address));
    EXPECT_NE(address, nullptr);
    SystemError const missing = FindSymbol(module, "TekitNoSuchSymbol", address);
    EXPECT_EQ(missing.code, native::kSymbolNotFound);
    CloseModule(module);
}

TEST(ModuleTest, AMissingModuleFailsWithTheLoadersReason) {
    ModuleHandle module = nullptr;
    std::string reason;
    SystemError const error = OpenModule(kMissingModule, module, &reason);
    EXPECT_EQ(error.code, native::kModuleNotFound);
    EXPECT_EQ(module, nullptr);
    EXPECT_FALSE(reason.empty());
}

TEST(ModuleTest, ArmedLoadsAndLookupsFailWithTheInjectedError) {
    ModuleHandle module = nullptr;
    {
        ScopedFault const fault(FaultKind::ModuleLoad, 1, native::kModuleNotFound);
        std::string reason;
        SystemError const error = OpenModule(kSystemModule, module, &reason);
        EXPECT_EQ(error.code, native::kModuleNotFound);
        EXPECT_EQ(module, nullptr);
        EXPECT_FALSE(reason.empty());
        ASSERT_FALSE(OpenModule(kSystemModule, module)); // only the first call fails
    }
    {
        ScopedFault const fault(FaultKind::SymbolLookup, 1, native::kSymbolNotFound);
        void* address = nullptr;
        EXPECT_EQ(FindSymbol(module, kSystemSymbol, address).code, native::kSymbolNotFound);
        EXPECT_EQ(address, nullptr);
    }
    CloseModule(module);
}

} // namespace
} // namespace tekit::platform
