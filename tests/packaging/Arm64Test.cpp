// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DaemonProcess.h"
#include "tests/packaging/Packages.h"

using testing::HasSubstr;

namespace {

constexpr const char* kEmulator = "qemu-aarch64-static";
constexpr const char* kSystem = QNS_SOURCE_DIR "/build/arm64-sysroot";
constexpr const char* kBuild = QNS_SOURCE_DIR "/build/arm64";

/** The product built by the cross compiler, run by an emulator of the processor. */
class Arm64 : public testing::Test {
protected:
    static std::string emulated(const std::string& program) {
        return std::string(kEmulator) + " -L " + kSystem + ' ' + kBuild + "/bin/" + program;
    }
};

TEST_F(Arm64, EveryProductIsForThatProcessor) {
    for (const char* product :
         {"bin/QNSMediaService", "bin/qnsmedia", "lib/libmediaplayer_proxy.so.1",
          "lib/libqnsys.so.1", "lib/libqnsmediaclient.so.1"})
        EXPECT_THAT(outputOf(std::string("readelf --file-header ") + kBuild + '/' + product),
                    HasSubstr("AArch64"))
            << product;
}

TEST_F(Arm64, TextsAndNumbersAreTheSameThere) {
    // Where char and wchar_t have other signs than here. Death tests start their program once more,
    // which only the emulator could.
    for (const char* program : {"base_test --gtest_filter=-*DeathTest.*", "pack_test"})
        EXPECT_THAT(outputOf(emulated(program)), HasSubstr("[  PASSED  ]")) << program;
}

TEST_F(Arm64, TheDaemonServesTheTool) {
    DaemonOptions options;
    options.program = kEmulator;
    options.arguments = {"-L", kSystem, std::string(kBuild) + "/bin/QNSMediaService"};
    options.environment["QT_PLUGIN_PATH"] =
        std::string(kSystem) + "/usr/lib/aarch64-linux-gnu/qt6/plugins";
    DaemonProcess daemon(options);
    ASSERT_TRUE(daemon.waitUntilServing()) << daemon.output().joined();
    EXPECT_THAT(outputOf(emulated("qnsmedia status")), HasSubstr("0:00.0 / 0:00.0"));
    EXPECT_EQ(daemon.terminate(), 0);
}

} // namespace
