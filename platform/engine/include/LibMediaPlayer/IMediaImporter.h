// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace LibMediaPlayer {

/** MediaImporterNotify::kind. */
enum ImporterNotifyKind : int32_t {
    kImportProgress = 1, ///< text = path
    kImportFinished = 2, ///< text = final path, or message when result is not 0
    kImportStarted = 3   ///< text = path
};

/** What IMediaImporter::status() returns. */
enum ImporterState : int { kImporterIdle = 0, kImporterRunning = 1, kImporterCancelling = 2 };

struct MediaImporterNotify {
    int32_t kind = 0;
    int32_t result = 0;
    std::wstring text;
};

/** Bytes of all that is queued: done, and in all. */
struct MediaImporterStatus {
    int64_t done = 0;
    int64_t total = 0;
};

/**
 * Brings files into the media library and its database. Imports queue up and run on a thread of
 * the importer's own, on which the notifications arrive. Operations return at once: 0 when
 * accepted, or a Result.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaImporter {
public:
    virtual ~IMediaImporter() = default;

    /**
     * Queues an import of the file `path` into `folder` inside the media library, or, when it is
     * empty, catalogues the file where it lies. A kImportFinished with result 0 is sent when file
     * and database row would survive a power cut.
     */
    virtual int import(const std::wstring& path, const std::wstring& folder) = 0;

    /** Ends all queued imports with kCancelled. */
    virtual int cancel() = 0;

    /** Returns an ImporterState. */
    virtual int status(MediaImporterStatus& status) = 0;

    /** Sets who is told of events; the importer keeps its own copy. Empty: nobody. */
    virtual void setNotify(std::function<void(MediaImporterNotify&)> notify) = 0;

    /** Writes the importer's processing graph to `path` in Graphviz's dot format. */
    virtual int dumpGraph(const std::wstring& path) = 0;
};

} // namespace LibMediaPlayer
