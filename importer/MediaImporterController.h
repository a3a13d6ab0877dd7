// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>

#include <memory>
#include <mutex>
#include <string>

#include "define/ImporterDefine.h"

namespace LibMediaPlayer {
class IMediaDiscoverer;
class IMediaImporter;
struct MediaImporterNotify;
struct MediaMetaInfo;
} // namespace LibMediaPlayer

/**
 * Owns the engine's importer and makes every call to it, on the main thread. What is to be
 * imported is looked at by a discoverer first, and what that finds is told with every
 * notification until the next import.
 *
 * A request is a setter, called on any thread, and then a queued signal to the slot, which reads
 * what was set last: of two requests of the same kind that come before the slot has run, both
 * use the later values.
 *
 * The slots return what the engine answered, or -1 when there is no importer.
 */
class MediaImporterController : public QObject {
    Q_OBJECT

public:
    /** A status, and the client that asked for it. */
    struct StatusAnswer {
        int iClientID;
        MediaServiceDefine::_tagMediaImporterStatus status;
    };

    MediaImporterController();

    /** The engine may notify until it has ended. */
    ~MediaImporterController() override;

    void setTexts(std::wstring file, std::wstring folder);
    void setStatusClientID(int iClientID);

    /** The result of the last getStatus(). Any thread may call it. */
    [[nodiscard]] StatusAnswer statusAnswer() const;

    /** What importNotify_signal() told last. Any thread may call it. */
    [[nodiscard]] MediaServiceDefine::_tagMediaImporterNotify notification() const;

    /** Takes a notification of the engine, on any thread. */
    void importNotify(LibMediaPlayer::MediaImporterNotify& notify);

Q_SIGNALS:
    void importNotify_signal();
    void retImporterStatus_signal();

public Q_SLOTS:
    /** There is nothing to initialize. */
    int initialize();

    /** A file that the discoverer cannot read does not reach the importer. */
    int import();
    int cancel();

    /** Ends with retImporterStatus_signal(). */
    int getStatus();
    int generateDotFile();

private:
    [[nodiscard]] int readMetadata(const std::wstring& file, LibMediaPlayer::MediaMetaInfo& info);
    void remember(const LibMediaPlayer::MediaMetaInfo& info);

    /** Returns the file that the last import was about. */
    std::wstring store(const LibMediaPlayer::MediaImporterNotify& notify);

    template<typename T>
    [[nodiscard]] T copyOf(const T& field) const {
        const std::lock_guard lock(mMutex);
        return field;
    }

    mutable std::mutex mMutex; ///< guards all up to the engine's objects
    std::wstring mFile;
    std::wstring mFolder;
    MediaServiceDefine::_tagMediaImporterNotify mNotification;
    int mStatusClientID = -1;
    MediaServiceDefine::_tagMediaImporterStatus mStatus{-1, 0, 0, 0};

    const std::wstring mDotFileName; ///< for use in a debugger

    std::unique_ptr<LibMediaPlayer::IMediaDiscoverer> mpDiscoverer;

    /** Last, so that it ends first: its threads may notify until then. */
    std::unique_ptr<LibMediaPlayer::IMediaImporter> mpImporter;
};
