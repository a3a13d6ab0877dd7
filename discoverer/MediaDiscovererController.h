// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>

#include <array>
#include <memory>
#include <mutex>
#include <string>

#include "define/DiscovererDefine.h"
#include "discoverer/DiscovererIds.h"

struct simplebuffer;

namespace LibMediaPlayer {
class IMediaDiscoverer;
struct MediaMetaInfo;
} // namespace LibMediaPlayer

/**
 * Owns the engine's discoverers, one for each of the ten clients that can be served at a time,
 * and makes every call to them, on the main thread. An engine that gives none for some of them
 * fails only the requests for these.
 *
 * A request is a setter, called on any thread, and then a queued signal to the slot, which reads
 * what was set last: of two requests of the same kind that come before the slot has run, both
 * use the later values. A slot leaves its result here and tells so with a signal.
 *
 * Every `iDiscovererID` is from 0 to 9. The slots return what the engine answered, or -1 when
 * there is no discoverer.
 */
class MediaDiscovererController : public QObject {
    Q_OBJECT

public:
    MediaDiscovererController();
    ~MediaDiscovererController() override;

    /** Names the file that open() is to open. False, and nothing changes, when one is open. */
    [[nodiscard]] bool setOpenFile(int iDiscovererID, std::wstring fileName);

    /** From now on no file counts as open. */
    void clearOpenFile(int iDiscovererID);

    void setImageParam(MediaServiceDefine::_tagImageParam param, int iDiscovererID);

    /** The last results. For the main thread. */
    [[nodiscard]] const MediaServiceDefine::_tagMediaImageInfo& image(int iDiscovererID) const;
    [[nodiscard]] const MediaServiceDefine::_tagSupportedExtensions&
    extensions(int iDiscovererID) const;

    /** The blocks of streams are there only while retMetaData_signal() is sent. */
    [[nodiscard]] const MediaServiceDefine::_tagMediaMetaInfo& metadata(int iDiscovererID) const;

    /** Append one stream. They return 1, or 0 when memory is out. */
    static int serializeVideoMetaInfo(simplebuffer& buffer,
                                      const MediaServiceDefine::_tagVideoMetaInfo& info);
    static int serializeAudioMetaInfo(simplebuffer& buffer,
                                      const MediaServiceDefine::_tagAudioMetaInfo& info);

Q_SIGNALS:
    void retOpen_signal(int iRet, int iDiscovererID);

    /** Its receivers must be called directly. */
    void retMetaData_signal(int iDiscovererID);
    void retImage_signal(int iDiscovererID);
    void retSupportedExtensions_signal(int iDiscovererID);

public Q_SLOTS:
    /** There is nothing to initialize. */
    int initialize(int iDiscovererID);

    /** Tells 5 when there is no discoverer; the file then counts as open all the same. */
    int open(int iDiscovererID);
    int close(int iDiscovererID);
    int getMetadata(int iDiscovererID);

    /**
     * Leaves a black picture where the engine could make none. What fails earlier leaves none,
     * and the names in the result are those of the request before.
     */
    int getImage(int iDiscovererID);
    int getSupportedExtensions(int iDiscovererID);

private:
    /** What belongs to one client's discoverer. */
    struct Discoverer {
        std::wstring openFile;                         ///< empty: none; guarded by mMutex
        MediaServiceDefine::_tagImageParam imageParam; ///< guarded by mMutex

        MediaServiceDefine::_tagMediaMetaInfo metadata;
        MediaServiceDefine::_tagMediaImageInfo image;
        MediaServiceDefine::_tagSupportedExtensions extensions;
        std::unique_ptr<LibMediaPlayer::IMediaDiscoverer> pEngine;
    };

    [[nodiscard]] Discoverer& at(int iDiscovererID);
    [[nodiscard]] const Discoverer& at(int iDiscovererID) const;

    template<typename T>
    [[nodiscard]] T copyOf(const T& parameter) const {
        const std::lock_guard lock(mMutex);
        return parameter;
    }

    /** The engine's result; a failure is logged as that of the `operation`. */
    int readMetadata(Discoverer& discoverer, const wchar_t* operation,
                     LibMediaPlayer::MediaMetaInfo& info) const;
    int makeImage(Discoverer& discoverer, const MediaServiceDefine::_tagImageParam& param,
                  int64_t duration) const;

    mutable std::mutex mMutex; ///< guards the parameters
    std::array<Discoverer, kDiscovererCount> mDiscoverers;
};
