// SPDX-License-Identifier: MIT
#include "main/MediaServiceMain.h"

#include <QMetaMethod>
#include <cstdlib>
#include <gmock/gmock.h>

namespace {

TEST(MediaServiceMain, WritesItsTraceLines) {
    ::testing::internal::CaptureStdout();
    {
        MediaServiceMain serviceMain;
        EXPECT_TRUE(serviceMain.initialize());
        serviceMain.import();
        serviceMain.importController();
    }
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "MediaServiceMain::MediaServiceMain\n"
                                                        "MediaServiceMain::initialize\n"
                                                        "MediaServiceMain::import\n"
                                                        "MediaServiceMain::importController\n"
                                                        "MediaServiceMain::~MediaServiceMain\n");
}

TEST(MediaServiceMain, HasTwoSlotsInTheirOrder) {
    const QMetaObject& meta = MediaServiceMain::staticMetaObject;
    const int first = meta.methodOffset();
    ASSERT_EQ(meta.methodCount() - first, 2);
    EXPECT_EQ(meta.method(first).methodSignature(), "import()");
    EXPECT_EQ(meta.method(first + 1).methodSignature(), "importController()");
}

TEST(MediaServiceMain, ConvertsTextBothWays) {
    EXPECT_EQ(MediaServiceMain::wstringToStringType(L"gr\u00fc\u00df \U0001F3B5"),
              "gr\u00fc\u00df \U0001F3B5");
    EXPECT_EQ(MediaServiceMain::stringToWstring("gr\u00fc\u00df"), L"gr\u00fc\u00df");
    EXPECT_EQ(MediaServiceMain::stringToWstring(std::string(5000, 'x')), std::wstring(5000, L'x'));
}

TEST(MediaServiceMain, ReadsThePlatformsDirectories) {
    ::setenv("QNS_HV_PREFIX", "/opt/a b", 1);
    ::setenv("QNS_HV_DATA", "/data/\u00fc", 1);
    std::wstring path;
    EXPECT_TRUE(MediaServiceMain::getSystemHvPrefixPath(path));
    EXPECT_EQ(path, L"/opt/a b");
    EXPECT_TRUE(MediaServiceMain::getSystemHvDataPath(path));
    EXPECT_EQ(path, L"/data/\u00fc");
}

TEST(MediaServiceMain, LeavesThePathAloneWhenThePlatformKnowsNone) {
    ::setenv("QNS_HV_DATA", std::string(600, 'x').c_str(), 1); // more than the platform is asked
    std::wstring path = L"before";
    EXPECT_FALSE(MediaServiceMain::getSystemHvDataPath(path));
    EXPECT_EQ(path, L"before");
}

} // namespace
