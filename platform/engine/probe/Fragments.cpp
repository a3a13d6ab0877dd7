// SPDX-License-Identifier: MIT
// An MP4 file is a row of boxes, each with its length and type, and some of them hold boxes. Only
// those on the way to a duration are read; the others, and with them all media, are passed over.
#include "probe/Fragments.h"

#include <algorithm>
#include <limits>
#include <map>
#include <optional>
#include <string_view>

#include "probe/Window.h"

namespace probe {

namespace {

using namespace std::string_view_literals;

/** What one needs of a fragment is hardly longer. */
constexpr std::size_t kPiece = 4 * 1024;

/** No more than a file can have that is worth the time. */
constexpr int kMostBoxes = 100'000;

struct Box {
    std::string_view type() const { return {mType, sizeof mType}; }

    std::int64_t begin = 0; ///< of what it holds
    std::int64_t end = 0;
    char mType[4] = {};
};

/** Numbers and boxes of a file by their place. */
class Boxes {
public:
    explicit Boxes(FileInput& input) : mWindow(input, kPiece) {}

    [[nodiscard]] Box whole() const { return {0, mWindow.inputSize(), {}}; }

    /** Big-endian, of that many bytes; 0 behind the end. */
    std::uint64_t number(std::int64_t place, std::size_t size = 4) {
        const std::string_view bytes = mWindow.at(place, size);
        if (bytes.size() < size)
            return 0;
        std::uint64_t value = 0;
        for (const char byte : bytes.substr(0, size))
            value = value << 8 | static_cast<unsigned char>(byte);
        return value;
    }

    /** Calls `visit` for each box in another, until it returns false. */
    template<typename Visit>
    void each(const Box& parent, Visit&& visit) {
        std::int64_t place = parent.begin;
        while (const auto box = at(place, parent.end)) {
            if (++mCount > kMostBoxes || !visit(*box))
                return;
            place = box->end;
        }
    }

private:
    std::optional<Box> at(std::int64_t place, std::int64_t end) {
        constexpr std::int64_t kHeader = 8;
        if (end - place < kHeader)
            return std::nullopt;
        std::uint64_t size = number(place);
        Box box{place + kHeader, end, {}};
        mWindow.at(place + 4, sizeof box.mType).copy(box.mType, sizeof box.mType);
        if (size == 1) {
            size = number(box.begin, 8);
            box.begin += 8;
        }
        const auto most = static_cast<std::uint64_t>(end - place);
        if (size != 0)
            box.end = place + static_cast<std::int64_t>(std::min(size, most));
        if (box.end < box.begin)
            return std::nullopt;
        return box;
    }

    Window mWindow;
    int mCount = 0;
};

struct Track {
    std::uint64_t timeScale = 0;  ///< units a second
    std::uint64_t sampleTime = 0; ///< of samples that do not say
    std::uint64_t end = 0;
};

class FragmentedFile {
public:
    explicit FragmentedFile(FileInput& input) : mBoxes(input) {}

    std::chrono::nanoseconds read() {
        mBoxes.each(mBoxes.whole(), [this](const Box& box) {
            if (box.type() == "moov"sv)
                readMovie(box);
            else if (box.type() == "moof"sv)
                readFragment(box);
            return true;
        });
        std::int64_t longest = 0;
        for (const auto& [id, track] : mTracks)
            longest = std::max(longest, timeOf(track));
        return std::chrono::nanoseconds(longest);
    }

private:
    static std::int64_t timeOf(const Track& track) {
        constexpr std::int64_t kNanoseconds = 1'000'000'000;
        constexpr std::uint64_t kMost = std::numeric_limits<std::int64_t>::max();
        if (track.timeScale == 0 || track.timeScale > kMost || track.end > kMost)
            return 0;
        const std::int64_t time = av_rescale(static_cast<std::int64_t>(track.end), kNanoseconds,
                                             static_cast<std::int64_t>(track.timeScale));
        return std::max<std::int64_t>(time, 0);
    }

    /** Version 1 of a box has 64 bits for times where version 0 has 32. */
    [[nodiscard]] bool isLong(const Box& box) { return mBoxes.number(box.begin, 1) == 1; }

