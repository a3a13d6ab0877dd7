// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DaemonProcess.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <poll.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

namespace {

using StringList = std::vector<std::string>;

struct Pipe {
    qns::UniqueFd read;
    qns::UniqueFd write;
};

Pipe makePipe() {
    std::array<int, 2> ends{-1, -1};
    if (::pipe2(ends.data(), O_CLOEXEC) != 0)
        ADD_FAILURE() << "pipe: " << std::strerror(errno);
    return {qns::UniqueFd(ends[0]), qns::UniqueFd(ends[1])};
}

void fill(int pipe) {
    ::fcntl(pipe, F_SETFL, O_NONBLOCK);
    const std::string block(4096, '.');
    while (::write(pipe, block.data(), block.size()) > 0) {
    }
    while (::write(pipe, ".", 1) > 0) {
    }
    ::fcntl(pipe, F_SETFL, 0);
}

StringList environmentFor(const DaemonOptions& options) {
    std::map<std::string, std::string> variables;
    for (char** entry = environ; *entry != nullptr; ++entry) {
        const std::string text = *entry;
        const auto equals = text.find('=');
        variables[text.substr(0, equals)] = text.substr(equals + 1);
    }
    for (const auto& [name, value] : options.environment) {
        if (value)
            variables[name] = *value;
        else
            variables.erase(name);
    }
    StringList list;
    for (const auto& [name, value] : variables)
        list.push_back(name + '=' + value);
    return list;
}

/** The daemon ends with the thread that started it, whatever happens to the test. */
StringList commandFor(const DaemonOptions& options) {
    StringList command{"setpriv", "--pdeathsig", "KILL"};
    command.insert(command.end(), options.privileges.begin(), options.privileges.end());
    command.insert(command.end(), {"--", options.program});
    command.insert(command.end(), options.arguments.begin(), options.arguments.end());
    return command;
}

std::vector<char*> pointers(StringList& list) {
    std::vector<char*> result;
    std::transform(list.begin(), list.end(), std::back_inserter(result),
                   [](std::string& text) { return text.data(); });
    result.push_back(nullptr);
    return result;
}

/** What becomes of descriptors 0 to 2 in the new process. */
class FileActions {
public:
    FileActions() { ::posix_spawn_file_actions_init(&mActions); }
    ~FileActions() { ::posix_spawn_file_actions_destroy(&mActions); }
    FileActions(const FileActions&) = delete;
    FileActions& operator=(const FileActions&) = delete;

    void replace(int standard, int fd) {
        ::posix_spawn_file_actions_adddup2(&mActions, fd, standard);
    }
    void discard(int standard) {
        ::posix_spawn_file_actions_addopen(&mActions, standard, "/dev/null", O_WRONLY, 0);
    }
    void closeAll() {
        for (const int fd : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO})
            ::posix_spawn_file_actions_addclose(&mActions, fd);
    }
    [[nodiscard]] const posix_spawn_file_actions_t* get() const { return &mActions; }

private:
    posix_spawn_file_actions_t mActions{};
};

pid_t spawn(const DaemonOptions& options, const FileActions& files) {
    const rlimit noCore{0, 0};
    ::setrlimit(RLIMIT_CORE, &noCore);
    auto command = commandFor(options);
    auto environment = environmentFor(options);
    pid_t pid = -1;
    const int error = ::posix_spawnp(&pid, "setpriv", files.get(), nullptr,
                                     pointers(command).data(), pointers(environment).data());
    if (error != 0)
        ADD_FAILURE() << "Cannot start the daemon: " << std::strerror(error);
    return pid;
}

std::size_t entries(pid_t pid, const char* folder) {
    std::error_code error;
    const std::filesystem::directory_iterator all("/proc/" + std::to_string(pid) + '/' + folder,
                                                  error);
    return static_cast<std::size_t>(std::distance(begin(all), end(all)));
}

std::size_t children(pid_t pid) {
    std::size_t count = 0;
    std::error_code error;
    const std::string threads = "/proc/" + std::to_string(pid) + "/task";
    for (const auto& thread : std::filesystem::directory_iterator(threads, error)) {
        std::ifstream ids(thread.path() / "children");
        count += static_cast<std::size_t>(
            std::distance(std::istream_iterator<pid_t>(ids), std::istream_iterator<pid_t>()));
    }
    return count;
}

