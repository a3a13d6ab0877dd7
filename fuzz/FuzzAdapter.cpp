// SPDX-License-Identifier: MIT
// Lets clients ask the services for anything, in any order, while the engine tells anything, and
// clients end.
#include <algorithm>
#include <array>
#include <memory>
#include <string>

#include "define/ObjectIds.h"
#include "fuzz/support/Engine.h"
#include "fuzz/support/Input.h"
#include "fuzz/support/Ledger.h"
#include "fuzz/support/Services.h"
#include "ptc/Event.h"
#include "ptc/EventPacket.h"

using namespace MediaServiceDefine;

namespace {

/** What an input consists of: one of these in a byte, and what belongs to it. */
enum Step : uint8_t {
    kAskDiscoverer,
    kAskImporter,
    kAskPlayer,
    kAskInside, ///< a caller of this process: the arguments are records as they stand in memory
    kRunQueued,
    kTellPlayer,
    kTellImporter,
    kSetEngine,
    kSetMetadata,
    kEndClient,
    kStepCount
};

class Run {
public:
    Run(const uint8_t* data, std::size_t size) : mInput(data, size) {}

    void run() {
        fuzz::engine() = {};
        makeServices();
        while (!mInput.isEmpty())
            step(mInput.byte() % kStepCount);
        settle();
    }

private:
    /** The engine's state must be new before the services set their functions there. */
    void makeServices() { mpServices = std::make_unique<fuzz::Services>(mLedger); }

    void step(int kind) {
        constexpr std::array<void (Run::*)(), kStepCount> kSteps{
            &Run::ask<kDiscovererAdapterId, true>,
            &Run::ask<kImporterAdapterId, true>,
            &Run::ask<kPlayerAdapterId, true>,
            &Run::askInside,
            &Run::settle,
            &Run::tellPlayer,
            &Run::tellImporter,
            &Run::setEngine,
            &Run::setMetadata,
            &Run::endClient};
        (this->*kSteps[static_cast<std::size_t>(kind)])();
    }

    template<long object, bool isRemote>
    void ask() {
        const long method = mInput.byte();
        std::string block = mInput.block();
        block.resize(std::min<std::size_t>(block.size(), PTC::kMaxPayloadSize));
        mLedger.requested(object, method);
        mpServices->receive(event(object, method, block, isRemote));
    }

    void askInside() {
        constexpr std::array<void (Run::*)(), 3> kAsks{&Run::ask<kDiscovererAdapterId, false>,
                                                       &Run::ask<kImporterAdapterId, false>,
                                                       &Run::ask<kPlayerAdapterId, false>};
        (this->*kAsks[mInput.byte() % kAsks.size()])();
    }

    static PTC::Event* event(long object, long method, const std::string& block, bool isRemote) {
        auto data = std::make_unique<char[]>(block.size());
        std::copy(block.begin(), block.end(), data.get());
        return new PTC::Event(object, method, data.release(), static_cast<long>(block.size()),
                              isRemote, false);
    }

    /** Lets the worker do all that it has been asked for. */
    void finishWork() {
        using fuzz::Services;
        mpServices->receive(event(Services::kDoneObjectId, Services::kDoneMethod, {}, true));
        mpServices->waitUntilDone(++mFinished);
    }

    /** And then the main thread what the worker has left to it. */
    void settle() {
        finishWork();
        fuzz::Services::runQueued();
    }

    void tellPlayer() {
        LibMediaPlayer::MediaPlayerNotify told;
        told.type = mInput.number<int>();
        told.result = mInput.number<int>();
        told.text = mInput.text();
        told.param1 = mInput.number<int>();
        told.uvalue1 = mInput.number<unsigned long>();
        told.value = mInput.number<long>();
        settle();
        mLedger.happened(kPlayerNotifyId);
        fuzz::engine().notifyPlayer(told);
    }

    void tellImporter() {
        LibMediaPlayer::MediaImporterNotify told;
        told.kind = mInput.number<int32_t>();
        told.result = mInput.number<int32_t>();
        told.text = mInput.text();
        settle();
        mLedger.happened(kImporterNotifyId);
        fuzz::engine().notifyImporter(told);
    }

    void setEngine() {
        fuzz::Engine& engine = fuzz::engine();
        engine.result = mInput.number<int8_t>();
        engine.position = mInput.number<long>();
        engine.duration = mInput.number<long>();
        engine.extensions.extensions = mInput.text();
        engine.extensions.count = mInput.number<int32_t>();
    }

    void setMetadata() {
        LibMediaPlayer::MediaMetaInfo& info = fuzz::engine().info;
        info.system.mediaType = mInput.block();
        info.system.tags = mInput.text();
        info.system.duration = mInput.number<int64_t>();
        info.videoCount = mInput.number<int32_t>();
        info.video.mediaType = mInput.block();
        info.video.description = mInput.text();
        info.video.width = mInput.number<int32_t>();
        info.audioCount = mInput.number<int32_t>();
        for (LibMediaPlayer::AudioMetaInfo& audio : info.audio) {
            audio.mediaType = mInput.block();
            audio.description = mInput.text();
            audio.sampleRate = mInput.number<int32_t>();
        }
    }

    /** The main thread may have something to do for the client yet. */
    void endClient() {
        finishWork();
        mpServices->endProxy(mInput.byte());
    }

    fuzz::Input mInput;
    fuzz::Ledger mLedger;
    std::unique_ptr<fuzz::Services> mpServices;
    int mFinished = 0;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Run(data, size).run();
    return 0;
}
