// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>

#include <memory>

#include "importer/IMediaImporterService.h"
#include "importer/IMediaImporterServiceNotify.h"
#include "ptc/ClientNotify.h"

class MediaImporterController;
struct ImporterRequest;

/**
 * Checks each request's client, leaves the parameters with the controller, tells it by a signal
 * and answers at once.
 *
 * Threads: made and destroyed on the main thread, to which the controller belongs and on which
 * notifications are passed on; requests come from one thread at a time, which may be another.
 */
class MediaImporterService : public QObject, public IMediaImporterService, public ClientNotify {
    Q_OBJECT

public:
    MediaImporterService();

    /** Works for the given controller; without one, requests are refused. */
    explicit MediaImporterService(std::unique_ptr<MediaImporterController> controller);
    ~MediaImporterService() override;

    void initializeImporter(int iClientID) override;
    void import(MediaServiceDefine::_tagImportParam param) override;
    void cancel(int iClientID) override;
    void getImporterStatus(int iClientID) override;
    void registerCallBack(IMediaImporterServiceCallBack* callback) override;
    void registerNotify(_tagIMediaImporterServiceNotify notify) override;
    void unregisterCallBack(int iClientID) override;
    void unregisterNotify(int iClientID) override;

Q_SIGNALS:
    void initialize_signal();
    void import_signal();
    void cancel_signal();
    void getStatus_signal();
    void generateDotFile_signal();

public Q_SLOTS:
    /** Passes the controller's notification on to every notify object, lowest client id first. */
    void importNotify();

    /** Answers the client that asked for the status, if it is still registered. */
    void retImporterStatus();

private:
    /** All requests but getImporterStatus(): check, `store` the parameters, emit, answer. */
    template<typename Store>
    void handle(const ImporterRequest& request, int iClientID, Store store);
    void handle(const ImporterRequest& request, int iClientID);

    void emitSignal(void (MediaImporterService::*signal)());
    void connectController();
    [[nodiscard]] IMediaImporterServiceCallBack* callbackOf(int iClientID) const;

    /** Last, so that it ends first: until it has, its notifications come through here. */
    const std::unique_ptr<MediaImporterController> mpMediaImporterController;
};
