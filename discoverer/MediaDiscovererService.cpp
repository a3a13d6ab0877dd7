// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererService.h"

#include <functional>
#include <string_view>
#include <utility>

#include "base/StandardOutput.h"
#include "discoverer/ClientFile.h"
#include "discoverer/IMediaDiscovererServiceCallBack.h"
#include "discoverer/MediaDiscovererController.h"
#include "log/Logging.h"

using namespace MediaServiceDefine;

/** What is peculiar to one request. */
struct MediaDiscovererService::Request {
    const wchar_t* name; ///< of the operation
    bool needsController;

    /** Uses the discoverer and answers; returns why it could not, or null. */
    std::function<const wchar_t*(int iDiscovererID, IMediaDiscovererServiceCallBack*)> use;
    std::function<void(IMediaDiscovererServiceCallBack&)> refuse;
};

namespace {

using S = MediaDiscovererService;
using C = IMediaDiscovererServiceCallBack;

constexpr int kAccepted = 0;
constexpr int kRefused = 1;
constexpr int kNotOpened = 5;

constexpr const wchar_t* kUnknownClient = L"isEnableID(iClientID) == false";
constexpr const wchar_t* kNoController = L"NULL == mpMediaDiscovererController";
constexpr const wchar_t* kNoDiscoverer = L"getDiscovererId(iClientID) == false";
constexpr const wchar_t* kIsOpen = L"NULL != mOpenFile";
constexpr const wchar_t* kDone = nullptr;

constexpr std::string_view kNotice = "notice";

// Operators have always seen the failures too among the informational lines.
void log(const wchar_t* operation, const std::wstring& event) {
    constexpr int kInformation = 6;
    LOG_EVENT(L"MediaDiscovererService", 101,
              std::wstring(L"MediaDiscovererService::") + operation + event, kInformation);
}

/** Refuses with a number. */
auto refuseWith(void (C::*answer)(int), int result) {
    return [=](C& callback) { (callback.*answer)(result); };
}

} // namespace

MediaDiscovererService::MediaDiscovererService()
    : MediaDiscovererService(std::make_unique<MediaDiscovererController>()) {}

MediaDiscovererService::MediaDiscovererService(
    std::unique_ptr<MediaDiscovererController> controller)
    : mpMediaDiscovererController(std::move(controller)) {
    if (mpMediaDiscovererController)
        connectController();
}

MediaDiscovererService::~MediaDiscovererService() = default;

void MediaDiscovererService::connectController() {
    MediaDiscovererController* const controller = mpMediaDiscovererController.get();
    connect(this, SIGNAL(initialize_signal(int)), controller, SLOT(initialize(int)));
    connect(this, SIGNAL(open_signal(int)), controller, SLOT(open(int)));
    connect(this, SIGNAL(close_signal(int)), controller, SLOT(close(int)));
    connect(this, SIGNAL(getMetadata_signal(int)), controller, SLOT(getMetadata(int)));
    connect(this, SIGNAL(getImage_signal(int)), controller, SLOT(getImage(int)));
    connect(this, SIGNAL(getExtensions_signal(int)), controller, SLOT(getSupportedExtensions(int)));
    connect(controller, SIGNAL(retOpen_signal(int, int)), this, SLOT(retOpen(int, int)));
    connect(controller, SIGNAL(retMetaData_signal(int)), this, SLOT(retMetadata(int)));
    connect(controller, SIGNAL(retImage_signal(int)), this, SLOT(retImage(int)));
    connect(controller, SIGNAL(retSupportedExtensions_signal(int)), this,
            SLOT(retSupportedExtensions(int)));
}

void MediaDiscovererService::initializeDiscoverer(int iClientID) {
    qns::printFormatted("MediaDiscovererService::initializeDiscoverer %d\n", iClientID);
    const auto use = [&](int iDiscovererID, C* callback) {
        mpMediaDiscovererController->clearOpenFile(iDiscovererID);
        emitSignal(&S::initialize_signal, iDiscovererID);
        if (callback)
            callback->initializeDiscovererCallBack(kAccepted);
        return kDone;
    };
    handle({L"initializeDiscoverer", true, use,
            refuseWith(&C::initializeDiscovererCallBack, kRefused)},
           iClientID);
}

void MediaDiscovererService::openDiscoverer(_tagFileName fileName) {
    const auto use = [&](int iDiscovererID, C*) {
        if (!mpMediaDiscovererController->setOpenFile(iDiscovererID,
                                                      std::move(fileName.strFileName)))
            return kIsOpen;
        emitSignal(&S::open_signal, iDiscovererID);
        return kDone;
    };
    handle({L"openDiscoverer", true, use, refuseWith(&C::openDiscovererCallBack, kNotOpened)},
           fileName.iClientID);
}

void MediaDiscovererService::closeDiscoverer(int iClientID) {
    const auto use = [&](int iDiscovererID, C* callback) {
        emitSignal(&S::close_signal, iDiscovererID);
        if (callback)
            callback->closeDiscovererCallBack(kAccepted);
        return kDone;
    };
    handle({L"closeDiscoverer", true, use, refuseWith(&C::closeDiscovererCallBack, kRefused)},
           iClientID);
}

void MediaDiscovererService::getMetadata(int iClientID) {
    const auto use = [&](int iDiscovererID, C*) {
        emitSignal(&S::getMetadata_signal, iDiscovererID);
        return kDone;
    };
    const auto refuse = [](C& callback) { callback.getMetaDataCallBack({}); };
    handle({L"getMetadata", false, use, refuse}, iClientID);
}

