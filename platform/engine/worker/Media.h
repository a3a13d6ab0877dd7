// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "worker/Pool.h"

/**
 * What the engine asks its workers. Each of these ends in a bounded time whatever the file, and
 * tells kDamaged of one that ends a worker, kTimedOut of one that stops it, and kNotAvailable
 * where no worker can be started. Any thread.
 */
namespace worker {

/** Whether and how a file can be played. */
probe::LookResult lookAt(const std::string& path, Pool& pool = Pool::shared());

/** What a file is. `name` is its path, for the log. Returns 0 or a LibMediaPlayer::Result. */
int describe(const probe::RegularFile& file, const std::string& name, discoverer::Details& details,
             Pool& pool = Pool::shared());

/** Writes a picture of the file to `output`. Returns 0 or a LibMediaPlayer::Result. */
int draw(const std::string& path, const Drawing& drawing, int output, Pool& pool = Pool::shared());

/** The file's cover or an early picture of the film. */
discoverer::Thumbnail drawThumbnail(const std::string& path, Pool& pool = Pool::shared());

/** The names of the containers that can be read, comma separated. */
int findDemuxers(std::string& names, Pool& pool = Pool::shared());

} // namespace worker
