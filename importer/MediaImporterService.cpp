// SPDX-License-Identifier: MIT
#include "importer/MediaImporterService.h"

#include <utility>

#include "importer/IMediaImporterServiceCallBack.h"
#include "importer/MediaImporterController.h"
#include "log/Logging.h"

/** What is peculiar to one kind of request. */
struct ImporterRequest {
    const char* name; ///< of the operation
    void (MediaImporterService::*signal)();
    void (IMediaImporterServiceCallBack::*answer)(int);
    int entered; ///< codes of the log lines
    int succeeded;
    int unknownClient;
    int noController;
    int failureLevel;
};

namespace {

using S = MediaImporterService;
using C = IMediaImporterServiceCallBack;

constexpr int kInformation = 6;
constexpr int kError = 3;

// Operators have always seen the failures of cancel among the informational lines.
// clang-format off
constexpr ImporterRequest
    kInitialize{"initializeImporter", &S::initialize_signal, &C::initializeImporterCallBack, 101, 102, 401, 402, kError},
    kImport    {"import",             &S::import_signal,     &C::importCallBack,             103, 104, 403, 404, kError},
    kCancel    {"cancel",             &S::cancel_signal,     &C::cancelCallBack,             105, 106, 405, 406, kInformation};
// clang-format on

constexpr char kModule[] = "MediaImporterService";

constexpr int kAccepted = 0;
constexpr int kRefused = 1;
constexpr MediaServiceDefine::_tagMediaImporterStatus kUnknownClientStatus{2, 0, 0, 0};

} // namespace

MediaImporterService::MediaImporterService()
    : MediaImporterService(std::make_unique<MediaImporterController>()) {}

MediaImporterService::MediaImporterService(std::unique_ptr<MediaImporterController> controller)
    : mpMediaImporterController(std::move(controller)) {
    if (mpMediaImporterController)
        connectController();
}

MediaImporterService::~MediaImporterService() = default;

void MediaImporterService::connectController() {
    MediaImporterController* const controller = mpMediaImporterController.get();
    connect(this, SIGNAL(initialize_signal()), controller, SLOT(initialize()));
    connect(this, SIGNAL(import_signal()), controller, SLOT(import()));
    connect(this, SIGNAL(cancel_signal()), controller, SLOT(cancel()));
    connect(this, SIGNAL(getStatus_signal()), controller, SLOT(getStatus()));
    connect(this, SIGNAL(generateDotFile_signal()), controller, SLOT(generateDotFile()));
    connect(controller, SIGNAL(importNotify_signal()), this, SLOT(importNotify()));
    connect(controller, SIGNAL(retImporterStatus_signal()), this, SLOT(retImporterStatus()));
}

void MediaImporterService::initializeImporter(int iClientID) {
    handle(kInitialize, iClientID);
}

void MediaImporterService::import(MediaServiceDefine::_tagImportParam param) {
    handle(kImport, param.iClientID, [&] {
        mpMediaImporterController->setTexts(std::move(param.strParam1), std::move(param.strParam2));
    });
}

void MediaImporterService::cancel(int iClientID) {
    handle(kCancel, iClientID);
}

template<typename Store>
void MediaImporterService::handle(const ImporterRequest& request, int iClientID, Store store) {
    auto* const callback = callbackOf(iClientID);
    const auto answer = [&](int result) {
        if (callback)
            (callback->*request.answer)(result);
    };
    const auto refuse = [&](int code, const char* reason) {
        LOG_EVENT(request.failureLevel, kModule, code,
                  "MediaImporterService::%s Leave, Failed.(%s)", request.name, reason);
        answer(kRefused);
    };
    LOG_EVENT(kInformation, kModule, request.entered, "MediaImporterService::%s Enter.",
              request.name);
    if (!isEnableID(iClientID))
        return refuse(request.unknownClient, "isEnableID(iClientID) == false");
    if (!mpMediaImporterController)
        return refuse(request.noController, "NULL == mpMediaImporterController");
    store();
    emitSignal(request.signal);
    answer(kAccepted);
    LOG_EVENT(kInformation, kModule, request.succeeded, "MediaImporterService::%s Leave, Success.",
              request.name);
}

void MediaImporterService::handle(const ImporterRequest& request, int iClientID) {
    handle(request, iClientID, [] {});
}

void MediaImporterService::emitSignal(void (MediaImporterService::*signal)()) {
    try {
        Q_EMIT(this->*signal)();
    } catch (...) {
        // The client is answered for the request, not for what becomes of it.
    }
}

void MediaImporterService::getImporterStatus(int iClientID) {
    auto* const callback = callbackOf(iClientID);
    if (!isEnableID(iClientID)) {
        LOG_EVENT(kError, kModule, 407,
                  "MediaImporterService::getImporterStatus Leave, "
                  "Failed.(isEnableID(iClientID) == false)");
        if (callback)
            callback->getImporterStatusCallBack(kUnknownClientStatus);
        return;
    }
    if (!mpMediaImporterController)
        return;
    mpMediaImporterController->setStatusClientID(iClientID);
    emitSignal(&MediaImporterService::getStatus_signal);
}

void MediaImporterService::retImporterStatus() {
    const auto [iClientID, status] = mpMediaImporterController->statusAnswer();
    const auto held = use();
    if (auto* const callback = callbackOf(iClientID))
        callback->getImporterStatusCallBack(status);
}

void MediaImporterService::importNotify() {
    const auto notification = mpMediaImporterController->notification();
    const auto held = use();
    for (const auto& [iClientID, object] : notifyClients())
        if (auto* const notify = static_cast<IMediaImporterServiceNotify*>(object))
            notify->mediaImporterNotify(notification);
}

void MediaImporterService::registerCallBack(IMediaImporterServiceCallBack* callback) {
    if (callback)
        callback->setImporterClientID(registerClient(callback));
}

void MediaImporterService::registerNotify(_tagIMediaImporterServiceNotify notify) {
    if (notify.pNotify)
        registerNotifyClient(notify.iClientID, notify.pNotify);
}

void MediaImporterService::unregisterCallBack(int iClientID) {
    unregisterClient(iClientID);
}

void MediaImporterService::unregisterNotify(int iClientID) {
    unregisterNotifyClient(iClientID);
}

IMediaImporterServiceCallBack* MediaImporterService::callbackOf(int iClientID) const {
    return static_cast<IMediaImporterServiceCallBack*>(getCurrentMethod(iClientID));
}
