// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>

#include "tests/packaging/Packages.h"

using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

namespace {

constexpr const char* kUnit = "/usr/lib/systemd/system/QNSMediaService.service";
constexpr const char* kLog = "/var/log/qn_ope.log";

std::string field(const std::string& package, const std::string& name) {
    return outputOf("dpkg-query --show --showformat='${" + name + "}' " + package);
}

class Installation : public Installed {};

TEST_F(Installation, EachPackageDependsOnTheLibrariesThatItsFilesLoad) {
    EXPECT_THAT(field("qnsmediaservice", "Depends"),
                AllOf(HasSubstr("libmediaplayer-proxy1 (>= 1.0)"), HasSubstr("libqnsys1 (>= 1.0)"),
                      HasSubstr("libqt6core6 (>= "), HasSubstr("libc6 (>= ")));
    EXPECT_THAT(field("libmediaplayer-proxy1", "Depends"),
                AllOf(HasSubstr("libqnsys1"), HasSubstr("libgstreamer1.0-0 (>= "),
                      HasSubstr("libavformat59 (>= "), HasSubstr("libsqlite3-0 (>= ")));
    EXPECT_THAT(field("qnsmedia", "Depends"), HasSubstr("libqnsmediaclient1 (>= "));
    EXPECT_THAT(field("libqnsmedia-dev", "Depends"),
                AllOf(HasSubstr("libqnsmediaclient1 (= "), HasSubstr("libqnsys1 (= ")));
}

TEST_F(Installation, ClientsNeedNoMediaLibrary) {
    EXPECT_THAT(field("libqnsmediaclient1", "Depends") + field("qnsmedia", "Depends"),
                AllOf(Not(HasSubstr("libgstreamer")), Not(HasSubstr("libav")),
                      Not(HasSubstr("libqt")), Not(HasSubstr("mediaplayer"))));
}

TEST_F(Installation, NoFileHasChangedOnItsWay) {
    for (const std::string& package : packages::names())
        EXPECT_THAT(outputOf("dpkg --verify " + package), IsEmpty()) << package;
}

TEST_F(Installation, WhatLiesInEtcIsTheOperators) {
    for (const std::string& package : packages::names())
        for (const std::string& file : linesOf(outputOf("dpkg --listfiles " + package)))
            if (file.rfind("/etc/", 0) == 0 && std::filesystem::is_regular_file(file)) {
                EXPECT_THAT(field(package, "Conffiles"), HasSubstr(file + ' '));
            }
    EXPECT_THAT(field("qnsmediaservice", "Conffiles"), HasSubstr("/etc/logrotate.d/qnsmedia "));
}

TEST_F(Installation, LibrariesHaveTheNamesThatTheLoaderAsksFor) {
    for (const char* name :
         {"libmediaplayer_proxy.so.1", "libqnsys.so.1", "libqnsmediaclient.so.1"})
        EXPECT_THAT(outputOf("ldconfig --print-cache"), HasSubstr(std::string(name) + " ("));
}

TEST_F(Installation, ManualPagesAreCompressed) {
    for (const char* page : {"man1/qnsmedia.1.gz", "man8/QNSMediaService.8.gz"})
        EXPECT_THAT(outputOf(std::string("zcat /usr/share/man/") + page), HasSubstr(".TH "));
}

TEST_F(Installation, TheDaemonHasAUserWhoMayUseDevicesAndNothingElse) {
    EXPECT_THAT(linesOf(outputOf("id --name --groups qnsmedia | tr ' ' '\\n' | sort")),
                ElementsAre("audio", "qnsmedia", "render", "video"));
    EXPECT_THAT(outputOf("getent passwd qnsmedia"),
                AllOf(HasSubstr(":/var/lib/qnsmedia:"), HasSubstr("nologin")));
}

TEST_F(Installation, TheLogFilesAreTheDaemons) {
    for (const char* file : {kLog, "/var/log/qn_ope_debug.log"})
        EXPECT_EQ(outputOf(std::string("stat --format='%U %G %a' ") + file), "qnsmedia adm 640\n");
}

TEST_F(Installation, TheServiceStartsWithTheSystem) {
    EXPECT_EQ(outputOf("systemctl is-enabled QNSMediaService.service"), "enabled\n");
}

TEST_F(Installation, SystemdFindsNothingWrongWithTheUnit) {
    EXPECT_THAT(outputOf(std::string("systemd-analyze verify ") + kUnit), IsEmpty());
}

TEST_F(Installation, TheUnitLeavesTheDaemonLittleToAbuse) {
    // In tenths of systemd's measure of exposure, of which 100 are the most.
    const Outcome outcome = run("systemd-analyze security --no-pager --offline=true --threshold=17 "
                                "QNSMediaService.service");
    EXPECT_EQ(outcome.status, 0) << outcome.output;
    EXPECT_THAT(outcome.output, HasSubstr("Overall exposure level"));
}

/** A log file as the daemon holds it open. */
class OpenLog {
public:
    OpenLog() : mFile(kLog, std::ios::app) {}
    void write(const char* line) { mFile << line << std::endl; }

private:
    std::ofstream mFile;
};

TEST_F(Installation, RotationKeepsWhatWasWrittenAndTheFileInUse) {
    OpenLog log;
    log.write("before");
    outputOf("logrotate --force --state /dev/null /etc/logrotate.d/qnsmedia");
    log.write("after");
    EXPECT_EQ(outputOf(std::string("cat ") + kLog), "after\n");
    EXPECT_EQ(outputOf(std::string("cat ") + kLog + ".1"), "before\n");
    EXPECT_EQ(outputOf(std::string("stat --format='%U %a' ") + kLog), "qnsmedia 640\n");
}

class Removal : public testing::Test {
protected:
    void SetUp() override {
        packages::install();
        std::filesystem::create_directories("/var/lib/qnsmedia/media");
        std::ofstream("/var/lib/qnsmedia/media/film.mp4") << "film";
        packages::remove();
    }
    void TearDown() override { packages::purge(); }
};

TEST_F(Removal, LeavesConfigurationLogsAndTheLibrary) {
    for (const char* file : {"/etc/logrotate.d/qnsmedia", kLog, "/var/lib/qnsmedia/media/film.mp4"})
        EXPECT_TRUE(std::filesystem::exists(file)) << file;
    EXPECT_FALSE(std::filesystem::exists(kUnit));
    EXPECT_FALSE(std::filesystem::exists("/usr/bin/QNSMediaService"));
    EXPECT_THAT(run("systemctl is-enabled QNSMediaService.service").output,
                Not(StartsWith("enabled")));
}

TEST_F(Removal, PurgingLeavesTheLibraryAlone) {
    packages::purge();
    EXPECT_FALSE(std::filesystem::exists("/etc/logrotate.d/qnsmedia"));
    EXPECT_FALSE(std::filesystem::exists(kLog));
    EXPECT_TRUE(std::filesystem::exists("/var/lib/qnsmedia/media/film.mp4"));
    EXPECT_THAT(linesOf(outputOf("find /etc /usr /var/lib/systemd /var/log -xdev "
                                 "-ipath '*qnsmedia*' -not -ipath '*/passwd*'")),
                IsEmpty());
}

TEST_F(Removal, TheServiceIsThereAgainAfterwards) {
    packages::install();
    EXPECT_EQ(outputOf("systemctl is-enabled QNSMediaService.service"), "enabled\n");
}

} // namespace
