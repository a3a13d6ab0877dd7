// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "LibMediaPlayer/IMediaDiscoverer.h"

/**
 * A discoverer that looks at nothing. With a script it reports each call with the number that it
 * has in the process, such as `discoverer 0 open "/a b.mp4"`, and waits for the answer, such as
 * `return 0`; for metadata as MetadataText.h says, for extensions `return 0 "mp3,mp4" 2`. Without
 * one, or when it has gone, every call succeeds and tells nothing.
 *
 * All discoverers of a process share the script that the environment variable
 * QNS_DISCOVERER_DOUBLE names. Any thread may use any of them.
 */
class ScriptedDiscoverer : public LibMediaPlayer::IMediaDiscoverer {
public:
    /** Reported as `discoverer 0 create`; null when the script answers `null`. */
    static std::unique_ptr<ScriptedDiscoverer> create();

    /** Reported as `discoverer 0 destroy`. */
    ~ScriptedDiscoverer() override;

    int open(const std::wstring& path) override;
    int close() override;
    int metadata(LibMediaPlayer::MediaMetaInfo& info) override;
    int reserved5() override;
    int makeImage(int64_t position, int32_t width, int32_t height,
                  const std::wstring& path) override;
    int reserved7() override;
    int supportedExtensions(LibMediaPlayer::SupportedExtensions& extensions) override;

private:
    explicit ScriptedDiscoverer(int number) : mNumber(number) {}

    /** The words of the answer; none without a script. */
    [[nodiscard]] std::vector<std::wstring> ask(std::string_view call) const;
    [[nodiscard]] int call(std::string_view call) const;

    int mNumber;
};
