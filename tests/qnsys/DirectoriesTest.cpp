// SPDX-License-Identifier: MIT
#include <array>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>

#include "qnsys.h"

namespace {

using Query = int (*)(char*, int);

std::string ask(Query query) {
    std::array<char, 500> buffer{};
    const int length = query(buffer.data(), buffer.size());
    EXPECT_EQ(static_cast<std::size_t>(length), std::strlen(buffer.data()));
    return buffer.data();
}

class Directories : public ::testing::Test {
protected:
    void TearDown() override {
        ::unsetenv("QNS_HV_PREFIX");
        ::unsetenv("QNS_HV_DATA");
    }
};

TEST_F(Directories, TheEnvironmentNamesThem) {
    ::setenv("QNS_HV_PREFIX", "/opt/media", 1);
    ::setenv("QNS_HV_DATA", "/data/media", 1);
    EXPECT_EQ(ask(qnsys_getenv_hv_prefix), "/opt/media");
    EXPECT_EQ(ask(qnsys_getenv_hv_data), "/data/media");
}

TEST_F(Directories, TheDataDirectoryHasADefault) {
    EXPECT_EQ(ask(qnsys_getenv_hv_data), "/var/lib/qnsmedia");
}

TEST_F(Directories, ThePrefixIsFoundAboveTheLibrary) {
    EXPECT_TRUE(std::filesystem::exists(ask(qnsys_getenv_hv_prefix) +
                                        "/share/mediaplayer/images/black.jpg"));
}

TEST_F(Directories, APathThatDoesNotFitLeavesTheBufferAlone) {
    ::setenv("QNS_HV_DATA", "/12345", 1);
    std::array<char, 8> buffer{"before"};
    EXPECT_EQ(qnsys_getenv_hv_data(buffer.data(), 6), 0);
    EXPECT_STREQ(buffer.data(), "before");
    EXPECT_EQ(qnsys_getenv_hv_data(buffer.data(), 7), 6);
    EXPECT_STREQ(buffer.data(), "/12345");
    EXPECT_EQ(qnsys_getenv_hv_data(nullptr, 0), 0);
    EXPECT_EQ(qnsys_getenv_hv_data(buffer.data(), -1), 0);
}

TEST(Initialisation, MayBeDoneTwice) {
    EXPECT_GE(qnsys_init(), 0);
    EXPECT_GE(qnsys_init(), 0);
}

} // namespace
