// SPDX-License-Identifier: MIT
#include "player/FixedChain.h"

#include <atomic>
#include <memory>
#include <string_view>
#include <utility>
#include <vector>

#include "player/Sinks.h"

namespace engine {

namespace {

/** How much is read ahead: enough to join a loop before its end has been played. */
constexpr guint64 kAheadTime = 1500 * GST_MSECOND;
constexpr guint kAheadBytes = 16 * 1024 * 1024;

/** A place to which one pad of the element before it is linked, as soon as there is one. */
struct Entry {
    std::string_view media; ///< begin of the media types that belong here
    gst::Pad pad;
    std::atomic<bool> linked{false};
};

using Entries = std::vector<std::shared_ptr<Entry>>;

std::shared_ptr<Entry> makeEntry(std::string_view media, gst::Pad pad) {
    auto entry = std::make_shared<Entry>();
    entry->media = media;
    entry->pad = std::move(pad);
    return entry;
}

bool isOfKind(const gst::Pad& pad, std::string_view media) {
    if (media.empty())
        return true;
    const gst::Caps caps(gst::kAdopt, gst_pad_query_caps(pad.get(), nullptr));
    if (gst_caps_is_any(caps.get()) || gst_caps_is_empty(caps.get()))
        return false;
    const std::string_view name = gst_structure_get_name(gst_caps_get_structure(caps.get(), 0));
    return name.substr(0, media.size()) == media;
}

/** Ends an open that cannot succeed: what is missing would never reach its sink. */
void reportUnfit(GstObject* element) {
    const gst::Error error(
        gst::kAdopt, g_error_new_literal(GST_STREAM_ERROR, GST_STREAM_ERROR_WRONG_TYPE, "unfit"));
    gst_element_post_message(GST_ELEMENT(element),
                             gst_message_new_error(element, error.get(), nullptr));
}

void linkToEntry(const Entries& entries, const gst::Pad& pad) {
    for (const auto& entry : entries) {
        if (!isOfKind(pad, entry->media) || entry->linked.exchange(true))
            continue;
        if (gst_pad_link(pad.get(), entry->pad.get()) != GST_PAD_LINK_OK)
            reportUnfit(GST_OBJECT_PARENT(pad.get()));
        return;
    }
}

class Builder {
public:
    Builder(const ChainPlan& plan, const PlayerOptions& options) : mPlan(plan), mOptions(options) {
        mParts.pipeline = gst::Element(gst::kSink, gst_pipeline_new("player"));
    }

    std::optional<Pipeline::Parts> build(const std::string& path);

private:
    gst::Element add(gst::Element element);
    gst::Element add(const char* factory) { return add(gst::makeElement(factory)); }
    void append(const char* factory);
    void connect(const gst::Element& from, Entries entries);

    void addReadAhead();
    gst::Pad throughReadAhead(gst::Pad pad);
    std::shared_ptr<Entry> addBranch(const BranchPlan& plan, std::string_view media,
                                     const gst::Element& sink);

    const ChainPlan& mPlan;
    const PlayerOptions& mOptions;
    Pipeline::Parts mParts;
    gst::Element mLast;      ///< the end of what all streams have in common
    gst::Element mReadAhead; ///< one queue for each stream; none for a picture
    bool mFailed = false;
};

std::optional<Pipeline::Parts> Builder::build(const std::string& path) {
    append("filesrc");
    if (!mFailed)
        g_object_set(mLast.get(), "location", path.c_str(), nullptr);
    append(mPlan.tagReader);
    append(mPlan.container);
    if (mPlan.container)
        addReadAhead();
    Entries entries;
    if (mPlan.video) {
        mParts.videoSink = makeVideoSink(mOptions.window);
        entries.push_back(addBranch(*mPlan.video, "video/", mParts.videoSink));
    }
    if (mPlan.audio) {
        mParts.audioSink = makeAudioSink();
        entries.push_back(addBranch(*mPlan.audio, "audio/", mParts.audioSink));
    }
    if (mFailed)
        return std::nullopt;
    mParts.seekTarget = mPlan.audio ? mParts.audioSink : mParts.videoSink;
    if (!mPlan.container)
        entries.front()->media = {};
    connect(mLast, std::move(entries));
    return std::move(mParts);
}

gst::Element Builder::add(gst::Element element) {
    if (element)
        gst_bin_add(GST_BIN(mParts.pipeline.get()), element.get());
    else
        mFailed = true;
    return element;
}

void Builder::append(const char* factory) {
    if (mFailed || !factory)
        return;
    gst::Element element = add(factory);
    if (element && mLast)
        connect(mLast, {makeEntry("", gst::staticPad(element, "sink"))});
    mLast = std::move(element);
}

/** Some elements have their pads from the start, some when they have seen the data. */
void Builder::connect(const gst::Element& from, Entries entries) {
    if (const gst::Pad pad = gst::staticPad(from, "src")) {
        linkToEntry(entries, pad);
        return;
    }
    mParts.signals.push_back(
        gst::Signal::padAdded(from, [entries](const gst::Pad& pad) { linkToEntry(entries, pad); }));
    mParts.signals.push_back(
        gst::Signal::noMorePads(from, [entries, object = GST_OBJECT(from.get())] {
            for (const auto& entry : entries) {
                if (!entry->linked)
                    return reportUnfit(object);
            }
        }));
}

void Builder::addReadAhead() {
    mReadAhead = add("multiqueue");
    if (mReadAhead)
        g_object_set(mReadAhead.get(), "use-interleave", TRUE, "min-interleave-time", kAheadTime,
                     "max-size-bytes", kAheadBytes, "max-size-buffers", 0U, nullptr);
}

/** Puts a queue before the pad, and returns the queue's own entry. */
gst::Pad Builder::throughReadAhead(gst::Pad pad) {
    if (!mReadAhead)
        return pad;
    gst::Pad entry(gst::kAdopt, gst_element_request_pad_simple(mReadAhead.get(), "sink_%u"));
    const std::string exit = "src" + std::string(GST_PAD_NAME(entry.get())).substr(4);
    gst_pad_link(gst::staticPad(mReadAhead, exit.c_str()).get(), pad.get());
    return entry;
}

std::shared_ptr<Entry> Builder::addBranch(const BranchPlan& plan, std::string_view media,
                                          const gst::Element& sink) {
    gst::Pad entry;
    gst::Element last;
    const auto follow = [&](const gst::Element& element) {
        if (last && element)
            gst_element_link(last.get(), element.get());
        else if (element)
            entry = gst::staticPad(element, "sink");
        last = element;
    };
    if (plan.parser)
        follow(add(plan.parser));
    if (plan.decoder)
        follow(add(plan.decoder));
    follow(add(sink));
    return makeEntry(media, mFailed ? gst::Pad() : throughReadAhead(std::move(entry)));
}

} // namespace

std::optional<Pipeline::Parts> buildFixedChain(const std::string& path, const ChainPlan& plan,
                                               const PlayerOptions& options) {
    return Builder(plan, options).build(path);
}

} // namespace engine
