// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <thread>

#include "LibMediaPlayer/IMediaImporter.h"
#include "importer/Catalogue.h"
#include "importer/JobQueue.h"
#include "importer/Options.h"
#include "importer/Outlet.h"
#include "importer/Thumbnails.h"

namespace importer {

/** The engine's importer: a queue, and the thread that works it off. */
class Importer final : public LibMediaPlayer::IMediaImporter {
public:
    explicit Importer(Options options);
    /** Drops what is not finished without an answer; a copy under way stops at once. */
    ~Importer() override;

    int import(const std::wstring& path, const std::wstring& folder) override;
    int cancel() override;
    int status(LibMediaPlayer::MediaImporterStatus& status) override;
    void setNotify(std::function<void(LibMediaPlayer::MediaImporterNotify&)> notify) override;
    int dumpGraph(const std::wstring& path) override;

private:
    void run();
    void runBatch(Job first);

    const Options mOptions;
    JobQueue mQueue;
    Outlet mOutlet;
    Catalogue mCatalogue;   ///< only the thread's
    Thumbnails mThumbnails; ///< only the thread's
    std::thread mThread;    ///< last, for it uses the others
};

} // namespace importer
