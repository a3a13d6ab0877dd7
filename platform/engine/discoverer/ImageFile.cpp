// SPDX-License-Identifier: MIT
#include "discoverer/ImageFile.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "discoverer/Scaler.h"

namespace discoverer {

using namespace LibMediaPlayer;
using probe::kAdopt;

namespace {

struct Encoding {
    AVCodecID codec;
    AVPixelFormat format;
};

constexpr Encoding kPng{AV_CODEC_ID_PNG, AV_PIX_FMT_RGB24};
constexpr Encoding kJpeg{AV_CODEC_ID_MJPEG, AV_PIX_FMT_YUVJ444P};

/** From 2, the best, to 31. */
constexpr int kJpegQuality = 3;

bool endsWith(const std::string& path, std::string_view ending) {
    const auto isSame = [](char one, char other) {
        return (one >= 'A' && one <= 'Z' ? one - 'A' + 'a' : one) == other;
    };
    return path.size() >= ending.size() &&
           std::equal(ending.begin(), ending.end(), path.end() - static_cast<int>(ending.size()),
                      [&](char expected, char given) { return isSame(given, expected); });
}

int resultOfErrno(int error) {
    switch (error) {
    case ENOENT:
    case ENOTDIR:
        return kNotFound;
    case ENOSPC:
    case EDQUOT:
        return kNoSpace;
    case EACCES:
    case EPERM:
    case EROFS:
    case EISDIR:
        return kAccessDenied;
    default:
        return kNotAvailable;
    }
}

bool encode(const Canvas& canvas, Encoding encoding, AVPacket& packet) {
    const probe::Frame frame = probe::makeFrame();
    if (!convertFromPixels(canvas.pixels, canvas.size, encoding.format, *frame.get()))
        return false;
    const AVCodec* const encoder = avcodec_find_encoder(encoding.codec);
    const probe::CodecContext codec(kAdopt, avcodec_alloc_context3(encoder));
    if (!encoder || !codec)
        return false;
    codec->width = canvas.size.width;
    codec->height = canvas.size.height;
    codec->pix_fmt = encoding.format;
    codec->color_range = AVCOL_RANGE_JPEG;
    codec->time_base = {1, 1};
    codec->thread_count = 1;
    codec->flags |= AV_CODEC_FLAG_QSCALE;
    codec->global_quality = kJpegQuality * FF_QP2LAMBDA;
    frame->quality = codec->global_quality;
    return avcodec_open2(codec.get(), encoder, nullptr) >= 0 &&
           avcodec_send_frame(codec.get(), frame.get()) >= 0 &&
           avcodec_receive_packet(codec.get(), &packet) >= 0;
}

/** A file that has another name until it is whole. */
class WholeFile {
public:
    explicit WholeFile(const std::string& path)
        : mPath(path),
          mTemporary(path + ".part-" + std::to_string(::getpid()) + "-" +
                     std::to_string(++gNumber)),
          mFile(::open(mTemporary.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666)) {
        mResult = mFile ? kOk : resultOfErrno(errno);
    }
    ~WholeFile() {
        if (mFile)
            ::unlink(mTemporary.c_str());
    }
    WholeFile(const WholeFile&) = delete;
    WholeFile& operator=(const WholeFile&) = delete;

    void write(const void* data, std::size_t size) {
        const auto* bytes = static_cast<const char*>(data);
        while (mResult == kOk && size > 0) {
            const ssize_t count = ::write(mFile.get(), bytes, size);
            if (count < 0 && errno == EINTR)
                continue;
            if (count < 0) {
                mResult = resultOfErrno(errno);
                return;
            }
            size -= static_cast<std::size_t>(count);
            bytes += count;
        }
    }

    /** Gives it its name. */
    int finish() {
        if (mResult == kOk && ::rename(mTemporary.c_str(), mPath.c_str()) != 0)
            mResult = resultOfErrno(errno);
        if (mResult == kOk)
            mFile.reset();
        return mResult;
    }

private:
    static std::atomic<unsigned int> gNumber;

    const std::string mPath;
    const std::string mTemporary;
    qns::UniqueFd mFile;
    int mResult = kOk;
};

std::atomic<unsigned int> WholeFile::gNumber{0};

/** A file would take the place of a device or a folder. */
bool isTaken(const std::string& path) {
    struct stat status {};
    return ::stat(path.c_str(), &status) == 0 && !S_ISREG(status.st_mode);
}

int writeWhole(const std::string& path, const void* data, std::size_t size) {
    if (isTaken(path))
        return kAccessDenied;
    WholeFile file(path);
    file.write(data, size);
    return file.finish();
}

int writeEncoded(const Canvas& canvas, Encoding encoding, const std::string& path) {
    const probe::Packet packet = probe::makePacket();
    if (!encode(canvas, encoding, *packet.get()))
        return kInternal;
    return writeWhole(path, packet->data, static_cast<std::size_t>(packet->size));
}

} // namespace

int writeImage(const Canvas& canvas, const std::string& path) {
    if (endsWith(path, ".png"))
        return writeEncoded(canvas, kPng, path);
    if (endsWith(path, ".jpg") || endsWith(path, ".jpeg"))
        return writeEncoded(canvas, kJpeg, path);
    return writeWhole(path, canvas.pixels.data(), canvas.pixels.size() * sizeof(std::uint32_t));
}

} // namespace discoverer
