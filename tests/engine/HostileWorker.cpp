// SPDX-License-Identifier: MIT
// The engine's worker as it is, but that it does what some files say: what a file made to break
// a decoder would have it do.
#include <array>
#include <cerrno>
#include <csignal>
#include <fcntl.h>
#include <memory>
#include <string>
#include <sys/mman.h>
#include <sys/socket.h>
#include <unistd.h>
#include <vector>

#include "LibMediaPlayer/Result.h"
#include "discoverer/Details.h"
#include "worker/Answers.h"
#include "worker/Message.h"
#include "worker/Program.h"

namespace {

using Files = std::vector<qns::UniqueFd>;

std::string orderIn(const Files& files) {
    constexpr std::string_view kMark = "hostile: ";
    std::array<char, 64> head{};
    const ssize_t size = files.empty() ? 0 : ::pread(files[0].get(), head.data(), head.size(), 0);
    const std::string text(head.data(), static_cast<std::size_t>(size < 0 ? 0 : size));
    return text.substr(0, kMark.size()) == kMark ? text.substr(kMark.size()) : "";
}

[[noreturn]] void crash() {
    __builtin_trap();
}

[[noreturn]] void hang() {
    for (volatile int turn = 0;; turn = 1 - turn) {
    }
}

/** Until the system refuses, which libraries survive as well as they can. */
std::string bloat() {
    constexpr std::size_t kStep = 16 * 1024 * 1024;
    constexpr std::size_t kMost = 256; // four gigabytes, where nothing bounds them
    std::vector<std::unique_ptr<char[]>> memory;
    while (memory.size() < kMost) {
        memory.emplace_back(new char[kStep]);
        memory.back()[kStep / 2] = 'x';
    }
    return {};
}

/** Says that it is fine and that there are more streams than there is room for. */
std::string lie() {
    int result = LibMediaPlayer::kOk;
    discoverer::Details details;
    details.info.audioCount = 1000;
    worker::MessageWriter message;
    message(result, details);
    return message.bytes();
}

/** Says more than a client could be told. */
std::string boast() {
    constexpr std::size_t kLength = 25'000;
    int result = LibMediaPlayer::kOk;
    discoverer::Details details;
    details.info.system.tags.assign(kLength, L'x');
    worker::MessageWriter message;
    message(result, details);
    return message.bytes();
}

bool isForbidden(long outcome) {
    return outcome < 0 && errno == EPERM;
}

/** What a file that has taken over its worker would try; the names of what was possible. */
std::string breakOut() {
    std::string possible;
    const auto attempt = [&](const char* name, bool failed) {
        possible += failed ? "" : std::string(name) + " ";
    };
    attempt("open", isForbidden(::open("/etc/hostname", O_RDONLY)));
    attempt("write", isForbidden(::open("/tmp/broken-out", O_WRONLY | O_CREAT, 0600)));
    attempt("unlink", isForbidden(::unlink("/tmp/broken-out")));
    attempt("connect", isForbidden(::socket(AF_INET, SOCK_STREAM, 0)));
    attempt("fork", isForbidden(::fork()));
    attempt("exec", isForbidden(::execl("/bin/true", "true", nullptr)));
    attempt("kill", isForbidden(::kill(::getppid(), 0)));
    attempt("run", ::mmap(nullptr, 4096, PROT_READ | PROT_WRITE | PROT_EXEC,
                          MAP_PRIVATE | MAP_ANONYMOUS, -1, 0) == MAP_FAILED);
    return possible;
}

std::string tellDetails(const std::string& text) {
    int result = LibMediaPlayer::kOk;
    discoverer::Details details;
    details.info.system.mediaType = text;
    worker::MessageWriter message;
    message(result, details);
    return message.bytes();
}

std::string answer(worker::Request& request, Files files) {
    const std::string order = orderIn(files);
    if (order == "crash")
        crash();
    if (order == "leave")
        ::_exit(0);
    if (order == "hang")
        hang();
    if (order == "bloat")
        return bloat();
    if (order == "lie")
        return lie();
    if (order == "boast")
        return boast();
    if (order == "babble")
        return std::string(1000, '\x7f');
    if (order == "break out")
        return tellDetails("possible: " + breakOut());
    if (order == "count")
        return tellDetails(std::to_string(::getpid()));
    return worker::answerWithLibav(request, std::move(files));
}

} // namespace

int main(int argc, char** argv) {
    return worker::run(argc, argv, answer);
}
