// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>

#include "tests/daemon/support/DaemonProcess.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/packaging/Packages.h"
#include "tests/support/TestFolder.h"

using testing::AnyOf;
using testing::Contains;
using testing::Each;
using testing::HasSubstr;
using testing::StartsWith;

namespace {

class Development : public Installed {
protected:
    TestFolder mFolder;
};

/** What a library offers to those who load it, as in the source. */
std::vector<std::string> exportsOf(const std::string& library) {
    return linesOf(outputOf("nm --dynamic --defined-only --demangle --format=just-symbols "
                            "\"$(ldconfig --print-cache | sed --quiet 's/.*" +
                            library + " .* => //p' | head -n 1)\""));
}

TEST_F(Development, TheClientLibraryExportsItsInterfaceOnly) {
    const auto names = exportsOf("libqnsmediaclient.so.1");
    EXPECT_THAT(
        names,
        Each(AnyOf(StartsWith("qnsmedia::Connection::"), StartsWith("qnsmedia::Discoverer::"),
                   StartsWith("qnsmedia::Importer::"), StartsWith("qnsmedia::Player::"),
                   StartsWith("qnsmedia::resultText"), StartsWith("typeinfo for qnsmedia::"))));
    for (const char* name :
         {"qnsmedia::Connection::Connection()", "qnsmedia::Player::clientId() const",
          "qnsmedia::Discoverer::clientId() const", "qnsmedia::Importer::clientId() const",
          "typeinfo for qnsmedia::Error"})
        EXPECT_THAT(names, Contains(name));
}

TEST_F(Development, TheEngineExportsItsInterfaceOnly) {
    const auto names = exportsOf("libmediaplayer_proxy.so.1");
    EXPECT_THAT(names,
                Each(AnyOf(StartsWith("LibMediaPlayer::"), HasSubstr(" for LibMediaPlayer::I"))));
    EXPECT_THAT(names, Contains(StartsWith("LibMediaPlayer::InterfaceFactory::createPlayer")));
}

TEST_F(Development, TheSystemServicesExportTheirFunctionsOnly) {
    const auto names = exportsOf("libqnsys.so.1");
    EXPECT_THAT(names, Each(StartsWith("qnsys_")));
    EXPECT_THAT(names, Contains("qnsys_init"));
}

TEST_F(Development, EachHeaderNeedsNoOtherBeforeIt) {
    outputOf(
        "cd /usr/include && ls qnsmedia/*.h LibMediaPlayer/*.h qnsys.h | xargs --max-procs=2 -I% "
        "sh -c 'echo \"#include <%>\" | " QNS_CXX " -std=c++17 -fsyntax-only -x c++ -'");
}

TEST_F(Development, TheSystemServicesAreAHeaderOfCToo) {
    outputOf("echo '#include <qnsys.h>' | gcc -std=c11 -fsyntax-only -x c -");
}

TEST_F(Development, TheExampleIsBuiltFromWhereItLies) {
    outputOf(QNS_CXX " -std=c++17 /usr/share/doc/libqnsmedia-dev/examples/play.cpp -o " +
             mFolder.path("play") + " $(pkg-config --cflags --libs qnsmediaclient)");
}

TEST_F(Development, AnotherMajorVersionIsNotTakenForThisOne) {
    std::ofstream(mFolder.path("CMakeLists.txt"))
        << "cmake_minimum_required(VERSION 3.25)\nproject(program CXX)\n"
           "find_package(QnsMediaClient 2 REQUIRED)\n";
    const Outcome outcome = run("cmake -S " + mFolder.path("") + " -B " + mFolder.path("build"));
    EXPECT_EQ(outcome.status, 1);
    EXPECT_THAT(outcome.output, HasSubstr("compatible with requested version \"2\""));
}

struct Place {
    const char* name;
    bool isMoved; ///< unpacked in some folder instead of installed
};

/** The program that the front page shows, built with the packages and nothing of the source. */
class FrontPageProgram : public testing::TestWithParam<Place> {
protected:
    void SetUp() override {
        std::ofstream(mFolder.path("program.cpp")) << fromFrontPage();
        if (GetParam().isMoved)
            outputOf("for package in " QNS_PACKAGE_FOLDER
                     "/*.deb; do dpkg-deb --extract $package " +
                     mFolder.path("moved") + "; done");
        else
            packages::install();
        mLibraries = outputOf("dirname " + prefix() + "/lib/*/libqnsmediaclient.so.1");
        mLibraries.pop_back(); // the end of the line
    }
    void TearDown() override {
        if (!GetParam().isMoved)
            packages::purge();
    }

    static std::string fromFrontPage() {
        const std::string page = outputOf("cat " QNS_SOURCE_DIR "/README.md");
        const std::size_t start = page.find('\n', page.find("```cpp"));
        const std::string program = page.substr(start, page.find("```", start) - start);
        EXPECT_THAT(program, HasSubstr("int main("));
        return program;
    }

    [[nodiscard]] std::string prefix() const {
        return GetParam().isMoved ? mFolder.path("moved/usr") : "/usr";
    }

    static void expectToPlay(const std::string& program) {
        DaemonProcess daemon;
        ASSERT_TRUE(daemon.waitUntilServing()) << daemon.output().joined();
        outputOf(program + " " + sample::shortSound());
        EXPECT_TRUE(daemon.waitForLine("MediaPlayerController::play"));
        EXPECT_EQ(daemon.terminate(), 0);
    }

    TestFolder mFolder;
    std::string mLibraries;
};

TEST_P(FrontPageProgram, IsBuiltWithCMakeAndPlays) {
    std::ofstream(mFolder.path("CMakeLists.txt"))
        << "cmake_minimum_required(VERSION 3.25)\nproject(program CXX)\n"
           "find_package(QnsMediaClient 1 REQUIRED)\n"
           "add_executable(program program.cpp)\n"
           "target_link_libraries(program PRIVATE QnsMedia::Client)\n";
    const std::string build = mFolder.path("build");
    outputOf("cmake -S " + mFolder.path("") + " -B " + build + " -D CMAKE_PREFIX_PATH=" + prefix() +
             " -D CMAKE_CXX_COMPILER=" QNS_CXX " && cmake --build " + build);
    expectToPlay(build + "/program");
}

TEST_P(FrontPageProgram, IsBuiltWithPkgConfigAndPlays) {
    const std::string program = mFolder.path("program");
    outputOf("export PKG_CONFIG_PATH=" + mLibraries + "/pkgconfig && " QNS_CXX " -std=c++17 " +
             program + ".cpp -o " + program + " $(pkg-config --cflags --libs qnsmediaclient)");
    expectToPlay("LD_LIBRARY_PATH=" + mLibraries + " " + program);
}

INSTANTIATE_TEST_SUITE_P(Packages, FrontPageProgram,
                         testing::Values(Place{"Installed", false}, Place{"Moved", true}),
                         [](const auto& place) { return std::string(place.param.name); });

} // namespace
