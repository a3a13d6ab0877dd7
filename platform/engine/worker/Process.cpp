// SPDX-License-Identifier: MIT
#include "worker/Process.h"

#include <cerrno>
#include <csignal>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

#include "worker/Channel.h"
#include "worker/Server.h"

namespace worker {

using std::chrono::steady_clock;

namespace {

class SpawnActions {
public:
    /** The worker gets its socket and standard error, and nothing else. */
    explicit SpawnActions(int socket) {
        ::posix_spawn_file_actions_init(&mActions);
        ::posix_spawn_file_actions_addopen(&mActions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
        ::posix_spawn_file_actions_addopen(&mActions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
        ::posix_spawn_file_actions_adddup2(&mActions, socket, kServerSocket);
        ::posix_spawn_file_actions_addclosefrom_np(&mActions, kServerSocket + 1);
    }
    ~SpawnActions() { ::posix_spawn_file_actions_destroy(&mActions); }
    SpawnActions(const SpawnActions&) = delete;
    SpawnActions& operator=(const SpawnActions&) = delete;

    [[nodiscard]] const posix_spawn_file_actions_t* get() const { return &mActions; }

private:
    posix_spawn_file_actions_t mActions{};
};

class SpawnAttributes {
public:
    /** Signals as a new program has them, and none of those that a terminal sends to its group. */
    SpawnAttributes() {
        sigset_t all;
        sigset_t none;
        ::sigfillset(&all);
        ::sigemptyset(&none);
        ::posix_spawnattr_init(&mAttributes);
        ::posix_spawnattr_setsigdefault(&mAttributes, &all);
        ::posix_spawnattr_setsigmask(&mAttributes, &none);
        ::posix_spawnattr_setpgroup(&mAttributes, 0);
        ::posix_spawnattr_setflags(&mAttributes, POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETSIGMASK |
                                                     POSIX_SPAWN_SETPGROUP);
    }
    ~SpawnAttributes() { ::posix_spawnattr_destroy(&mAttributes); }
    SpawnAttributes(const SpawnAttributes&) = delete;
    SpawnAttributes& operator=(const SpawnAttributes&) = delete;

    [[nodiscard]] const posix_spawnattr_t* get() const { return &mAttributes; }

private:
    posix_spawnattr_t mAttributes{};
};

std::string describe(int status) {
    if (WIFSIGNALED(status))
        return "was killed by signal " + std::to_string(WTERMSIG(status));
    return "ended with status " + std::to_string(WEXITSTATUS(status));
}

} // namespace

std::unique_ptr<Process> Process::start(const std::string& program, const char* option) {
    int ends[2];
    if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0, ends) != 0)
        return nullptr;
    qns::UniqueFd ours(ends[0]);
    const qns::UniqueFd theirs(ends[1]);
    char* arguments[] = {const_cast<char*>(program.c_str()), const_cast<char*>(option), nullptr};
    pid_t pid = 0;
    const SpawnActions actions(theirs.get());
    const SpawnAttributes attributes;
    errno =
        ::posix_spawn(&pid, program.c_str(), actions.get(), attributes.get(), arguments, environ);
    return errno == 0 ? std::unique_ptr<Process>(new Process(pid, std::move(ours))) : nullptr;
}

Process::Process(pid_t pid, qns::UniqueFd socket) : mPid(pid), mSocket(std::move(socket)) {}

Process::~Process() {
    end();
}

Process::Answer Process::ask(std::string_view request, const std::vector<int>& files,
                             Patience patience) {
    if (const Outcome outcome = awaitReady(patience.start); outcome != Outcome::kAnswered)
        return {outcome, {}};
    const auto deadline = steady_clock::now() + patience.answer;
    if (!send(mSocket.get(), request, files))
        return {Outcome::kEnded, {}};
    if (!awaitParcel(mSocket.get(), deadline))
        return {Outcome::kTimedOut, {}};
    auto parcel = receive(mSocket.get());
    if (!parcel)
        return {Outcome::kEnded, {}};
    return {Outcome::kAnswered, std::move(parcel->bytes)};
}

/** Its first message says that it has begun, and has given up its rights. */
Process::Outcome Process::awaitReady(std::chrono::milliseconds time) {
    if (mReady)
        return Outcome::kAnswered;
    if (!awaitParcel(mSocket.get(), steady_clock::now() + time))
        return Outcome::kStarting;
    mReady = receive(mSocket.get()).has_value();
    return mReady ? Outcome::kAnswered : Outcome::kNotStarted;
}

void Process::hangUp() const {
    ::shutdown(mSocket.get(), SHUT_RDWR);
}

bool Process::isIdle() const {
    pollfd event{mSocket.get(), POLLIN, 0};
    // Before its first message has been taken, that may have come.
    return ::poll(&event, 1, 0) == 0 || (!mReady && (event.revents & POLLHUP) == 0);
}

std::string Process::end() {
    if (mPid == 0)
        return {};
    // One that has ended by itself keeps its own reason.
    ::kill(mPid, SIGKILL);
    int status = 0;
    while (::waitpid(mPid, &status, 0) < 0 && errno == EINTR) {
    }
    mPid = 0;
    return describe(status);
}

} // namespace worker
