// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <string>

#include <gtest/gtest.h>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"
#include "tests/engine/truth/Truth.h"

using namespace LibMediaPlayer;

namespace {

/** How many broken copies of each file; the environment can ask for more. */
int copies() {
    const char* const asked = std::getenv("QNS_DAMAGED_COPIES");
    return asked ? std::atoi(asked) : 4;
}

std::string contentOf(const std::filesystem::path& path) {
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

/** Some end early, some have a hole, and of most some bits are wrong. */
std::string damaged(std::string content, std::mt19937& random) {
    if (content.empty())
        return content;
    if (random() % 3 == 0)
        content.resize(random() % content.size() + 1);
    if (random() % 4 == 0) {
        const std::size_t begin = random() % content.size();
        const std::size_t length = std::min<std::size_t>(random() % 4096, content.size() - begin);
        content.replace(begin, length, length, '\0');
    }
    // Near the beginning as often as anywhere: there are the headers.
    const std::size_t reach = random() % 2 == 0 ? content.size() : content.size() / 50 + 1;
    for (unsigned int count = random() % 20; count > 0; --count)
        content[random() % std::min(reach, content.size())] ^=
            static_cast<char>(1U << (random() % 8));
    return content;
}

class DamagedCopiesOf : public testing::TestWithParam<TrueMedium> {
protected:
    void SetUp() override {
        std::string pattern = testing::TempDir() + "/qns-damage-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
    }
    void TearDown() override { std::filesystem::remove_all(mFolder); }

    /** Everything that a client can ask of a file. */
    void ask() {
        const auto begin = std::chrono::steady_clock::now();
        if (mpDiscoverer->open((mFolder / "copy").wstring()) == 0) {
            MediaMetaInfo info;
            mpDiscoverer->metadata(info);
            EXPECT_LE(info.videoCount, 1);
            EXPECT_LE(info.audioCount, 8);
            EXPECT_GE(info.system.duration, 0);
            mpDiscoverer->makeImage(info.system.duration / 2, 64, 36,
                                    (mFolder / "a.jpg").wstring());
        }
        EXPECT_LT(std::chrono::steady_clock::now() - begin, kSlowness * 5.0_s);
    }

    std::filesystem::path mFolder;
    const std::unique_ptr<IMediaDiscoverer> mpDiscoverer{InterfaceFactory::createDiscoverer()};
};

} // namespace

TEST_P(DamagedCopiesOf, AreReadAsFarAsTheyGoOrRefused) {
    std::mt19937 random(1);
    const std::string content = contentOf(truthPath(GetParam().name));
    for (int copy = 0; copy < copies(); ++copy) {
        SCOPED_TRACE(copy);
        std::ofstream(mFolder / "copy", std::ios::binary) << damaged(content, random);
        ask();
    }
}

INSTANTIATE_TEST_SUITE_P(Engine, DamagedCopiesOf, testing::ValuesIn(trueMedia()),
                         [](const auto& instance) { return testName(instance.param.name); });
