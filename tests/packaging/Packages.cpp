// SPDX-License-Identifier: MIT
#include "tests/packaging/Packages.h"

#include <array>
#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <sys/wait.h>

Outcome run(const std::string& command) {
    std::FILE* pipe = ::popen(('(' + command + ") 2>&1").c_str(), "r");
    if (pipe == nullptr)
        return {};
    Outcome outcome;
    std::array<char, 4096> block{};
    while (const std::size_t size = std::fread(block.data(), 1, block.size(), pipe))
        outcome.output.append(block.data(), size);
    const int status = ::pclose(pipe);
    outcome.status = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    return outcome;
}

std::string outputOf(const std::string& command) {
    const Outcome outcome = run(command);
    EXPECT_EQ(outcome.status, 0) << command << '\n' << outcome.output;
    return outcome.output;
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

void dpkg(const std::string& order) {
    if (std::getenv("QNS_THROWAWAY") == nullptr) {
        std::fputs("These tests change the machine: run them with ctest.\n", stderr);
        std::exit(EXIT_FAILURE);
    }
    // Triggers of others: to index all manual pages of the machine takes minutes. Small images of
    // Debian leave out manual pages and documents, unless they are asked for.
    outputOf("dpkg --no-triggers '--path-include=/usr/share/*' " + order);
}

namespace packages {

namespace {

std::string all() {
    std::string list;
    for (const std::string& name : names())
        list += ' ' + name;
    return list;
}

} // namespace

const std::vector<std::string>& names() {
    static const std::vector<std::string> kNames = {
        "libqnsys1", "libmediaplayer-proxy1", "qnsmediaservice", "libqnsmediaclient1",
        "qnsmedia",  "libqnsmedia-dev",       "qnsmedia-mpris"};
    return kNames;
}

void install() {
    dpkg("--install " QNS_PACKAGE_FOLDER "/*.deb");
}

void remove() {
    dpkg("--remove" + all());
}

void purge() {
    dpkg("--purge" + all());
}

} // namespace packages
