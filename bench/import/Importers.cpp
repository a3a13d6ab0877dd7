// SPDX-License-Identifier: MIT
#include "bench/import/Importers.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <chrono>
#include <cstdlib>
#include <fstream>
#include <stdexcept>
#include <sys/socket.h>
#include <thread>

#include "bench/ChildProcess.h"
#include "bench/Programs.h"
#include "bench/rpc/PacketSocket.h"
#include "bench/start/ProcessUse.h"
#include "qnsmedia/Connection.h"
#include "qnsmedia/Importer.h"

namespace bench {
namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;
using namespace std::chrono_literals;

constexpr auto kPatience = 300s;

/** Short against what is measured, long enough not to disturb it. */
constexpr auto kPause = 5ms;

double secondsSince(Clock::time_point begin) {
    return std::chrono::duration<double>(Clock::now() - begin).count();
}

template<typename Condition>
void awaitThat(Condition&& isTrue) {
    const auto deadline = Clock::now() + kPatience;
    while (!isTrue()) {
        if (Clock::now() > deadline)
            throw std::runtime_error("an import does not end");
        std::this_thread::sleep_for(kPause);
    }
}

int ask(const fs::path& database, const char* query) {
    SQLite::Database file(database.string(), SQLite::OPEN_READONLY, 1000);
    return file.execAndGet(query).getInt();
}

ChildProcess startDaemon(const fs::path& data) {
    ::setenv("QNS_HV_DATA", data.c_str(), 1);
    ChildProcess daemon = ChildProcess::run({programFolder() + "/QNSMediaService"});
    ::unsetenv("QNS_HV_DATA");
    connectTo(1008);
    return daemon;
}

/** A line-wise conversation with MPD. */
class MpdConnection {
public:
    MpdConnection() : mSocket(connectTo(6600)) { readReply(); }

    std::string ask(const std::string& command) {
        const std::string line = command + "\n";
        ::send(mSocket.get(), line.data(), line.size(), MSG_NOSIGNAL);
        return readReply();
    }

private:
    /** Up to the line that begins with OK. */
    std::string readReply() {
        std::string reply;
        char part[1024];
        while (reply.rfind("OK", 0) != 0 && reply.find("\nOK") == std::string::npos) {
            const ssize_t size = ::recv(mSocket.get(), part, sizeof part, 0);
            if (size <= 0)
                throw std::runtime_error("MPD has gone");
            reply.append(part, static_cast<std::size_t>(size));
        }
        return reply;
    }

    const qns::UniqueFd mSocket;
};

fs::path writeMpdConfiguration(const fs::path& scratch, const fs::path& music) {
    const fs::path file = scratch / "mpd.conf";
    std::ofstream(file) << "music_directory \"" << music.string() << "\"\n"
                        << "db_file \"" << (scratch / "mpd.db").string() << "\"\n"
                        << "bind_to_address \"127.0.0.1\"\nport \"6600\"\n"
                        << "audio_output {\n type \"null\"\n name \"null\"\n}\n";
    return file;
}

fs::path writeMinidlnaConfiguration(const fs::path& scratch, const fs::path& media) {
    const fs::path file = scratch / "minidlna.conf";
    std::ofstream(file) << "media_dir=A," << media.string() << "\n"
                        << "db_dir=" << scratch.string() << "\n"
                        << "log_dir=" << scratch.string() << "\n"
                        << "network_interface=lo\nport=8200\ninotify=no\n";
    return file;
}

int numberBehind(const std::string& text, const std::string& word) {
    const std::size_t at = text.find(word);
    return at == std::string::npos ? 0 : std::atoi(text.c_str() + at + word.size());
}

bool logSays(const fs::path& log, const std::string& words) {
    std::ifstream file(log);
    for (std::string line; std::getline(file, line);) {
        if (line.find(words) != std::string::npos)
            return true;
    }
    return false;
}

} // namespace

ImportFigures importByDaemon(const Collection& collection, const fs::path& scratch) {
    const fs::path database = scratch / "mediaplayer/media.db";
    const ChildProcess daemon = startDaemon(scratch);
    qnsmedia::Connection connection;
    qnsmedia::Importer importer(connection);
    ImportFigures figures;
    const auto begin = Clock::now();
    for (const std::string& file : collection.files)
        importer.importFile(file).get();
    awaitThat([&] { return importer.status().get().state == qnsmedia::ImporterState::idle; });
    figures.seconds = secondsSince(begin);
    awaitThat(
        [&] { return ask(database, "SELECT count(*) FROM media WHERE thumbnail_tries > 0") == 0; });
    if (ask(database, "SELECT count(*) FROM thumbnail") > 0)
        figures.secondsWithThumbnails = secondsSince(begin);
    figures.known = ask(database, "SELECT count(*) FROM media");
    figures.peakMegabytes = readPeakMegabytes(daemon.pid());
    return figures;
}

ImportFigures importByMpd(const Collection& collection, const fs::path& scratch) {
    const ChildProcess mpd = ChildProcess::run(
        {"mpd", "--no-daemon", writeMpdConfiguration(scratch, collection.folder).string()});
    MpdConnection connection;
    ImportFigures figures;
    const auto begin = Clock::now();
    connection.ask("update");
    awaitThat([&] { return connection.ask("status").find("updating_db") == std::string::npos; });
    figures.seconds = secondsSince(begin);
    figures.known = numberBehind(connection.ask("stats"), "songs: ");
    figures.peakMegabytes = readPeakMegabytes(mpd.pid());
    return figures;
}

ImportFigures importByMinidlna(const Collection& collection, const fs::path& scratch) {
    const fs::path configuration = writeMinidlnaConfiguration(scratch, collection.folder);
    ImportFigures figures;
    const auto begin = Clock::now();
    const ChildProcess minidlna = ChildProcess::run(
        {"minidlnad", "-S", "-f", configuration.string(), "-P", (scratch / "pid").string()});
    awaitThat([&] {
        figures.peakMegabytes = std::max(figures.peakMegabytes, readPeakMegabytes(minidlna.pid()));
        return logSays(scratch / "minidlna.log", " finished (");
    });
    figures.seconds = secondsSince(begin);
    figures.known = ask(scratch / "files.db", "SELECT count(*) FROM DETAILS WHERE PATH IS NOT NULL"
                                              " AND SIZE > 0");
    return figures;
}

} // namespace bench
