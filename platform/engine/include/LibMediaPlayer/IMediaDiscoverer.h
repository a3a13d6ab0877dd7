// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>
#include <string>

namespace LibMediaPlayer {

/** What is told of a whole file. */
struct SystemMetaInfo {
    std::string mediaType; ///< container's media type, such as "video/quicktime"
    /** Tags, one `KEY=value` a line: TITLE, ARTIST, ALBUM, ALBUMARTIST, DATE, GENRE ... */
    std::wstring tags;
    bool seekable = false;
    bool live = false;
    int64_t duration = 0; ///< nanoseconds, 0 when unknown
};

struct VideoMetaInfo {
    std::string mediaType;    ///< codec's media type, such as "video/x-h264"
    std::wstring description; ///< codec in words
    int32_t width = 0;
    int32_t height = 0;
    int32_t depth = 0; ///< bits a pixel
    int32_t frameRateNumerator = 0;
    int32_t frameRateDenominator = 1;
    int32_t pixelAspectNumerator = 1;
    int32_t pixelAspectDenominator = 1;
    bool interlaced = false;
    int32_t bitRate = 0;    ///< bits a second, 0 when unknown
    int32_t maxBitRate = 0; ///< bits a second, 0 when unknown
    bool stillPicture = true;
};

struct AudioMetaInfo {
    std::string mediaType;
    std::wstring description;
    int32_t channels = 0;
    int32_t sampleRate = 0; ///< Hz
    int32_t depth = 0;      ///< bits a sample
    int32_t bitRate = 0;    ///< bits a second, 0 when unknown
    int32_t maxBitRate = 0; ///< bits a second, 0 when unknown
};

/** There is room for one video stream and eight audio streams; the counts never exceed it. */
struct MediaMetaInfo {
    SystemMetaInfo system;
    int32_t videoCount = 0;
    VideoMetaInfo video;
    int32_t audioCount = 0;
    std::array<AudioMetaInfo, 8> audio;
};

struct SupportedExtensions {
    std::wstring extensions; ///< lower case, sorted, comma separated
    int32_t count = 0;
};

/**
 * Reads what a file is and draws pictures of it. Every call ends within five seconds whatever
 * the file, and returns 0 or a Result. One object is used by one thread at a time; several
 * objects work independently.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaDiscoverer {
public:
    virtual ~IMediaDiscoverer() = default;

    virtual int open(const std::wstring& path) = 0;
    virtual int close() = 0;

    /**
     * Fills `info`, all texts together bounded so that they fit one answer to a client. After an
     * open() that failed it returns that result again.
     */
    virtual int metadata(MediaMetaInfo& info) = 0;

    /** Kept for the binary interface; returns kWrongState. */
    virtual int reserved5() = 0;

    /**
     * Writes the picture at `position` (nanoseconds) to `path`, whole or not at all: PNG or JPEG
     * by the name's ending, otherwise raw 32-bit pixels 0xAARRGGBB without a header. The size is
     * exact, with black borders where the aspect asks for them; one dimension 0 follows from the
     * aspect, both 0 is the natural size. An audio file gives its cover.
     */
    virtual int makeImage(int64_t position, int32_t width, int32_t height,
                          const std::wstring& path) = 0;

    /** Kept for the binary interface; returns kWrongState. */
    virtual int reserved7() = 0;

    /** The extensions of files that can really be opened. */
    virtual int supportedExtensions(SupportedExtensions& extensions) = 0;
};

} // namespace LibMediaPlayer