int shellStatus(int status) {
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

/** Nothing tells when another process closes a descriptor: the only thing to do is to look. */
template<typename Condition>
bool lookUntil(Condition condition) {
    const auto deadline = patience::deadline();
    while (!condition()) {
        if (patience::Clock::now() > deadline)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
}

} // namespace

DaemonProcess::DaemonProcess(const DaemonOptions& options) {
    auto pipe = makePipe();
    Pipe fullPipe;
    FileActions files;
    if (options.output == DaemonOptions::Output::closed) {
        files.closeAll();
    } else {
        files.replace(STDOUT_FILENO, pipe.write.get());
        files.replace(STDERR_FILENO, pipe.write.get());
    }
    if (options.output == DaemonOptions::Output::fullPipe) {
        fullPipe = makePipe();
        fill(fullPipe.write.get());
        files.replace(STDOUT_FILENO, fullPipe.write.get());
    }
    if (options.output == DaemonOptions::Output::discarded)
        files.discard(STDOUT_FILENO);
    mPid = spawn(options, files);
    mFullPipe = std::move(fullPipe.read);
    mRead = std::move(pipe.read);
    ::fcntl(mRead.get(), F_SETFL, O_NONBLOCK);
    mReader = std::thread(&DaemonProcess::readLoop, this);
}

DaemonProcess::~DaemonProcess() {
    if (!mStatus && mPid > 0) {
        ::kill(mPid, SIGKILL);
        waitForExit();
    }
    if (mReader.joinable())
        mReader.join();
    checkOutput();
}

void DaemonProcess::signal(int number) {
    mLastSignal = number;
    EXPECT_EQ(::kill(mPid, number), 0) << std::strerror(errno);
}

void DaemonProcess::signalEachThread(int number) const {
    const std::filesystem::path tasks = "/proc/" + std::to_string(mPid) + "/task";
    for (const auto& task : std::filesystem::directory_iterator(tasks))
        ::syscall(SYS_tgkill, mPid, std::stoi(task.path().filename().string()), number);
}

/**
 * The thread sanitizer keeps a signal that arrives between two system calls until the second one
 * returns, which may be never: another signal ends that call.
 */
bool DaemonProcess::endsBefore(patience::Clock::time_point deadline, int process) const {
    pollfd poll{process, POLLIN, 0};
#ifdef __SANITIZE_THREAD__
    constexpr std::chrono::milliseconds kRepeatAfter{1000};
    const bool repeats = mLastSignal == SIGTERM || mLastSignal == SIGINT;
    while (repeats && patience::Clock::now() + kRepeatAfter < deadline) {
        if (::poll(&poll, 1, static_cast<int>(kRepeatAfter.count())) == 1)
            return true;
        ::kill(mPid, mLastSignal);
    }
#endif
    return ::poll(&poll, 1, patience::pollTimeout(deadline)) == 1;
}

int DaemonProcess::waitForExit() {
    const int status = waitForEnd();
    mOutput.waitForEnd();
    return status;
}

int DaemonProcess::waitForEnd() {
    if (mStatus)
        return *mStatus;
    if (mPid <= 0)
        return -1;
    const qns::UniqueFd process(static_cast<int>(::syscall(SYS_pidfd_open, mPid, 0)));
    if (!endsBefore(patience::deadline(), process.get())) {
        ADD_FAILURE() << "The daemon does not end.";
        ::kill(mPid, SIGKILL);
    }
    int status = 0;
    ::waitpid(mPid, &status, 0);
    mStatus = shellStatus(status);
    return *mStatus;
}

int DaemonProcess::terminate() {
    signal(SIGTERM);
    return waitForExit();
}

bool DaemonProcess::isRunning() {
    if (mStatus)
        return false;
    siginfo_t info{};
    ::waitid(P_PID, static_cast<id_t>(mPid), &info, WEXITED | WNOHANG | WNOWAIT);
    return info.si_pid == 0;
}

std::size_t DaemonProcess::descriptorCount() const {
    return entries(mPid, "fd") - children(mPid);
}

std::size_t DaemonProcess::threadCount() const {
    return entries(mPid, "task");
}

std::size_t DaemonProcess::residentBytes() const {
    std::ifstream pages("/proc/" + std::to_string(mPid) + "/statm");
    std::size_t all = 0;
    std::size_t resident = 0;
    pages >> all >> resident;
    return resident * static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
}

bool DaemonProcess::waitForResources(std::size_t descriptors, std::size_t threads) const {
    return lookUntil([&] { return descriptorCount() <= descriptors && threadCount() <= threads; });
}

void DaemonProcess::limitFreeDescriptors(std::size_t count) const {
    // The limit is one of numbers, and a new descriptor gets the lowest that is free.
    const std::filesystem::path open = "/proc/" + std::to_string(mPid) + "/fd";
    rlim_t number = 0;
    for (std::size_t left = count;
         left > 0 || exists(symlink_status(open / std::to_string(number))); ++number)
        if (!exists(symlink_status(open / std::to_string(number))))
            --left;
    rlimit limit{};
    ::prlimit(mPid, RLIMIT_NOFILE, nullptr, &limit);
    limit.rlim_cur = number;
    EXPECT_EQ(::prlimit(mPid, RLIMIT_NOFILE, &limit, nullptr), 0) << std::strerror(errno);
}

const Lines& DaemonProcess::output() {
    readAvailable();
    return mOutput;
}

void DaemonProcess::readLoop() {
    pollfd poll{mRead.get(), POLLIN, 0};
    do {
        ::poll(&poll, 1, -1);
    } while (readAvailable());
    if (!mPending.empty())
        mOutput.add(mPending);
    mOutput.close();
}

/** False when the process has closed its output. */
bool DaemonProcess::readAvailable() {
    const std::lock_guard lock(mReadMutex);
    std::array<char, 4096> buffer{};
    ssize_t length = 0;
    while ((length = ::read(mRead.get(), buffer.data(), buffer.size())) > 0) {
        mPending.append(buffer.data(), static_cast<std::size_t>(length));
        for (auto end = mPending.find('\n'); end != std::string::npos; end = mPending.find('\n')) {
            mOutput.add(mPending.substr(0, end));
            mPending.erase(0, end + 1);
        }
    }
    return length != 0;
}

void DaemonProcess::checkOutput() const {
    for (const char* report : {"Sanitizer", "runtime error:"})
        EXPECT_TRUE(mOutput.with(report).empty()) << mOutput.joined();
}
