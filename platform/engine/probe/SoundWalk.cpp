// SPDX-License-Identifier: MIT
#include "probe/SoundWalk.h"

#include "probe/Signature.h"
#include "probe/Window.h"

namespace probe {

namespace {

constexpr std::int64_t kNanoseconds = 1'000'000'000;
constexpr std::size_t kPiece = 256 * 1024;

class SoundWalk {
public:
    SoundWalk(FileInput& input, ReadHeader& read)
        : mRead(read), mSize(input.size()), mWindow(input, kPiece) {}

    WalkedSound run() {
        const auto begin = static_cast<std::int64_t>(sizeOfTag(mWindow.at(0, kLongestHeader)));
        mPlace = begin;
        while (const auto header = next()) {
            count(*header);
            mPlace += static_cast<std::int64_t>(header->size);
        }
        const std::int64_t time = mTime + timeOfRun();
        // What is left lacks a whole frame; more of it only when reading had to stop.
        if (mPlace + kLongestRest >= mSize)
            return {std::chrono::nanoseconds(time), true};
        if (mPlace <= begin)
            return {};
        return {std::chrono::nanoseconds(av_rescale(time, mSize - begin, mPlace - begin)), false};
    }

private:
    static constexpr std::int64_t kLongestRest = 64 * 1024;

    /** The frame at the current place or the nearest one after it, which then is the place. */
    std::optional<FrameHeader> next() {
        const std::int64_t expected = mPlace;
        for (; mPlace < mSize; ++mPlace) {
            const std::string_view bytes = mWindow.at(mPlace, kLongestHeader);
            if (bytes.empty())
                return std::nullopt;
            const auto header = mRead(bytes);
            if (!header || mPlace + static_cast<std::int64_t>(header->size) > mSize)
                continue;
            if ((mPlace == expected && header->kind == mKind) || isFollowed(*header))
                return header;
        }
        return std::nullopt;
    }

    /** Bytes can look like a header by chance; hardly in two places that fit. */
    bool isFollowed(const FrameHeader& header) {
        const std::int64_t behind = mPlace + static_cast<std::int64_t>(header.size);
        const auto following = mRead(mWindow.at(behind, kLongestHeader));
        return behind == mSize || (following && following->kind == header.kind);
    }

    void count(const FrameHeader& header) {
        if (header.rate != mRate) {
            mTime += timeOfRun();
            mSamples = 0;
        }
        mRate = header.rate;
        mKind = header.kind;
        mSamples += header.samples;
    }

    [[nodiscard]] std::int64_t timeOfRun() const {
        return mRate > 0 ? av_rescale(mSamples, kNanoseconds, mRate) : 0;
    }

    ReadHeader& mRead;
    const std::int64_t mSize;
    Window mWindow;
    std::int64_t mPlace = 0;
    std::int64_t mTime = 0; ///< nanoseconds, of what had another rate
    std::int64_t mSamples = 0;
    int mRate = 0;
    unsigned int mKind = 0;
};

} // namespace

WalkedSound walkSound(FileInput& input, ReadHeader& read) {
    return SoundWalk(input, read).run();
}

} // namespace probe
