// SPDX-License-Identifier: MIT
#include "bench/ChildProcess.h"

#include <csignal>
#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/UniqueFd.h"

namespace bench {

ChildProcess ChildProcess::call(const std::function<void()>& body) {
    const pid_t pid = ::fork();
    if (pid == 0) {
        ::prctl(PR_SET_PDEATHSIG, SIGKILL);
        body();
        ::_exit(0);
    }
    return ChildProcess(pid);
}

ChildProcess ChildProcess::run(const std::vector<std::string>& command, int outputFd) {
    return call([&] {
        std::vector<char*> arguments;
        for (const std::string& argument : command)
            arguments.push_back(const_cast<char*>(argument.c_str()));
        arguments.push_back(nullptr);
        const int output = outputFd >= 0 ? outputFd : ::open("/dev/null", O_WRONLY);
        ::dup2(output, STDOUT_FILENO);
        ::execvp(arguments[0], arguments.data());
        ::_exit(127);
    });
}

int ChildProcess::waitForEnd() {
    int status = 0;
    ::waitpid(std::exchange(mPid, -1), &status, 0);
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

ChildProcess::~ChildProcess() {
    if (mPid <= 0)
        return;
    ::kill(mPid, SIGTERM);
    ::waitpid(mPid, nullptr, 0);
}

Finished runToEnd(const std::vector<std::string>& command) {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0)
        return {127, {}};
    const qns::UniqueFd readEnd(ends[0]);
    qns::UniqueFd writeEnd(ends[1]);
    ChildProcess child = ChildProcess::run(command, writeEnd.get());
    writeEnd.reset();
    Finished finished;
    char part[4096];
    for (ssize_t size = 0; (size = ::read(readEnd.get(), part, sizeof part)) > 0;)
        finished.output.append(part, static_cast<std::size_t>(size));
    finished.status = child.waitForEnd();
    return finished;
}

} // namespace bench
