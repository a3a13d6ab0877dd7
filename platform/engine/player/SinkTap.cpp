// SPDX-License-Identifier: MIT
#include "player/SinkTap.h"

#include <optional>
#include <utility>

namespace engine {

namespace {

std::optional<SinkEvent> segmentEvent(GstEvent* event) {
    const GstSegment* segment = nullptr;
    gst_event_parse_segment(event, &segment);
    if (segment->format != GST_FORMAT_TIME)
        return std::nullopt;
    SinkEvent told;
    told.what = SinkEvent::What::kSegment;
    told.base = Nanoseconds(segment->base);
    told.position = Nanoseconds(segment->time + segment->offset);
    return told;
}

std::optional<SinkEvent> toSinkEvent(GstEvent* event) {
    switch (GST_EVENT_TYPE(event)) {
    case GST_EVENT_FLUSH_STOP:
        return SinkEvent{};
    case GST_EVENT_SEGMENT:
        return segmentEvent(event);
    default:
        return std::nullopt;
    }
}

} // namespace

gst::PadProbe tapSink(const gst::Element& sink, StreamKind kind, std::uint64_t pipeline,
                      std::shared_ptr<EngineMailbox> mailbox) {
    const auto what = static_cast<GstPadProbeType>(GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM |
                                                   GST_PAD_PROBE_TYPE_EVENT_FLUSH);
    return {gst::staticPad(sink, "sink"), what,
            [kind, pipeline, mailbox = std::move(mailbox)](const GstPadProbeInfo& info) {
                if (auto event = toSinkEvent(GST_EVENT_CAST(info.data))) {
                    event->pipeline = pipeline;
                    event->kind = kind;
                    mailbox->post(*event);
                }
                return GST_PAD_PROBE_OK;
            }};
}

} // namespace engine
