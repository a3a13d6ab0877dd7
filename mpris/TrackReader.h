// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "mpris/Handover.h"
#include "mpris/PictureFolder.h"
#include "mpris/Track.h"
#include "qnsmedia/Discoverer.h"

namespace mpris {

/**
 * Has the daemon tell the tags of tracks and draw pictures of them, one track at a time. What
 * cannot be had is not told. Keeps one of the daemon's places for discoverers. For the loop's
 * thread.
 */
class TrackReader {
public:
    using Tags = std::vector<std::pair<std::string, std::string>>;

    struct Listener {
        std::function<void(int track, Tags tags)> tags;
        std::function<void(int track, const std::string& path)> picture;
        std::function<void(const std::vector<std::string>& extensions)> extensions;
    };

    /** Throws as qnsmedia::Discoverer and PictureFolder do. */
    TrackReader(qnsmedia::Connection& connection, const Handover& handover,
                const std::string& pictureFolder, Listener listener);
    ~TrackReader();
    TrackReader(const TrackReader&) = delete;
    TrackReader& operator=(const TrackReader&) = delete;

    /** Reads this track next; one that has not begun until then is left out. */
    void read(const Track& track);

private:
    void begin(const Track& track, const std::string& path);
    void gotTags(int track, const std::exception_ptr& error, const qnsmedia::Metadata& metadata);
    void gotPicture(int track, const std::exception_ptr& error);
    void finished();

    const Handover& mHandover;
    const Listener mListener;
    PictureFolder mFolder;
    std::optional<Track> mNext;
    int mPictured = 0; ///< the track whose picture there is
    bool mBusy = false;
    qnsmedia::Discoverer mDiscoverer; ///< last: what it tells uses the others
};

} // namespace mpris
