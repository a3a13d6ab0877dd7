// SPDX-License-Identifier: MIT
#include "mpris/TrackReader.h"

#include "mpris/FileUri.h"

namespace mpris {
namespace {

/** Wide enough for a desktop's panel or its lock screen. */
constexpr int kPictureWidth = 512;

/** A film's first pictures are often black. */
constexpr int kPictureAtOneIn = 10;

/** Only files can be read; what plays may come from elsewhere. */
std::optional<std::string> fileOf(const std::string& path) {
    if (isFileUri(path))
        return filePath(path);
    if (path.empty() || isUri(path))
        return std::nullopt;
    return path;
}

} // namespace

TrackReader::TrackReader(qnsmedia::Connection& connection, const Handover& handover,
                         const std::string& pictureFolder, Listener listener)
    : mHandover(handover),
      mListener(std::move(listener)),
      mFolder(pictureFolder),
      mDiscoverer(connection) {
    mDiscoverer.extensions(mHandover.to<std::exception_ptr, std::vector<std::string>>(
        [this](const std::exception_ptr& error, const std::vector<std::string>& extensions) {
            if (!error)
                mListener.extensions(extensions);
        }));
}

TrackReader::~TrackReader() {
    mFolder.remove(mPictured);
}

void TrackReader::read(const Track& track) {
    mNext = track;
    if (!mBusy)
        finished();
}

/** Asks for everything at once: the daemon works it off in order, whatever becomes of the first. */
void TrackReader::begin(const Track& track, const std::string& path) {
    mBusy = true;
    mFolder.remove(mPictured);
    mPictured = track.number;
    const int number = track.number;
    mDiscoverer.open(path, [](const std::exception_ptr&) {});
    mDiscoverer.metadata(mHandover.to<std::exception_ptr, qnsmedia::Metadata>(
        [this, number](const std::exception_ptr& error, const qnsmedia::Metadata& metadata) {
            gotTags(number, error, metadata);
        }));
    mDiscoverer.makeImage(track.duration / kPictureAtOneIn, kPictureWidth, 0, mFolder.path(number),
                          mHandover.to<std::exception_ptr>(
                              [this, number](auto error) { gotPicture(number, error); }));
    mDiscoverer.close(mHandover.to<std::exception_ptr>([this](const auto&) { finished(); }));
}

void TrackReader::gotTags(int track, const std::exception_ptr& error,
                          const qnsmedia::Metadata& metadata) {
    if (!error)
        mListener.tags(track, metadata.tags);
}

/** Without a picture the file is black. */
void TrackReader::gotPicture(int track, const std::exception_ptr& error) {
    if (error)
        mFolder.remove(track);
    else
        mListener.picture(track, mFolder.path(track));
}

void TrackReader::finished() {
    mBusy = false;
    const auto track = std::exchange(mNext, std::nullopt);
    if (const auto path = track ? fileOf(track->path) : std::nullopt)
        begin(*track, *path);
}

} // namespace mpris
