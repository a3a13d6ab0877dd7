// SPDX-License-Identifier: MIT
#include "fuzz/support/MetadataCheck.h"

#include <algorithm>
#include <memory>
#include <string_view>

#include "base/Text.h"
#include "define/ObjectIds.h"
#include "discoverer/MediaDiscovererController.h"
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"
#include "fuzz/support/Engine.h"
#include "fuzz/support/Packets.h"
#include "fuzz/support/Require.h"
#include "ptc/Event.h"
#include "ptc/EventPacket.h"
#include "ptc/ISender.h"
#include "reader/TagText.h"

using namespace LibMediaPlayer;

namespace fuzz {

namespace {

constexpr std::size_t kLongestType = 64;
constexpr std::size_t kLongestDescription = 100;

/** Written out for a client, nothing of it is lost, and no terminal obeys it. */
bool isClean(std::wstring_view text) {
    const auto isControl = [](wchar_t wide) { return wide < 0x20 || (wide > 0x7e && wide < 0xa0); };
    return std::none_of(text.begin(), text.end(), isControl) &&
           qns::widen(qns::narrow(text)) == text;
}

void requireType(const std::string& type) {
    const auto isPlain = [](char letter) { return letter > ' ' && letter <= '~'; };
    require(type.size() <= kLongestType && type.find('/') != std::string::npos);
    require(std::all_of(type.begin(), type.end(), isPlain));
}

void requireDescription(const std::wstring& text) {
    require(!text.empty() && text.size() <= kLongestDescription && isClean(text));
}

void requireVideo(const VideoMetaInfo& video) {
    requireType(video.mediaType);
    requireDescription(video.description);
    require(video.frameRateNumerator >= 0 && video.frameRateDenominator > 0);
    require(video.pixelAspectNumerator > 0 && video.pixelAspectDenominator > 0);
    require(video.width >= 0 && video.height >= 0 && video.depth >= 0);
    require(video.bitRate >= 0 && video.maxBitRate >= 0);
}

void requireAudio(const AudioMetaInfo& audio) {
    requireType(audio.mediaType);
    requireDescription(audio.description);
    require(audio.channels >= 0 && audio.sampleRate >= 0 && audio.depth >= 0);
    require(audio.bitRate >= 0 && audio.maxBitRate >= 0);
}

class PacketSender : public PTC::ISender {
public:
    long getId() override { return 1; }
    void send(PTC::Event* event) override {
        const std::unique_ptr<PTC::Event> owned(event);
        require(event->size <= PTC::kMaxPayloadSize);
        requireDecodable(MediaServiceDefine::kDiscovererCallBackId, *event);
        ++sent;
    }

    int sent = 0;
};

/** From the engine to a client's packet. */
class Discoverer {
public:
    Discoverer() {
        mProxy.setSender(&mSender);
        QObject::connect(&mController, &MediaDiscovererController::retMetaData_signal,
                         [this](int id) { mProxy.getMetaDataCallBack(mController.metadata(id)); });
    }

    void requireAnswer(const MediaMetaInfo& info) {
        mSender.sent = 0;
        engine().info = info;
        mController.getMetadata(0);
        require(mSender.sent == 1);
    }

private:
    MediaDiscovererController mController;
    MediaDiscovererServiceCallBackRemoteProxy mProxy{1};
    PacketSender mSender;
};

} // namespace

void requireTags(const std::wstring& tags) {
    require(qns::narrow(tags).size() <= reader::kTagBytes);
    std::wstring_view left = tags;
    while (!left.empty()) {
        const std::wstring_view line = left.substr(0, left.find(L'\n'));
        require(line.size() < left.size() && isClean(line));
        const std::size_t equals = line.find(L'=');
        require(equals > 0 && equals < line.size() - 1);
        left.remove_prefix(line.size() + 1);
    }
}

void requireSound(const MediaMetaInfo& info) {
    requireType(info.system.mediaType);
    requireTags(info.system.tags);
    require(info.system.duration >= 0);
    require(info.videoCount >= 0 && info.videoCount <= 1);
    require(info.audioCount >= 0 && info.audioCount <= static_cast<int>(info.audio.size()));
    require(info.videoCount + info.audioCount > 0);
    if (info.videoCount == 1)
        requireVideo(info.video);
    std::for_each(info.audio.begin(), info.audio.begin() + info.audioCount, requireAudio);
    static Discoverer discoverer;
    discoverer.requireAnswer(info);
}

} // namespace fuzz
