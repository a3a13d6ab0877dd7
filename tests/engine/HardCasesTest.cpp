// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <fstream>
#include <gtest/gtest.h>
#include <random>
#include <sstream>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <thread>
#include <unistd.h>

#include <gst/base/gstpushsrc.h>

#include "LibMediaPlayer/InterfaceFactory.h"
#include "base/UniqueFd.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"

using namespace LibMediaPlayer;
namespace fs = std::filesystem;

namespace {

/** The longest that any open may take to be answered. */
constexpr Seconds kAnswerTime = 5.0_s;

/** A folder of its own, gone with the test. */
class Scratch {
public:
    Scratch() : mPath(fs::temp_directory_path() / "engine-test-XXXXXX") {
        std::string name = mPath;
        mPath = mkdtemp(name.data());
    }
    ~Scratch() { fs::remove_all(mPath); }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;

    [[nodiscard]] fs::path operator/(const fs::path& name) const { return mPath / name; }

private:
    fs::path mPath;
};

/** Opens what cannot be played, and then what can. */
void expectRefused(TestPlayer& player, const std::wstring& path, int result) {
    const auto begin = std::chrono::steady_clock::now();
    const auto opened = player.openText(path);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, kAnswerTime);
    EXPECT_EQ(opened.result, result);
    EXPECT_FALSE(opened.text.empty());
    EXPECT_EQ(player.awaitState(kFailed).param2, kNotReady);
    EXPECT_EQ(player.status().state, kFailed);
    EXPECT_EQ(player->play(), kWrongState);
    EXPECT_EQ(player.open(samplePath("film.mp4")).result, kOk) << "the next one opens";
}

struct BrokenFile {
    const char* name;
    int result;
};

void PrintTo(const BrokenFile& file, std::ostream* stream) {
    *stream << file.name;
}

class EveryBrokenFile : public testing::TestWithParam<BrokenFile> {};

} // namespace

TEST_P(EveryBrokenFile, IsRefusedWithItsReason) {
    TestPlayer player;
    expectRefused(player, samplePath(GetParam().name).wstring(), GetParam().result);
}

INSTANTIATE_TEST_SUITE_P(
    Player, EveryBrokenFile,
    testing::Values(BrokenFile{"no such file.mp4", kNotFound},
                    BrokenFile{"unfinished.mp4", kDamaged}, BrokenFile{"stub.mp4", kDamaged},
                    BrokenFile{"empty.mp4", kNotMedia}, BrokenFile{"text.txt", kNotMedia},
                    BrokenFile{"text.mp4", kNotMedia}, BrokenFile{"page.mp3", kNotMedia},
                    BrokenFile{"random.bin", kNotMedia}, BrokenFile{"zeros.avi", kNotMedia},
                    BrokenFile{"", kNotMedia}),
    [](const auto& instance) { return "file_" + testName(instance.param.name); });

TEST(Player, RefusesPipesDevicesAndSockets) {
    const Scratch scratch;
    const fs::path pipe = scratch / "pipe.mp4";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    const fs::path socketPath = scratch / "socket.mp4";
    const qns::UniqueFd socket(::socket(AF_UNIX, SOCK_STREAM, 0));
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    socketPath.native().copy(address.sun_path, sizeof(address.sun_path) - 1);
    ASSERT_EQ(bind(socket.get(), reinterpret_cast<sockaddr*>(&address), sizeof(address)), 0);

    TestPlayer player;
    for (const fs::path& path : {pipe, socketPath, fs::path("/dev/zero"), fs::path("/dev/null"),
                                 fs::path("/dev/full"), fs::path("/proc/self/mem")})
        expectRefused(player, path.wstring(), kNotMedia);
}

