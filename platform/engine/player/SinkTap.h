// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>

#include "gst/PadProbe.h"
#include "player/Items.h"

namespace engine {

/** Tells the engine's mailbox of the flushes and segments that reach a sink. */
gst::PadProbe tapSink(const gst::Element& sink, StreamKind kind, std::uint64_t pipeline,
                      std::shared_ptr<EngineMailbox> mailbox);

} // namespace engine
