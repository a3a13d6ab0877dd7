// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/Result.h"
#include "discoverer/Details.h"

namespace discoverer {

/** Has files read and drawn by worker processes, and waits for them. */
class Discoverer : public LibMediaPlayer::IMediaDiscoverer {
public:
    int open(const std::wstring& path) override;
    int close() override;
    int metadata(LibMediaPlayer::MediaMetaInfo& info) override;
    int reserved5() override;
    int makeImage(int64_t position, int32_t width, int32_t height,
                  const std::wstring& path) override;
    int reserved7() override;
    int supportedExtensions(LibMediaPlayer::SupportedExtensions& extensions) override;

private:
    int openMedium(const std::wstring& path);

    int mFailure = LibMediaPlayer::kWrongState; ///< why no file is open
    std::string mPath;
    std::shared_ptr<const Details> mpDetails; ///< of the file that is open
};

} // namespace discoverer