TEST(Player, RefusesWhatMayNotBeRead) {
    const Scratch scratch;
    const fs::path path = scratch / "secret.mp4";
    fs::copy(samplePath("film.mp4"), path);
    fs::permissions(path, fs::perms::none);
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    // The superuser may read anything, so be somebody else for as long as it takes.
    const bool isRoot = geteuid() == 0;
    if (isRoot) {
        fs::permissions(path.parent_path(), fs::perms::all);
        ASSERT_EQ(seteuid(65534), 0);
    }
    const auto opened = player.open(path);
    if (isRoot) {
        ASSERT_EQ(seteuid(0), 0);
    }
    EXPECT_EQ(opened.result, kAccessDenied);
    EXPECT_EQ(player.open(samplePath("film.mp4")).result, kOk);
}

TEST(Player, RefusesUrisThatLeadNowhere) {
    TestPlayer player;
    expectRefused(player, L"file:///no/such/file.mp4", kNotFound);
    for (const wchar_t* const uri :
         {L"nosuchscheme://host/film.mp4", L"http://127.0.0.1:9/x.mp4"}) {
        const auto begin = std::chrono::steady_clock::now();
        EXPECT_NE(player.openText(uri).result, kOk);
        EXPECT_LT(std::chrono::steady_clock::now() - begin, kAnswerTime);
    }
    EXPECT_EQ(player.open(samplePath("film.mp4")).result, kOk);
}

TEST(Player, PlaysAFileThatWasCutShortForAsLongAsItGoes) {
    TestPlayer player;
    for (const char* const name : {"shortened.mp4", "shortened.mkv"}) {
        EXPECT_EQ(player.open(samplePath(name)).result, kOk);
        player.play();
        player.awaitState(kEnded);
        EXPECT_EQ(player.pendingCount(kNotifyFailure), 0U);
    }
}

TEST(Player, OpensPathsOfAnyCharactersAndUris) {
    struct Name {
        const char* bytes;
        const wchar_t* text;
    };
    constexpr Name kNames[] = {
        {"a b.mp4", L"a b.mp4"},
        {"\xc3\xbc\xe2\x82\xac\xe4\xb8\xad\xf0\x9f\x98\x80.mp4",
         L"\u00fc\u20ac\u4e2d\U0001f600.mp4"},
        {"100%.mp4", L"100%.mp4"},
        {"%20#?&;'\".mp4", L"%20#?&;'\".mp4"},
        {"back\\slash.mp4", L"back\\slash.mp4"},
        {"-dash.mp4", L"-dash.mp4"},
    };
    const Scratch scratch;
    const std::wstring folder = (scratch / "").wstring();
    TestPlayer player;
    for (const Name& name : kNames) {
        fs::copy(samplePath("silent.mp4"), scratch / name.bytes);
        EXPECT_EQ(player.openText(folder + name.text).result, kOk) << name.bytes;
    }
    const std::wstring uri = L"file://" + folder + L"%C3%BC%E2%82%AC%E4%B8%AD%F0%9F%98%80.mp4";
    EXPECT_EQ(player.openText(uri).result, kOk);
}

TEST(Player, OpensFormatsThatAreNotInItsTable) {
    const Scratch scratch;
    const fs::path path = scratch / "theora.ogv";
    const std::string command = "ffmpeg -v error -nostdin -y -i '" +
                                samplePath("silent.mp4").string() + "' -c:v libtheora -t 1 '" +
                                path.string() + "'";
    ASSERT_EQ(std::system(command.c_str()), 0);
    TestPlayer player;
    EXPECT_EQ(player.open(path).result, kOk);
    EXPECT_EQ(player.seek(0.5_s).result, kOk);
    player.play();
    player.await(kNotifyEnd);
}

TEST(Player, WritesItsGraph) {
    const Scratch scratch;
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    const fs::path path = scratch / "graph.dot";
    EXPECT_EQ(player->dumpGraph(path.wstring()), kOk);
    player.seek(1.0_s); // orders are carried out one after the other
    std::stringstream graph;
    graph << std::ifstream(path).rdbuf();
    EXPECT_EQ(graph.str().rfind("digraph pipeline {", 0), 0U);
    EXPECT_NE(graph.str().find("qtdemux"), std::string::npos);
    EXPECT_NE(graph.str().find("video-sink"), std::string::npos);
    EXPECT_NE(graph.str().rfind("}\n"), std::string::npos);
    EXPECT_EQ(player->dumpGraph(L""), kWrongState);
    EXPECT_EQ(player->dumpGraph((scratch / "missing/graph.dot").wstring()), kNotFound);
}

