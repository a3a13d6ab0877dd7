// SPDX-License-Identifier: MIT
#include "bench/ChildProcess.h"

#include <csignal>
#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

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

void ChildProcess::waitForEnd() {
    ::waitpid(std::exchange(mPid, -1), nullptr, 0);
}

ChildProcess::~ChildProcess() {
    if (mPid <= 0)
        return;
    ::kill(mPid, SIGTERM);
    ::waitpid(mPid, nullptr, 0);
}

} // namespace bench
