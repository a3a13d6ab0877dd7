// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "qnsmedia/Connection.h"

namespace bench {

/** Finds out what a file is, in its own way; throws std::runtime_error when it cannot. */
class MediaReader {
public:
    virtual ~MediaReader() = default;
    virtual void read(const std::string& path) = 0;
};

/** Through the daemon: open, metadata, close. */
std::unique_ptr<MediaReader> makeDaemonReader(qnsmedia::Connection& connection);
/** The engine, without the daemon. */
std::unique_ptr<MediaReader> makeEngineReader();
/** What the engine's workers do, in this process. */
std::unique_ptr<MediaReader> makeWorkerlessReader();
/** libavformat as its documentation has one use it. */
std::unique_ptr<MediaReader> makeLibavReader();
/** A command whose last argument is the file. */
std::unique_ptr<MediaReader> makeCommandReader(std::vector<std::string> command);

/** Draws the picture at a position in seconds, 320 pixels wide, as JPEG. */
class PictureDrawer {
public:
    virtual ~PictureDrawer() = default;
    virtual void draw(const std::string& path, int second, const std::string& target) = 0;
};

std::unique_ptr<PictureDrawer> makeDaemonDrawer(qnsmedia::Connection& connection);
std::unique_ptr<PictureDrawer> makeThumbnailerDrawer();

/** The engine remembers what it has read, unless it has just changed. */
void touch(const std::string& file);

/** How long it takes when the team shares the files, each member on its own thread; seconds. */
double readSideBySide(const std::vector<std::unique_ptr<MediaReader>>& team,
                      const std::vector<std::string>& files);

} // namespace bench
