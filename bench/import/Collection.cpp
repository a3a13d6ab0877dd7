// SPDX-License-Identifier: MIT
#include "bench/import/Collection.h"

#include <cstdlib>
#include <memory>
#include <stdexcept>

extern "C" {
#include <libavformat/avformat.h>
}

namespace bench {
namespace {

namespace fs = std::filesystem;

struct CloseInput {
    void operator()(AVFormatContext* context) const { avformat_close_input(&context); }
};
struct CloseOutput {
    void operator()(AVFormatContext* context) const {
        avio_closep(&context->pb);
        avformat_free_context(context);
    }
};
struct FreePacket {
    void operator()(AVPacket* packet) const { av_packet_free(&packet); }
};
using Input = std::unique_ptr<AVFormatContext, CloseInput>;
using Output = std::unique_ptr<AVFormatContext, CloseOutput>;
using Packet = std::unique_ptr<AVPacket, FreePacket>;

int require(int result, const std::string& what) {
    if (result < 0)
        throw std::runtime_error("cannot be made: " + what);
    return result;
}

/** A file's only stream, in memory. */
class Stream {
public:
    explicit Stream(const fs::path& file) {
        AVFormatContext* context = nullptr;
        require(avformat_open_input(&context, file.c_str(), nullptr, nullptr), file);
        mInput.reset(context);
        require(avformat_find_stream_info(context, nullptr), file);
        for (;;) {
            Packet packet(av_packet_alloc());
            if (av_read_frame(context, packet.get()) < 0)
                return;
            mPackets.push_back(std::move(packet));
        }
    }

    void announce(AVFormatContext& output) const {
        AVStream* const stream = avformat_new_stream(&output, nullptr);
        avcodec_parameters_copy(stream->codecpar, parameters());
        stream->codecpar->codec_tag = 0;
        stream->time_base = mInput->streams[0]->time_base;
        if (stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO)
            stream->disposition = AV_DISPOSITION_ATTACHED_PIC;
    }

    void write(AVFormatContext& output, int index) const {
        for (const Packet& packet : mPackets) {
            const Packet copy(av_packet_clone(packet.get()));
            copy->stream_index = index;
            copy->pos = -1;
            av_packet_rescale_ts(copy.get(), mInput->streams[0]->time_base,
                                 output.streams[index]->time_base);
            require(av_write_frame(&output, copy.get()), "a packet");
        }
    }

private:
    [[nodiscard]] const AVCodecParameters* parameters() const {
        return mInput->streams[0]->codecpar;
    }

    Input mInput;
    std::vector<Packet> mPackets;
};

void tag(AVFormatContext& output, int number) {
    const auto set = [&](const char* key, const std::string& value) {
        av_dict_set(&output.metadata, key, value.c_str(), 0);
    };
    set("title", "Title " + std::to_string(number));
    set("artist", "Artist " + std::to_string(number / 50));
    set("album", "Album " + std::to_string(number / 10));
    set("track", std::to_string(number % 10 + 1));
    set("genre", number % 3 == 0 ? "Jazz" : "Folk");
    set("date", std::to_string(1970 + number % 50));
}

void writeFile(const std::string& file, int number, const Stream& sound, const Stream* cover) {
    AVFormatContext* context = nullptr;
    require(avformat_alloc_output_context2(&context, nullptr, nullptr, file.c_str()), file);
    const Output output(context);
    sound.announce(*context);
    if (cover)
        cover->announce(*context);
    // Ogg keeps its tags in the stream.
    tag(*context, number);
    av_dict_copy(&context->streams[0]->metadata, context->metadata, 0);
    require(avio_open(&context->pb, file.c_str(), AVIO_FLAG_WRITE), file);
    require(avformat_write_header(context, nullptr), file);
    if (cover)
        cover->write(*context, 1);
    sound.write(*context, 0);
    require(av_write_trailer(context), file);
}

fs::path encode(const fs::path& folder, const std::string& source, const std::string& name) {
    fs::path file = folder / name;
    const std::string command =
        "ffmpeg -v error -nostdin -y -f lavfi -i " + source + " '" + file.string() + "'";
    require(std::system(command.c_str()) == 0 ? 0 : -1, name);
    return file;
}

} // namespace

std::vector<std::string> makeCollection(const fs::path& folder, const CollectionPlan& plan) {
    av_log_set_level(AV_LOG_QUIET);
    const fs::path models = folder.string() + ".models";
    fs::create_directories(models);
    const Stream cover(
        encode(models, "testsrc2=size=500x500:rate=1 -frames:v 1 -update 1", "cover.jpg"));
    std::vector<Stream> sounds;
    for (const std::string& ending : plan.endings)
        sounds.emplace_back(encode(models, "sine=duration=2", "sound." + ending));
    std::vector<std::string> files;
    for (int number = 0; number < plan.count; ++number) {
        const fs::path part = folder / std::to_string(number / 100);
        fs::create_directories(part);
        const std::size_t kind = static_cast<std::size_t>(number) % sounds.size();
        files.push_back((part / (std::to_string(number) + "." + plan.endings[kind])).string());
        writeFile(files.back(), number, sounds[kind], plan.hasCovers ? &cover : nullptr);
    }
    fs::remove_all(models);
    return files;
}

} // namespace bench
