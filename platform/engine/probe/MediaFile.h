// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>
#include <string_view>
#include <variant>

#include "probe/AvTypes.h"
#include "probe/FileInput.h"
#include "probe/LookOutcome.h"
#include "probe/RegularFile.h"

namespace probe {

/**
 * A media file whose header has been read. Reading is bounded in bytes and time from opening on,
 * whatever the file. For one thread.
 */
class MediaFile {
public:
    using Opened = std::variant<std::unique_ptr<MediaFile>, LookFailure, LookUndecided>;

    /** How much may be read, and for how long. */
    struct Bounds {
        std::int64_t bytes;
        std::chrono::milliseconds time;
    };
    static constexpr Bounds kLook{64 * 1024 * 1024, std::chrono::milliseconds(1500)};

    /** Refuses what holds no media. */
    static Opened open(RegularFile file, Bounds bounds = kLook);

    MediaFile(const MediaFile&) = delete;
    MediaFile& operator=(const MediaFile&) = delete;

    [[nodiscard]] AVFormatContext& context() const { return *mContext.get(); }

    /** libavformat's name, such as "mov,mp4,m4a,3gp,3g2,mj2". */
    [[nodiscard]] std::string_view formatName() const { return mpFormat->name; }

    [[nodiscard]] std::int64_t size() const { return mInput.size(); } ///< bytes

    /** One picture, without time. */
    [[nodiscard]] bool isPicture() const;

    /** The file begins with an ID3v2 tag. */
    [[nodiscard]] bool isTagged() const { return mTagged; }

    /** The packets have been looked into: what the header lacks has been filled in. */
    [[nodiscard]] bool isAnalysed() const { return mAnalysed; }

    /** Looks into the first packets; they are read again later. */
    void analyse();

    [[nodiscard]] bool isExhausted() const { return mInput.isExhausted(); }

    /**
     * How long it plays, 0 when unknown. Where header and index do not say, all packets are
     * read, as far as the bounds go, so ask after everything else that is to be read.
     */
    [[nodiscard]] const Duration& duration();

private:
    MediaFile(RegularFile file, Bounds bounds);
    Opened failed(int result) const;
    [[nodiscard]] int readHeader();
    bool findFormat();
    [[nodiscard]] int openInput();
    [[nodiscard]] bool isClear() const;
    [[nodiscard]] bool isEstimate();

    static int isInterrupted(void* input) {
        return static_cast<FileInput*>(input)->isExhausted() ? 1 : 0;
    }

    FileInput mInput;
    const AVInputFormat* mpFormat = nullptr;
    bool mTagged = false;
    bool mReadPicture = false; ///< its header has told all there is to know
    bool mCutOff = false;      ///< what the header says of the duration is wrong
    bool mAnalysed = false;
    bool mDurationKnown = false;
    Duration mDuration;
    FormatContext mContext; ///< after the input, so that it goes first
};

/** A stream with pictures that move, or the one of a picture file: no cover. */
bool isVideo(const AVStream& stream);
bool isCover(const AVStream& stream);
bool isAudio(const AVStream& stream);

} // namespace probe