TEST(Player, NotifiesNobodyAfterItWasClosed) {
    constexpr int kRounds = 200;
    std::mt19937 random(1);
    const std::vector<std::string> names = {"film.mp4", "sound.mp3", "film.webm", "text.txt",
                                            "picture.jpg"};
    TestPlayer player;
    for (int round = 0; round < kRounds; ++round) {
        const std::string& name = names[random() % names.size()];
        EXPECT_EQ(player->open(samplePath(name).wstring(), kDisplay60Hz), kOk);
        player->play();
        if (random() % 2 == 0)
            player->seek(toNanoseconds(1.0_s), static_cast<int>(random() % 3));
        // Some moment between ordered and playing.
        const auto until =
            std::chrono::steady_clock::now() + std::chrono::microseconds(random() % 8000);
        while (std::chrono::steady_clock::now() < until)
            std::this_thread::yield();
        EXPECT_EQ(player->close(), kOk);
        const std::size_t count = player.notifiedCount();
        EXPECT_EQ(player.status().state, kClosed);
        std::this_thread::yield();
        EXPECT_EQ(player.notifiedCount(), count);
    }
    EXPECT_EQ(player.open(samplePath("film.mp4")).result, kOk);
}

TEST(Player, CloseWaitsForANotificationThatIsBeingDelivered) {
    const std::unique_ptr<IMediaPlayer> player(InterfaceFactory::createPlayer(nullptr, 15));
    std::atomic<bool> entered{false};
    std::atomic<bool> left{false};
    player->setNotify([&](MediaPlayerNotify&) {
        if (entered.exchange(true))
            return;
        const auto until = std::chrono::steady_clock::now() + std::chrono::milliseconds(100);
        while (std::chrono::steady_clock::now() < until)
            std::this_thread::yield();
        left = true;
    });
    player->open(samplePath("sound.wav").wstring(), kDisplay60Hz);
    while (!entered)
        std::this_thread::yield();
    player->close();
    EXPECT_TRUE(left);
}

TEST(Player, SurvivesANotificationThatThrowsOrCloses) {
    const std::unique_ptr<IMediaPlayer> player(InterfaceFactory::createPlayer(nullptr, 15));
    std::atomic<int> count{0};
    player->setNotify([&](MediaPlayerNotify& notification) {
        ++count;
        if (notification.type == kNotifyOpened)
            throw 1;
        player->close();
    });
    player->open(samplePath("sound.wav").wstring(), kDisplay60Hz);
    while (count < 2)
        std::this_thread::yield();
}

TEST(Player, PlaysBesideOthers) {
    constexpr int kPlayers = 4;
    std::vector<std::unique_ptr<TestPlayer>> players;
    for (int index = 0; index < kPlayers; ++index) {
        players.push_back(std::make_unique<TestPlayer>());
        (*players.back())->open(samplePath("film.mp4").wstring(), kDisplay60Hz);
    }
    for (const auto& player : players) {
        EXPECT_EQ(player->await(kNotifyOpened).result, kOk);
        player->play();
    }
    for (const auto& player : players)
        player->awaitPosition(0.5_s);
}

TEST(Player, CanGoWhileItOpensOrPlays) {
    for (const char* const name : {"film.mp4", "random.bin", "film.flv"}) {
        TestPlayer opening;
        opening->open(samplePath(name).wstring(), kDisplay60Hz);
    }
    TestPlayer playing;
    playing.open(samplePath("film.mp4"));
    playing.play();
}

