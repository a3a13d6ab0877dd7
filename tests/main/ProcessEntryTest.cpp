// SPDX-License-Identifier: MIT
#include <array>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <sys/wait.h>

#include <gmock/gmock.h>

using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::Not;

namespace {

/** The line that the daemon writes when it serves. */
const std::string kStarted = "MediaServiceMain::initialize\n";

struct Outcome {
    int status = -1;
    std::string output;
};

/**
 * Runs the daemon to its end. `environment` is what env(1) takes before the command. When
 * `signal` is one, it is sent twice as soon as the service has started.
 */
Outcome runDaemon(const std::string& environment, const std::string& arguments = "",
                  int signal = 0) {
    const std::string command =
        "echo $$; exec env " + environment + " " QNS_DAEMON " " + arguments + " 2>&1";
    std::FILE* pipe = ::popen(command.c_str(), "r");
    std::array<char, 4096> line{};
    const pid_t pid = std::atoi(std::fgets(line.data(), line.size(), pipe));
    Outcome outcome;
    while (std::fgets(line.data(), line.size(), pipe) != nullptr) {
        outcome.output += line.data();
        if (signal != 0 && line.data() == kStarted) {
            ::kill(pid, signal);
            ::kill(pid, signal);
        }
    }
    const int status = ::pclose(pipe);
    outcome.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    return outcome;
}

/** A platform whose library fails, so that the daemon ends by itself. */
const std::string kBrokenPlatform =
    "LD_LIBRARY_PATH=" QNS_QNSYS_DOUBLE_DIR " QNSYS_DOUBLE_INIT=-1 ";

TEST(ProcessEntry, AFailingPlatformLibraryIsLoggedAndEndsTheProcess) {
    const Outcome run = runDaemon(kBrokenPlatform);
    EXPECT_EQ(run.status, 255) << run.output;
    EXPECT_THAT(run.output,
                HasSubstr("<3>MediaPlayerService 101: MediaServiceMain initialize is failed.\n"));
    EXPECT_THAT(run.output, HasSubstr("MediaServiceMain::~MediaServiceMain\n"));
    EXPECT_THAT(run.output, Not(HasSubstr("quit a.exec")));
}

TEST(ProcessEntry, APlatformLibraryThatAnswersMoreThanZeroHasNotFailed) {
    for (const int signal : {SIGTERM, SIGINT}) {
        const Outcome run =
            runDaemon("LD_LIBRARY_PATH=" QNS_QNSYS_DOUBLE_DIR " QNSYS_DOUBLE_INIT=1 ", "", signal);
        EXPECT_EQ(run.status, 0);
        // The one line after the start, although there were two signals.
        EXPECT_THAT(run.output, EndsWith(kStarted + "<6>MediaPlayerService 101: "
                                                    "main::onSystemSingleCaught\n"));
    }
}

TEST(ProcessEntry, StartsWithoutADisplay) {
    EXPECT_EQ(
        runDaemon("-u QT_QPA_PLATFORM -u DISPLAY -u WAYLAND_DISPLAY " + kBrokenPlatform).status,
        255);
    EXPECT_EQ(runDaemon("QT_QPA_PLATFORM= DISPLAY= WAYLAND_DISPLAY= " + kBrokenPlatform).status,
              255);
}

TEST(ProcessEntry, TakesThePlatformAsAnOption) {
    const std::string environment = "-u QT_QPA_PLATFORM " + kBrokenPlatform;
    EXPECT_EQ(runDaemon(environment, "-platform minimal").status, 255);
    EXPECT_EQ(runDaemon(environment, "--platform minimal").status, 255);
}

TEST(ProcessEntry, RefusesWhatItDoesNotKnowBeforeAnythingElse) {
    const Outcome run = runDaemon(kBrokenPlatform, "--unknown");
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.output, "QNSMediaService: unknown option: --unknown (try --help)\n");
}

TEST(ProcessEntry, HelpAndVersionStartNoService) {
    EXPECT_EQ(runDaemon("", "--version").output, "QNSMediaService " QNS_VERSION "\n");
    const Outcome help = runDaemon("", "--help");
    EXPECT_EQ(help.status, 0);
    EXPECT_THAT(help.output, Not(HasSubstr("MediaServiceMain")));
}

} // namespace
