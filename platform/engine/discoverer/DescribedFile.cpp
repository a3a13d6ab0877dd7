// SPDX-License-Identifier: MIT
#include "discoverer/DescribedFile.h"

#include "LibMediaPlayer/Result.h"
#include "worker/Media.h"

namespace discoverer {

using namespace LibMediaPlayer;

namespace {

FileIdentity identify(const probe::RegularFile& file) {
    struct stat status {};
    return ::fstat(file.fd.get(), &status) == 0 ? FileIdentity(status) : FileIdentity();
}

} // namespace

int describeFile(const std::string& path, std::shared_ptr<const Details>& pDetails,
                 DetailsCache& cache) {
    pDetails = cache.find(FileIdentity(path));
    if (pDetails)
        return kOk;
    probe::RegularFile file;
    if (const int result = file.open(path); result != kOk)
        return result;
    const FileIdentity identity = identify(file);
    Details details;
    if (const int result = worker::describe(file, path, details); result != kOk)
        return result;
    pDetails = std::make_shared<Details>(std::move(details));
    if (identity.isSettled() && identity == identify(file))
        cache.put(identity, pDetails);
    return kOk;
}

} // namespace discoverer
