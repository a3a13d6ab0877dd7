// SPDX-License-Identifier: MIT
#include "worker/Sandbox.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <seccomp.h>
#include <string_view>
#include <sys/mman.h>
#include <sys/resource.h>
#include <unistd.h>

#include "base/UniqueFd.h"

namespace worker {

namespace {

/** The sanitizers map all of memory, and make calls of their own. */
#ifdef QNS_SANITIZED
constexpr bool kNeedsEverything = true;
#else
constexpr bool kNeedsEverything = false;
#endif

/** The largest picture with what its decoder keeps, twice over. */
constexpr rlim_t kMemory = 1536UL * 1024 * 1024;

/** The largest picture as bare pixels is half of it. */
constexpr rlim_t kOutput = 256UL * 1024 * 1024;

/** Standard streams, the socket, what comes through it, and some to spare. */
constexpr rlim_t kDescriptors = 16;

void limit(__rlimit_resource resource, rlim_t most) {
    const rlimit both{most, most};
    ::setrlimit(resource, &both);
}

rlim_t halfOfMemory() {
    return static_cast<rlim_t>(::sysconf(_SC_PHYS_PAGES)) / 2 *
           static_cast<rlim_t>(::sysconf(_SC_PAGESIZE));
}

void limitResources() {
    limit(RLIMIT_CORE, 0);
    limit(RLIMIT_FSIZE, kOutput);
    limit(RLIMIT_NOFILE, kDescriptors);
    limit(RLIMIT_DATA, std::min(kMemory, halfOfMemory()));
}

void dieFirst() {
    constexpr std::string_view kFirst = "1000";
    const qns::UniqueFd score(::open("/proc/self/oom_score_adj", O_WRONLY | O_CLOEXEC));
    [[maybe_unused]] const ssize_t written = ::write(score.get(), kFirst.data(), kFirst.size());
}

constexpr int kAllowed[] = {
    // The socket, and the files that come through it.
    SCMP_SYS(recvmsg), SCMP_SYS(sendmsg), SCMP_SYS(recvfrom), SCMP_SYS(pread64), SCMP_SYS(read),
    SCMP_SYS(write), SCMP_SYS(writev), SCMP_SYS(lseek), SCMP_SYS(fstat), SCMP_SYS(newfstatat),
    SCMP_SYS(close),
    // Memory.
    SCMP_SYS(brk), SCMP_SYS(munmap), SCMP_SYS(mremap), SCMP_SYS(madvise),
    // The C library's own: locks, time, random numbers, what an ending process does.
    SCMP_SYS(futex), SCMP_SYS(clock_gettime), SCMP_SYS(gettimeofday), SCMP_SYS(getrandom),
    SCMP_SYS(alarm), SCMP_SYS(setitimer), SCMP_SYS(restart_syscall), SCMP_SYS(sched_getaffinity),
    SCMP_SYS(getpid), SCMP_SYS(gettid), SCMP_SYS(rt_sigaction), SCMP_SYS(rt_sigprocmask),
    SCMP_SYS(rt_sigreturn), SCMP_SYS(tgkill), SCMP_SYS(exit), SCMP_SYS(exit_group)};

/** Memory, but none that can be run. */
void allowMappings(scmp_filter_ctx filter) {
    constexpr unsigned int kProtection = 2;
    const scmp_arg_cmp notToRun{kProtection, SCMP_CMP_MASKED_EQ, PROT_EXEC, 0};
    ::seccomp_rule_add(filter, SCMP_ACT_ALLOW, SCMP_SYS(mmap), 1, notToRun);
    ::seccomp_rule_add(filter, SCMP_ACT_ALLOW, SCMP_SYS(mprotect), 1, notToRun);
}

/** Anything else fails as if it were forbidden, which libraries expect rather than an end. */
void filterSystemCalls() {
    const scmp_filter_ctx filter = ::seccomp_init(SCMP_ACT_ERRNO(EPERM));
    if (!filter)
        return;
    for (const int call : kAllowed)
        ::seccomp_rule_add(filter, SCMP_ACT_ALLOW, call, 0);
    allowMappings(filter);
    ::seccomp_load(filter);
    ::seccomp_release(filter);
}

} // namespace

void enterSandbox() {
    dieFirst();
    if (kNeedsEverything)
        return;
    limitResources();
    filterSystemCalls();
}

} // namespace worker
