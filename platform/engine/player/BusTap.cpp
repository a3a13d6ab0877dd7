// SPDX-License-Identifier: MIT
#include "player/BusTap.h"

#include <utility>

#include "handle/Barrier.h"
#include "handle/CallbackData.h"

namespace engine {

namespace {

struct Target {
    GstElement* pipeline; ///< borrowed, only compared
    std::uint64_t number;
    std::shared_ptr<EngineMailbox> mailbox;
};

constexpr int kWanted = GST_MESSAGE_ERROR | GST_MESSAGE_EOS | GST_MESSAGE_ASYNC_DONE |
                        GST_MESSAGE_SEGMENT_DONE | GST_MESSAGE_BUFFERING | GST_MESSAGE_CLOCK_LOST |
                        GST_MESSAGE_LATENCY | GST_MESSAGE_DURATION_CHANGED |
                        GST_MESSAGE_STREAM_COLLECTION;

bool isWanted(GstMessage* message, const Target& target) {
    // Every element tells its state; only the whole pipeline's is of interest.
    if (GST_MESSAGE_TYPE(message) == GST_MESSAGE_STATE_CHANGED)
        return GST_MESSAGE_SRC(message) == GST_OBJECT_CAST(target.pipeline);
    return (GST_MESSAGE_TYPE(message) & kWanted) != 0;
}

using Data = handle::CallbackData<Target>;

GstBusSyncReply takeMessage(GstBus*, GstMessage* message, gpointer data) {
    handle::guarded([&] {
        static_cast<Data*>(data)->use([&](const Target& target) {
            if (isWanted(message, target))
                target.mailbox->post(BusEvent{target.number, gst::Message(gst::kRef, message)});
        });
    });
    gst_message_unref(message);
    return GST_BUS_DROP;
}

void deleteData(gpointer data) {
    delete static_cast<Data*>(data);
}

} // namespace

BusTap::BusTap(const gst::Element& pipeline, std::uint64_t number,
               std::shared_ptr<EngineMailbox> mailbox)
    : mBus(gst::kAdopt, gst_element_get_bus(pipeline.get())) {
    auto data = std::make_unique<Data>(Target{pipeline.get(), number, std::move(mailbox)});
    gst_bus_set_sync_handler(mBus.get(), takeMessage, data.release(), deleteData);
}

BusTap::~BusTap() {
    gst_bus_set_sync_handler(mBus.get(), nullptr, nullptr, nullptr);
}

} // namespace engine
