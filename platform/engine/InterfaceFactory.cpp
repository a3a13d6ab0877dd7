// SPDX-License-Identifier: MIT
#include "LibMediaPlayer/InterfaceFactory.h"

#include <memory>
#include <utility>

#include "discoverer/Discoverer.h"
#include "handle/Barrier.h"
#include "importer/Importer.h"
#include "importer/LookProbe.h"
#include "importer/Options.h"
#include "player/Player.h"
#include "worker/Media.h"

namespace LibMediaPlayer {

IMediaPlayer* InterfaceFactory::createPlayer(void* window, unsigned int flags) {
    return handle::guarded<IMediaPlayer*>(
        nullptr, [&] { return std::make_unique<engine::Player>(window, flags).release(); });
}

IMediaDiscoverer* InterfaceFactory::createDiscoverer() {
    return handle::guarded<IMediaDiscoverer*>(
        nullptr, [] { return std::make_unique<discoverer::Discoverer>().release(); });
}

IMediaImporter* InterfaceFactory::createImporter() {
    return handle::guarded<IMediaImporter*>(nullptr, [] {
        importer::Options options;
        options.dataFolder = importer::dataFolder();
        options.probe = importer::probeByLook;
        const auto pWorkers =
            std::make_shared<worker::Pool>(worker::defaultProgram(), worker::Haste::kWhenIdle);
        options.drawThumbnail = [pWorkers](const std::string& path) {
            return worker::drawThumbnail(path, *pWorkers);
        };
        options.stopDrawing = [pWorkers] { pWorkers->cancel(); };
        return std::make_unique<importer::Importer>(std::move(options)).release();
    });
}

} // namespace LibMediaPlayer
