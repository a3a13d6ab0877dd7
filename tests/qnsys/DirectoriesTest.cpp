// SPDX-License-Identifier: MIT
#include "qnsys.h"

#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

namespace fs = std::filesystem;

namespace {

using Query = int(char* buffer, int capacity);

/** Checks that length and end of the text agree. */
std::string answerOf(Query* query) {
    char buffer[500] = {};
    const int length = query(buffer, sizeof buffer);
    EXPECT_EQ(static_cast<std::size_t>(length), std::strlen(buffer));
    return buffer;
}

class Directories : public testing::Test {
protected:
    Directories() {
        ::unsetenv("QNS_HV_PREFIX");
        ::unsetenv("QNS_HV_DATA");
        std::string pattern = fs::temp_directory_path() / "qnsysXXXXXX";
        mFolder = ::mkdtemp(pattern.data());
    }
    ~Directories() override {
        ::unsetenv("QNS_HV_PREFIX");
        ::unsetenv("QNS_HV_DATA");
        fs::remove_all(mFolder);
    }

    /** What the library would say if it were installed in `folder`. */
    static std::string prefixFoundFrom(const fs::path& folder) {
        fs::create_directories(folder);
        fs::copy_file(QNS_LIBRARY, folder / "copy.so");
        void* library = ::dlopen((folder / "copy.so").c_str(), RTLD_NOW | RTLD_LOCAL);
        if (library == nullptr)
            return ::dlerror();
        const std::string prefix =
            answerOf(reinterpret_cast<Query*>(::dlsym(library, "qnsys_getenv_hv_prefix")));
        ::dlclose(library);
        return prefix;
    }

    fs::path mFolder;
};

} // namespace

TEST_F(Directories, ThePrefixIsTheEnvironmentsFirst) {
    ::setenv("QNS_HV_PREFIX", "/some/where", 1);
    EXPECT_EQ(answerOf(qnsys_getenv_hv_prefix), "/some/where");
}

TEST_F(Directories, ThePrefixOfABuildTreeIsTheBuildTree) {
    EXPECT_EQ(answerOf(qnsys_getenv_hv_prefix), QNS_BUILD_DIR);
}

TEST_F(Directories, AnEmptyVariableIsNone) {
    ::setenv("QNS_HV_PREFIX", "", 1);
    ::setenv("QNS_HV_DATA", "", 1);
    EXPECT_EQ(answerOf(qnsys_getenv_hv_prefix), QNS_BUILD_DIR);
    EXPECT_EQ(answerOf(qnsys_getenv_hv_data), "/var/lib/qnsmedia");
}

TEST_F(Directories, AMovedInstallationFindsItsPrefix) {
    fs::create_directories(mFolder / "share/mediaplayer");
    EXPECT_EQ(prefixFoundFrom(mFolder / "lib/x86_64-linux-gnu"), mFolder);
}

TEST_F(Directories, WithoutPicturesAboveTheLibraryThePrefixIsThatOfTheBuild) {
    EXPECT_EQ(prefixFoundFrom(mFolder / "lib"), QNS_INSTALL_PREFIX);
}

TEST_F(Directories, TheDataDirectoryIsTheEnvironmentsFirst) {
    EXPECT_EQ(answerOf(qnsys_getenv_hv_data), "/var/lib/qnsmedia");
    ::setenv("QNS_HV_DATA", "/data", 1);
    EXPECT_EQ(answerOf(qnsys_getenv_hv_data), "/data");
}

TEST_F(Directories, APathThatDoesNotFitLeavesTheBufferAlone) {
    ::setenv("QNS_HV_DATA", "/data", 1);
    char buffer[7] = "before";
    EXPECT_EQ(qnsys_getenv_hv_data(buffer, 5), 0);
    EXPECT_EQ(qnsys_getenv_hv_data(buffer, 0), 0);
    EXPECT_EQ(qnsys_getenv_hv_data(buffer, -1), 0);
    EXPECT_EQ(qnsys_getenv_hv_data(nullptr, 100), 0);
    EXPECT_STREQ(buffer, "before");
    EXPECT_EQ(qnsys_getenv_hv_data(buffer, 6), 5);
    EXPECT_STREQ(buffer, "/data");
}
