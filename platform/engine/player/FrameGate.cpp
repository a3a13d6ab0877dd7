// SPDX-License-Identifier: MIT
#include "player/FrameGate.h"

#include <algorithm>
#include <memory>

#include "LibMediaPlayer/IMediaPlayer.h"

namespace engine {

bool FrameGate::passes(Nanoseconds time) {
    if (!mLatest || time < *mLatest)
        mDue = time;
    mLatest = time;
    const Nanoseconds slack = mPeriod / 2;
    if (time < mDue - slack)
        return false;
    mDue = std::max(mDue, time - slack) + mPeriod;
    return true;
}

int displayRate(int format) {
    return format == LibMediaPlayer::kDisplay50Hz ? 50 : 60;
}

gst::PadProbe limitFrames(const gst::Element& sink, int displayRate) {
    return {gst::staticPad(sink, "sink"), GST_PAD_PROBE_TYPE_BUFFER,
            [gate = std::make_shared<FrameGate>(displayRate)](const GstPadProbeInfo& info) {
                const GstClockTime time = GST_BUFFER_PTS(GST_BUFFER_CAST(info.data));
                if (!GST_CLOCK_TIME_IS_VALID(time) || gate->passes(Nanoseconds(time)))
                    return GST_PAD_PROBE_OK;
                return GST_PAD_PROBE_DROP;
            }};
}

} // namespace engine
