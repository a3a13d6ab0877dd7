// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>

#include <memory>
#include <mutex>
#include <string>

#include "discoverer/DiscovererIds.h"
#include "discoverer/IMediaDiscovererService.h"
#include "ptc/ClientNotify.h"

class MediaDiscovererController;

/**
 * Checks each request's client, leaves the parameters with the controller's discoverer of this
 * client, and tells it by a signal. What comes back is sent to the client that has the discoverer
 * then.
 *
 * Threads: made and destroyed on the main thread, to which the controller belongs; requests come
 * from one thread at a time, which may be another. Refusals are sent by the thread of the
 * request, results by the main thread.
 */
class MediaDiscovererService : public QObject, public IMediaDiscovererService, public ClientNotify {
    Q_OBJECT

public:
    MediaDiscovererService();

    /** Without a controller (null), requests that need one are refused. */
    explicit MediaDiscovererService(std::unique_ptr<MediaDiscovererController> controller);
    ~MediaDiscovererService() override;

    void initializeDiscoverer(int iClientID) override;
    void openDiscoverer(MediaServiceDefine::_tagFileName fileName) override;
    void closeDiscoverer(int iClientID) override;
    void getMetadata(int iClientID) override;
    void getImage(MediaServiceDefine::_tagImageParam param) override;
    void getSupportedExtensions(int iClientID) override;
    void registerCallBack(IMediaDiscovererServiceCallBack* callback) override;
    void unregisterCallBack(int iClientID) override;

Q_SIGNALS:
    void initialize_signal(int iDiscovererID);
    void open_signal(int iDiscovererID);
    void close_signal(int iDiscovererID);
    void getMetadata_signal(int iDiscovererID);
    void getImage_signal(int iDiscovererID);
    void getExtensions_signal(int iDiscovererID);

public Q_SLOTS:
    /** Without a client, makes the discoverer ready for the next one. */
    void retOpen(int iRet, int iDiscovererID);
    void retMetadata(int iDiscovererID);
    void retImage(int iDiscovererID);
    void retSupportedExtensions(int iDiscovererID);

protected:
    /** The discoverer is the last one to be given away while the client's requests last. */
    void clientEnded(int iClientID) override;

private:
    /** The discoverer has done all that an ended client had asked for. */
    Q_INVOKABLE void takeBack(int iDiscovererID);

    struct Request;
    using Signal = void (MediaDiscovererService::*)(int);

    /**
     * What all requests share: looks for the client's discoverer and lets the request use it. A
     * request that cannot is logged and refused.
     */
    void handle(const Request& request, int iClientID);

    /** Why the request must be refused, or null, with the client's discoverer. */
    [[nodiscard]] const wchar_t* check(const Request& request, int iClientID,
                                       int& iDiscovererID) const;

    void emitSignal(Signal signal, int iDiscovererID);
    void connectController();
    void setNoticePath(const std::wstring& path);
    void writeNotice() const;
    [[nodiscard]] IMediaDiscovererServiceCallBack* callbackOf(int iClientID) const;

    DiscovererIds mIds;
    mutable std::mutex mNoticeMutex; ///< guards mNoticePath
    std::wstring mNoticePath;        ///< of the last request for a picture

    /** Last, so that it ends first: until it has, its results come through here. */
    const std::unique_ptr<MediaDiscovererController> mpMediaDiscovererController;
};
