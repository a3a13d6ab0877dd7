// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>

#include "tests/daemon/support/DaemonProcess.h"
#include "tests/daemon/support/PlayerClient.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/engine_double/EngineScript.h"
#include "tests/packaging/Packages.h"
#include "tests/support/TestFolder.h"

using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

constexpr const char* kUnit = "/usr/lib/systemd/system/QNSMediaService.service";

/** The values of a setting of the unit, word by word. */
std::vector<std::string> setting(const std::string& name) {
    return linesOf(outputOf("sed --quiet 's/^" + name + "=//p' " + kUnit + " | tr ' ' '\\n'"));
}

/** The daemon as the unit starts it: command, environment, user, capability. */
DaemonOptions asService() {
    DaemonOptions options;
    options.arguments = setting("ExecStart");
    options.program = options.arguments.front();
    options.arguments.erase(options.arguments.begin());
    for (const std::string& variable : setting("Environment")) {
        const std::size_t equals = variable.find('=');
        options.environment[variable.substr(0, equals)] = variable.substr(equals + 1);
    }
    options.environment["HOME"] = "/var/lib/qnsmedia";
    options.privileges = {"--reuid",       setting("User").front(),
                          "--regid",       setting("Group").front(),
                          "--init-groups", "--no-new-privs"};
    for (const char* set : {"--inh-caps", "--ambient-caps", "--bounding-set"})
        options.privileges.insert(options.privileges.end(), {set, "-all,+net_bind_service"});
    return options;
}

class Service : public Installed {
protected:
    /** Makes the folders that systemd makes for it. */
    void SetUp() override {
        for (const char* folder : {"/var/lib/qnsmedia", "/var/cache/qnsmedia", "/run/qnsmedia"})
            outputOf(std::string("install -d -o qnsmedia -g qnsmedia -m 0750 ") + folder);
        std::filesystem::copy_file(sample::shortSound(), "/srv/sound.wav",
                                   std::filesystem::copy_options::overwrite_existing);
    }
};

TEST_F(Service, PlaysForTheInstalledTool) {
    DaemonProcess daemon(asService());
    ASSERT_TRUE(daemon.waitUntilServing()) << daemon.output().joined();
    EXPECT_THAT(daemon.output().with("[Error]"), IsEmpty());
    EXPECT_THAT(outputOf("/usr/bin/qnsmedia play /srv/sound.wav"), HasSubstr("0:01.0"));
    EXPECT_EQ(daemon.terminate(), 0);
}

/** An installed daemon whose engine is not the one it was built with. */
class AnotherEngine : public Installed {
protected:
    /** Gives the place back to ours. */
    void TearDown() override {
        run("dpkg --purge --force-depends device-engine");
        packages::install();
    }

    /** The daemon runs with the test's engine, and the test hears a client's request there. */
    void expectToServe(DaemonOptions options) {
        EngineScript engine;
        options.program = "/usr/bin/QNSMediaService";
        options.environment["QNS_ENGINE_DOUBLE"] = engine.address();
        DaemonProcess daemon(options);
        engine.expectCall("player create null 15");
        ASSERT_TRUE(daemon.waitUntilServing()) << daemon.output().joined();
        PlayerClient client(1000);
        ASSERT_NO_FATAL_FAILURE(client.registerCallBack());
        client.open("/media/a.mp4");
        engine.expectCall("player open \"/media/a.mp4\" 2");
        EXPECT_EQ(daemon.terminate(), 0);
    }

    /** A package as a device would bring it: in the place of ours, with the same file. */
    static std::string makePackage(const TestFolder& folder) {
        const std::string content = folder.path("device-engine");
        const std::string library = outputOf("dpkg --listfiles libmediaplayer-proxy1 | "
                                             "grep 'libmediaplayer_proxy.so.1$' | tr -d '\\n'");
        outputOf("install -D -m 644 " QNS_ENGINE_DOUBLE_DIR "/libmediaplayer_proxy.so.1 " +
                 content + library);
        std::filesystem::create_directory(content + "/DEBIAN");
        std::ofstream(content + "/DEBIAN/control")
            << "Package: device-engine\nVersion: 7\nArchitecture: " +
                   outputOf("dpkg --print-architecture") +
                   "Maintainer: Device <device@localhost>\nDescription: engine of a device\n"
                   "Provides: libmediaplayer-proxy1 (= 1.0)\n"
                   "Conflicts: libmediaplayer-proxy1\nReplaces: libmediaplayer-proxy1\n";
        outputOf("dpkg-deb --root-owner-group --build " + content);
        return content + ".deb";
    }
};

TEST_F(AnotherEngine, CanStandBeforeTheInstalledOne) {
    DaemonOptions options;
    options.preferLibraries(QNS_ENGINE_DOUBLE_DIR);
    expectToServe(options);
}

TEST_F(AnotherEngine, CanBeInstalledInItsPlace) {
    const TestFolder folder;
    outputOf("dpkg --install " + makePackage(folder));
    EXPECT_THAT(run("dpkg --status libmediaplayer-proxy1").output, Not(HasSubstr("ok installed")));
    expectToServe({});
}

} // namespace