    void readMovie(const Box& movie) {
        mBoxes.each(movie, [this](const Box& box) {
            if (box.type() == "trak"sv)
                readTrack(box);
            else if (box.type() == "mvex"sv)
                readDefaults(box);
            return true;
        });
    }

    void readTrack(const Box& parent) {
        mBoxes.each(parent, [this](const Box& box) {
            if (box.type() == "tkhd"sv)
                mpTrack = &mTracks[mBoxes.number(box.begin + (isLong(box) ? 20 : 12))];
            else if (box.type() == "mdia"sv && mpTrack)
                readMedia(box);
            return true;
        });
        mpTrack = nullptr;
    }

    void readMedia(const Box& media) {
        mBoxes.each(media, [this](const Box& box) {
            if (box.type() != "mdhd"sv)
                return true;
            const bool isLarge = isLong(box);
            mpTrack->timeScale = mBoxes.number(box.begin + (isLarge ? 20 : 12));
            mpTrack->end = mBoxes.number(box.begin + (isLarge ? 24 : 16), isLarge ? 8 : 4);
            return false;
        });
    }

    void readDefaults(const Box& extension) {
        mBoxes.each(extension, [this](const Box& box) {
            if (box.type() == "trex"sv)
                mTracks[mBoxes.number(box.begin + 4)].sampleTime = mBoxes.number(box.begin + 12);
            return true;
        });
    }

    void readFragment(const Box& fragment) {
        mBoxes.each(fragment, [this](const Box& box) {
            if (box.type() == "traf"sv)
                readTrackFragment(box);
            return true;
        });
    }

    void readTrackFragment(const Box& fragment) {
        Track* track = nullptr;
        std::uint64_t sampleTime = 0;
        mBoxes.each(fragment, [&](const Box& box) {
            if (box.type() == "tfhd"sv) {
                track = &mTracks[mBoxes.number(box.begin + 4)];
                sampleTime = sampleTimeOf(box, *track);
            } else if (box.type() == "tfdt"sv && track) {
                track->end = mBoxes.number(box.begin + 4, isLong(box) ? 8 : 4);
            } else if (box.type() == "trun"sv && track) {
                track->end += timeOfRun(box, sampleTime);
            }
            return true;
        });
    }

    std::uint64_t sampleTimeOf(const Box& header, const Track& track) {
        constexpr std::uint64_t kHasOffset = 1;
        constexpr std::uint64_t kHasDescription = 2;
        constexpr std::uint64_t kHasTime = 8;
        const std::uint64_t flags = mBoxes.number(header.begin) & 0xffffff;
        if ((flags & kHasTime) == 0)
            return track.sampleTime;
        return mBoxes.number(header.begin + 8 + ((flags & kHasOffset) != 0 ? 8 : 0) +
                             ((flags & kHasDescription) != 0 ? 4 : 0));
    }

    std::uint64_t timeOfRun(const Box& run, std::uint64_t sampleTime) {
        constexpr std::uint64_t kHasTime = 0x100;
        const std::uint64_t flags = mBoxes.number(run.begin) & 0xffffff;
        const std::uint64_t count = mBoxes.number(run.begin + 4);
        if ((flags & kHasTime) == 0)
            return count * sampleTime;
        std::int64_t place =
            run.begin + 8 + ((flags & 1) != 0 ? 4 : 0) + ((flags & 4) != 0 ? 4 : 0);
        std::int64_t step = 0; // the fields of a sample, of four bytes each
        for (std::uint64_t field = kHasTime; field <= 0x800; field <<= 1)
            step += (flags & field) != 0 ? 4 : 0;
        std::uint64_t time = 0;
        for (std::uint64_t index = 0; index < count && place + step <= run.end; ++index) {
            time += mBoxes.number(place);
            place += step;
        }
        return time;
    }

    Boxes mBoxes;
    std::map<std::uint64_t, Track> mTracks; ///< by id
    Track* mpTrack = nullptr;               ///< the one whose header is being read
};

} // namespace

bool hasFragments(FileInput& input) {
    Boxes boxes(input);
    bool found = false;
    boxes.each(boxes.whole(), [&](const Box& box) {
        found = box.type() == "moof"sv;
        return !found;
    });
    return found;
}

std::chrono::nanoseconds timeOfFragments(FileInput& input) {
    return FragmentedFile(input).read();
}

} // namespace probe