namespace {

/**
 * A source that hangs in its start for as long as a test wants, as a library can that waits for
 * a server. It serves URIs that begin with hang://.
 */
std::mutex gHangMutex;
std::condition_variable gHangChanged;
bool gHangs = false;
int gHanging = 0;

struct HangSource {
    GstPushSrc parent;
};
struct HangSourceClass {
    GstPushSrcClass parent;
};

gboolean hang(GstBaseSrc*) {
    std::unique_lock lock(gHangMutex);
    ++gHanging;
    gHangChanged.notify_all();
    gHangChanged.wait(lock, [] { return !gHangs; });
    --gHanging;
    gHangChanged.notify_all();
    return FALSE;
}

void initHangClass(gpointer type, gpointer) {
    static GstStaticPadTemplate pad =
        GST_STATIC_PAD_TEMPLATE("src", GST_PAD_SRC, GST_PAD_ALWAYS, GST_STATIC_CAPS_ANY);
    gst_element_class_add_static_pad_template(GST_ELEMENT_CLASS(type), &pad);
    gst_element_class_set_static_metadata(GST_ELEMENT_CLASS(type), "Hang", "Source", "Hangs",
                                          "Tests");
    GST_BASE_SRC_CLASS(type)->start = hang;
}

void initHangUris(gpointer type, gpointer) {
    auto* const interface = static_cast<GstURIHandlerInterface*>(type);
    interface->get_type = [](GType) { return GST_URI_SRC; };
    interface->get_protocols = [](GType) {
        static const char* const kProtocols[] = {"hang", nullptr};
        return kProtocols;
    };
    interface->get_uri = [](GstURIHandler*) { return g_strdup("hang://"); };
    interface->set_uri = [](GstURIHandler*, const char*, GError**) -> gboolean { return TRUE; };
}

void registerHangSource() {
    static std::once_flag once;
    std::call_once(once, [] {
        gst_init(nullptr, nullptr);
        GTypeInfo info{};
        info.class_size = sizeof(HangSourceClass);
        info.class_init = initHangClass;
        info.instance_size = sizeof(HangSource);
        const GType type =
            g_type_register_static(GST_TYPE_PUSH_SRC, "HangSource", &info, GTypeFlags{});
        const GInterfaceInfo uris{initHangUris, nullptr, nullptr};
        g_type_add_interface_static(type, GST_TYPE_URI_HANDLER, &uris);
        gst_element_register(nullptr, "hangsource", GST_RANK_PRIMARY, type);
    });
}

/** While it lives, opening hang:// hangs. */
class Hang {
public:
    Hang() {
        registerHangSource();
        const std::lock_guard lock(gHangMutex);
        gHangs = true;
    }
    ~Hang() {
        release();
        // The engine's thread comes back; let it, so that nothing is left at exit.
        std::unique_lock lock(gHangMutex);
        gHangChanged.wait(lock, [] { return gHanging == 0; });
    }
    Hang(const Hang&) = delete;
    Hang& operator=(const Hang&) = delete;

    static void await() {
        std::unique_lock lock(gHangMutex);
        gHangChanged.wait(lock, [] { return gHanging > 0; });
    }
    static void release() {
        const std::lock_guard lock(gHangMutex);
        gHangs = false;
        gHangChanged.notify_all();
    }
};

} // namespace

TEST(Hang, IsAnsweredInTimeAndTheNextMediumOpens) {
    const Hang hang;
    TestPlayer player;
    expectRefused(player, L"hang://", kTimedOut);
}

TEST(Hang, DoesNotKeepCloseAndTheNextOpen) {
    const Hang hang;
    TestPlayer player;
    player->open(L"hang://", kDisplay60Hz);
    Hang::await();
    const auto begin = std::chrono::steady_clock::now();
    player->close();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 1.0_s);
    EXPECT_EQ(player.open(samplePath("film.mp4")).result, kOk);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, kAnswerTime);
    player.play();
}

TEST(Hang, DoesNotKeepThePlayerFromGoing) {
    const Hang hang;
    const auto begin = std::chrono::steady_clock::now();
    {
        TestPlayer player;
        player->open(L"hang://", kDisplay60Hz);
        Hang::await();
    }
    EXPECT_LT(std::chrono::steady_clock::now() - begin, kAnswerTime);
}
