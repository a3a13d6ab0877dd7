// SPDX-License-Identifier: MIT
// Becomes another program that can make the system calls of a systemd unit, and no others: what
// SystemCallFilter, RestrictAddressFamilies, MemoryDenyWriteExecute and RestrictNamespaces say,
// built as systemd builds it. A forbidden call fails with EPERM.
// usage: confine UNIT PROGRAM [ARGUMENT...]
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <sched.h>
#include <seccomp.h>
#include <set>
#include <sstream>
#include <string>
#include <sys/mman.h>
#include <sys/shm.h>
#include <sys/socket.h>
#include <unistd.h>

namespace {

using Names = std::set<std::string>;

[[noreturn]] void fail(const std::string& what) {
    std::fprintf(stderr, "confine: %s\n", what.c_str());
    std::exit(EXIT_FAILURE);
}

std::string outputOf(const std::string& command) {
    std::FILE* pipe = ::popen(command.c_str(), "r");
    std::string output;
    std::array<char, 4096> block{};
    while (const std::size_t size = std::fread(block.data(), 1, block.size(), pipe))
        output.append(block.data(), size);
    if (::pclose(pipe) != 0)
        fail(command);
    return output;
}

/** Adds a system call, or all of a group of systemd's, whose name begins with @. */
void expand(const std::string& word, Names& names) {
    if (word.front() != '@') {
        names.insert(word);
        return;
    }
    std::istringstream lines(outputOf("systemd-analyze --no-pager syscall-filter " + word));
    std::string member;
    std::getline(lines, member); // the group's own name
    for (std::string line; std::getline(lines, line);)
        if (std::istringstream(line) >> member && member.front() != '#')
            expand(member, names);
}

Names expandAll(const std::string& words) {
    Names names;
    std::istringstream stream(words);
    for (std::string word; stream >> word;)
        expand(word, names);
    return names;
}

/** The unit's settings that restrict system calls. */
struct Restrictions {
    Names calls;
    std::string families;
};

Restrictions read(const char* unit) {
    Restrictions result;
    result.calls = expandAll("@default");
    std::ifstream file(unit);
    for (std::string line; std::getline(file, line);) {
        const std::size_t equals = line.find('=');
        const std::string name = line.substr(0, equals);
        const std::string value = equals == std::string::npos ? "" : line.substr(equals + 1);
        if (name == "RestrictAddressFamilies")
            result.families = value;
        else if (name == "SystemCallFilter" && value.front() == '~')
            for (const std::string& call : expandAll(value.substr(1)))
                result.calls.erase(call);
        else if (name == "SystemCallFilter")
            result.calls.merge(expandAll(value));
    }
    return result;
}

/** Only when these bits of an argument are as in `value`. */
scmp_arg_cmp when(unsigned argument, std::uint32_t bits, std::uint32_t value) {
    return {argument, SCMP_CMP_MASKED_EQ, bits, value};
}

class Filter {
public:
    Filter() : mpContext(::seccomp_init(SCMP_ACT_ERRNO(EPERM))) {}

    template<typename... Condition>
    void allow(const std::string& call, Condition... condition) {
        add(SCMP_ACT_ALLOW, call, condition...);
    }

    /** Says that the kernel has no such call, so that another one is tried. */
    void deny(const std::string& call) { add(SCMP_ACT_ERRNO(ENOSYS), call); }

    void load() const {
        if (::seccomp_load(mpContext) != 0)
            fail("cannot load the filter");
    }

private:
    template<typename... Condition>
    void add(std::uint32_t action, const std::string& call, Condition... condition) {
        const int number = ::seccomp_syscall_resolve_name(call.c_str());
        // Below zero are those that this kind of machine does not have.
        if (number >= 0 &&
            ::seccomp_rule_add(mpContext, action, number, sizeof...(condition), condition...) != 0)
            fail("no rule for " + call);
    }

    scmp_filter_ctx mpContext; ///< for the rest of the process
};

int family(const std::string& name) {
    static constexpr struct {
        const char* name;
        int number;
    } kFamilies[] = {{"AF_INET", AF_INET}, {"AF_NETLINK", AF_NETLINK}, {"AF_UNIX", AF_UNIX}};
    for (const auto& known : kFamilies)
        if (name == known.name)
            return known.number;
    fail("unknown family " + name);
}

void allowFamilies(Filter& filter, const std::string& names) {
    std::istringstream stream(names);
    for (std::string name; stream >> name;)
        filter.allow("socket", when(0, ~0U, static_cast<unsigned>(family(name))));
}

/** Memory can be written or executed, but not both, nor one after the other. */
void allowMemory(Filter& filter) {
    constexpr unsigned kBoth = PROT_WRITE | PROT_EXEC;
    for (const unsigned protection : {PROT_NONE, PROT_WRITE, PROT_EXEC})
        filter.allow("mmap", when(2, kBoth, protection));
    filter.allow("mprotect", when(2, PROT_EXEC, 0));
    filter.allow("shmat", when(2, SHM_EXEC, 0));
}

void allowThreads(Filter& filter) {
    constexpr unsigned kNamespaces = CLONE_NEWCGROUP | CLONE_NEWIPC | CLONE_NEWNET | CLONE_NEWNS |
                                     CLONE_NEWPID | CLONE_NEWUSER | CLONE_NEWUTS;
    filter.allow("clone", when(0, kNamespaces, 0));
    filter.deny("clone3"); // its flags lie where a filter cannot look
}

void confine(const Restrictions& restrictions) {
    static const Names kWithConditions = {"clone", "clone3", "mmap",   "mprotect", "pkey_mprotect",
                                          "setns", "shmat",  "socket", "unshare"};
    Filter filter;
    for (const std::string& call : restrictions.calls)
        if (kWithConditions.count(call) == 0)
            filter.allow(call);
    allowFamilies(filter, restrictions.families);
    allowMemory(filter);
    allowThreads(filter);
    filter.load();
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 3)
        fail("usage: confine UNIT PROGRAM [ARGUMENT...]");
    confine(read(argv[1]));
    ::execv(argv[2], argv + 2);
    fail(std::string(argv[2]) + ": " + std::strerror(errno));
}
