// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>

#include "gst/Types.h"
#include "player/Items.h"

namespace engine {

/**
 * Takes the messages of a pipeline that matter to playback to the engine's mailbox, on the
 * thread that posts them, until it goes. The bus itself stays empty.
 */
class BusTap {
public:
    BusTap(const gst::Element& pipeline, std::uint64_t number,
           std::shared_ptr<EngineMailbox> mailbox);
    ~BusTap();
    BusTap(const BusTap&) = delete;
    BusTap& operator=(const BusTap&) = delete;

private:
    gst::Bus mBus;
};

} // namespace engine