void MediaDiscovererService::getImage(_tagImageParam param) {
    const int iClientID = param.iClientID;
    setNoticePath(param.strNoticePath);
    const auto use = [&](int iDiscovererID, C*) {
        mpMediaDiscovererController->setImageParam(std::move(param), iDiscovererID);
        emitSignal(&S::getImage_signal, iDiscovererID);
        return kDone;
    };
    const auto refuse = [&](C& callback) {
        writeNotice();
        callback.getImageCallBack({kRefused, kRefused, {}, {}});
    };
    handle({L"getImage", true, use, refuse}, iClientID);
}

void MediaDiscovererService::getSupportedExtensions(int iClientID) {
    const auto use = [&](int iDiscovererID, C*) {
        emitSignal(&S::getExtensions_signal, iDiscovererID);
        return kDone;
    };
    const auto refuse = [](C& callback) { callback.getSupportedExtensionsCallBack({}); };
    handle({L"getSupportedExtensions", false, use, refuse}, iClientID);
}

void MediaDiscovererService::handle(const Request& request, int iClientID) {
    log(request.name, L" Enter.");
    auto* const callback = callbackOf(iClientID);
    int iDiscovererID = DiscovererIds::kNone;
    const wchar_t* failure = check(request, iClientID, iDiscovererID);
    if (failure == kDone)
        failure = request.use(iDiscovererID, callback);
    if (failure == kDone) {
        log(request.name, L" Leave, Success.");
        return;
    }
    log(request.name, std::wstring(L" Leave, Failed.(") + failure + L')');
    if (callback)
        request.refuse(*callback);
}

const wchar_t* MediaDiscovererService::check(const Request& request, int iClientID,
                                             int& iDiscovererID) const {
    if (!isEnableID(iClientID))
        return kUnknownClient;
    if (request.needsController && !mpMediaDiscovererController)
        return kNoController;
    iDiscovererID = mIds.getMediaDiscovererId(iClientID);
    return iDiscovererID == DiscovererIds::kNone ? kNoDiscoverer : kDone;
}

void MediaDiscovererService::emitSignal(Signal signal, int iDiscovererID) {
    try {
        Q_EMIT(this->*signal)(iDiscovererID);
    } catch (...) {
        // The client is answered for the request, not for what becomes of it.
    }
}

void MediaDiscovererService::registerCallBack(IMediaDiscovererServiceCallBack* callback) {
    if (!callback)
        return;
    const int iClientID = registerClient(callback);
    callback->setDiscovererClientID(iClientID);
    mIds.setMediaDiscovererIdList(iClientID);
}

void MediaDiscovererService::unregisterCallBack(int iClientID) {
    unregisterClient(iClientID);
    mIds.resetMediaDiscovererIdList(iClientID);
}

void MediaDiscovererService::clientEnded(int iClientID) {
    unregisterClient(iClientID);
    const int iDiscovererID = mIds.setAside(iClientID);
    if (iDiscovererID == DiscovererIds::kNone)
        return;
    // Behind all that the client has asked for, which the main thread may have to do yet.
    QMetaObject::invokeMethod(this, "takeBack", Qt::QueuedConnection, Q_ARG(int, iDiscovererID));
}

void MediaDiscovererService::takeBack(int iDiscovererID) {
    mIds.takeBack(iDiscovererID);
}

void MediaDiscovererService::retOpen(int iRet, int iDiscovererID) {
    const auto held = use();
    const int iClientID = mIds.clientOf(iDiscovererID);
    if (iClientID == DiscovererIds::kNoClient)
        mpMediaDiscovererController->clearOpenFile(iDiscovererID);
    else if (auto* const callback = callbackOf(iClientID))
        callback->openDiscovererCallBack(iRet);
}

void MediaDiscovererService::retMetadata(int iDiscovererID) {
    const auto held = use();
    if (auto* const callback = callbackOf(mIds.clientOf(iDiscovererID)))
        callback->getMetaDataCallBack(mpMediaDiscovererController->metadata(iDiscovererID));
}

void MediaDiscovererService::retImage(int iDiscovererID) {
    const auto held = use();
    if (auto* const callback = callbackOf(mIds.clientOf(iDiscovererID))) {
        writeNotice();
        callback->getImageCallBack(mpMediaDiscovererController->image(iDiscovererID));
    }
}

void MediaDiscovererService::retSupportedExtensions(int iDiscovererID) {
    const auto held = use();
    if (auto* const callback = callbackOf(mIds.clientOf(iDiscovererID)))
        callback->getSupportedExtensionsCallBack(
            mpMediaDiscovererController->extensions(iDiscovererID));
}

void MediaDiscovererService::setNoticePath(const std::wstring& path) {
    const std::lock_guard lock(mNoticeMutex);
    mNoticePath = path;
}

void MediaDiscovererService::writeNotice() const {
    std::unique_lock lock(mNoticeMutex);
    const std::wstring path = mNoticePath;
    lock.unlock();
    if (!path.empty())
        qns::writeClientFile(path, kNotice.data(), kNotice.size());
}

IMediaDiscovererServiceCallBack* MediaDiscovererService::callbackOf(int iClientID) const {
    return static_cast<IMediaDiscovererServiceCallBack*>(getCurrentMethod(iClientID));
}
