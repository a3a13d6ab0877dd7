// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <gmock/gmock.h>

/** What a shell command printed, on either output, and its exit status. */
struct Outcome {
    int status = -1;
    std::string output;
};

Outcome run(const std::string& command);

/** The same of a command that must succeed: else the test fails. */
std::string outputOf(const std::string& command);

std::vector<std::string> linesOf(const std::string& text);

/** Installs or removes packages, as the order says. */
void dpkg(const std::string& order);

/** The packages of this build, and whether they are installed on the machine of the test. */
namespace packages {

/** In an order that none comes before what it needs. */
const std::vector<std::string>& names();

/** Installs them all; dpkg refuses when something that they depend on is missing. */
void install();

/** Removes them all, and not their configuration. */
void remove();

/** Removes the configuration too. */
void purge();

} // namespace packages

/** Tests on a machine that has them all. */
class Installed : public testing::Test {
protected:
    static void SetUpTestSuite() { packages::install(); }
    static void TearDownTestSuite() { packages::purge(); }
};
