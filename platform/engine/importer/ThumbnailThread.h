// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "discoverer/Thumbnail.h"
#include "library/Database.h"

namespace importer {

/**
 * Draws a thumbnail of a file, in a bounded time whatever the file. The result kCancelled means
 * that it was not tried to the end, and costs no try.
 */
using DrawThumbnail = std::function<discoverer::Thumbnail(const std::string& path)>;

/** What a thumbnail is drawn for, and what came of it; nothing when it was not tried to the end. */
struct Drawn {
    library::MissingThumbnail missing;
    std::optional<discoverer::Thumbnail> thumbnail;
};

/**
 * Draws thumbnails on a thread of its own, one portion after another. The other functions are for
 * one thread.
 */
class ThumbnailThread {
public:
    /** `whenDone` is called on the drawing thread when a portion is done. */
    ThumbnailThread(DrawThumbnail draw, std::function<void()> whenDone);
    /** Waits for the one that is being drawn. */
    ~ThumbnailThread();
    ThumbnailThread(const ThumbnailThread&) = delete;
    ThumbnailThread& operator=(const ThumbnailThread&) = delete;

    /** Begins a portion. The one before has been taken. */
    void draw(std::vector<library::MissingThumbnail> portion);

    /** The portion when it is done; empty when there is none. Nothing while it is being drawn. */
    std::optional<std::vector<Drawn>> take();

    /** Ends the portion after the thumbnail that is being drawn, and takes it. */
    std::vector<Drawn> stop();

private:
    void run();
    Drawn* next();

    const DrawThumbnail mDraw;
    const std::function<void()> mWhenDone;
    std::mutex mMutex; ///< guards the next four; an element is the thread's while it is drawn
    std::condition_variable mChanged;
    std::vector<Drawn> mPortion;
    std::size_t mBegun = 0;
    bool mDone = true;
    bool mClosed = false;
    std::thread mThread; ///< last, for it uses the others
};

} // namespace importer
