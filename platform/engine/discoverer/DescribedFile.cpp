// SPDX-License-Identifier: MIT
#include "discoverer/DescribedFile.h"

#include <algorithm>

#include "LibMediaPlayer/Result.h"
#include "discoverer/Description.h"
#include "discoverer/OpenMedia.h"

namespace discoverer {

using namespace LibMediaPlayer;
using probe::MediaFile;

namespace {

bool hasPicture(const AVFormatContext& context) {
    return std::any_of(
        context.streams, context.streams + context.nb_streams,
        [](const AVStream* stream) { return probe::isVideo(*stream) || probe::isCover(*stream); });
}

} // namespace

int DescribedFile::open(const std::string& path) {
    close();
    mDetails = mCache.find(FileIdentity(path));
    if (mDetails)
        return kOk;
    const int result = openMedia(path, MediaFile::kLook, mpFile);
    if (mpFile)
        mIdentity = FileIdentity(mpFile->status());
    return result;
}

void DescribedFile::close() {
    mpFile.reset();
    mDetails.reset();
}

std::shared_ptr<const Details> DescribedFile::describe() {
    if (mpFile)
        read();
    return mDetails;
}

void DescribedFile::read() {
    mDetails = std::make_shared<Details>(
        Details{discoverer::describe(*mpFile), hasPicture(mpFile->context())});
    if (mIdentity.isSettled() && mIdentity == FileIdentity(mpFile->status()))
        mCache.put(mIdentity, mDetails);
    mpFile.reset();
}

} // namespace discoverer
