// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <future>
#include <mutex>

#include <qnsmedia/Importer.h>

#include "tests/daemon/support/DaemonProcess.h"
#include "tests/daemon/support/Patience.h"
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

constexpr const char* kConfine = "/usr/local/bin/confine";

/** The installed daemon with all that its unit allows it and no more. */
class Service : public Installed {
protected:
    void SetUp() override {
        std::filesystem::remove_all("/var/lib/qnsmedia"); // what another daemon has left
        // Where the daemon's user can reach it.
        outputOf(std::string("install -m 755 " QNS_CONFINE " ") + kConfine);
        outputOf("install -m 644 " + sample::film() + " /srv/film.mp4");
        DaemonOptions options;
        options.program = QNS_AS_UNIT;
        options.arguments = {kUnit, kConfine};
        mpDaemon = std::make_unique<DaemonProcess>(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        EXPECT_THAT(mpDaemon->output().with("[Error]"), IsEmpty());
    }
    void TearDown() override { EXPECT_EQ(mpDaemon->terminate(), 0); }

    std::unique_ptr<DaemonProcess> mpDaemon;
};

TEST_F(Service, HasOneCapabilityAndNoWayToMore) {
    const std::string status = outputOf("cat /proc/" + std::to_string(mpDaemon->pid()) + "/status");
    constexpr const char* kBindService = "0000000000000400\n";
    for (const char* set : {"CapPrm:\t", "CapEff:\t", "CapBnd:\t", "CapAmb:\t"})
        EXPECT_THAT(status, HasSubstr(std::string(set) + kBindService));
    EXPECT_THAT(status, HasSubstr("NoNewPrivs:\t1\n"));
    EXPECT_THAT(status, HasSubstr("Seccomp:\t2\n"));
}

TEST_F(Service, Plays) {
    EXPECT_THAT(outputOf("qnsmedia play /srv/film.mp4"), HasSubstr("1 video, 1 audio"));
}

TEST_F(Service, ServesAClientThatComesAgain) {
    for (int i = 0; i < 3; ++i)
        EXPECT_THAT(outputOf("qnsmedia --identity 1003 status"), HasSubstr("0:00.0 / 0:00.0"));
}

TEST_F(Service, DrawsPicturesIntoItsFolderForItsGroup) {
    outputOf("qnsmedia image /srv/film.mp4 -o /run/qnsmedia/film.jpg");
    EXPECT_EQ(outputOf("stat --format='%U %G %a' /run/qnsmedia/film.jpg"),
              "qnsmedia qnsmedia 640\n");
}

TEST_F(Service, WritesNowhereElse) {
    outputOf("install -d -m 777 /srv/all");
    EXPECT_NE(run("qnsmedia image /srv/film.mp4 -o /srv/all/film.jpg").status, 0);
    EXPECT_FALSE(std::filesystem::exists("/srv/all/film.jpg"));
}

TEST_F(Service, ImportsIntoItsLibrary) {
    qnsmedia::Connection connection;
    qnsmedia::Importer importer(connection);
    std::promise<qnsmedia::ImportNotification> finished;
    std::once_flag once; // the last event may be told more than once
    importer.onNotification([&](const qnsmedia::ImportNotification& notification) {
        if (notification.kind == qnsmedia::ImportNotificationKind::finished)
            std::call_once(once, [&] { finished.set_value(notification); });
    });
    importer.importFile("/srv/film.mp4", "Films").get();
    auto future = finished.get_future();
    ASSERT_EQ(future.wait_until(patience::deadline()), std::future_status::ready);
    const qnsmedia::ImportNotification imported = future.get();
    EXPECT_EQ(imported.result, 0) << imported.text;
    EXPECT_TRUE(std::filesystem::exists("/var/lib/qnsmedia/media/Films/film.mp4"))
        << imported.text << outputOf("find /var/lib/qnsmedia");
}

TEST_F(Service, RemembersGStreamersPlugins) {
    EXPECT_THAT(outputOf("ls /var/cache/qnsmedia/gstreamer-1.0"), HasSubstr("registry"));
}

/** The means of these tests forbid what they should. */
class Confinement : public Installed {
protected:
    static Outcome confined(const std::string& command) {
        return run(std::string(QNS_CONFINE " ") + kUnit + ' ' + command);
    }
};

TEST_F(Confinement, ForbidsWhatTheUnitDoesNotAllow) {
    for (const char* command : {"/usr/bin/nice -n 1 /bin/true", "/usr/bin/unshare --user /bin/true",
                                "/usr/bin/unshare --net /bin/true"})
        EXPECT_THAT(confined(command).output, HasSubstr("Operation not permitted")) << command;
    EXPECT_EQ(confined("/bin/true").status, 0);
}

/** An installed daemon whose engine is not the one it was built with. */
class AnotherEngine : public Installed {
protected:
    /** Gives the place back to ours. */
    void TearDown() override {
        dpkg("--purge --force-depends device-engine");
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
    dpkg("--install " + makePackage(folder));
    EXPECT_THAT(run("dpkg --status libmediaplayer-proxy1").output, Not(HasSubstr("ok installed")));
    expectToServe({});
}

} // namespace
