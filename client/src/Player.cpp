// SPDX-License-Identifier: MIT
#include "qnsmedia/Player.h"

#include <mutex>
#include <optional>
#include <utility>

#include "client/src/Link.h"
#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "pack/CPack_Simplebuffer.h"
#include "ptc/Barrier.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

/** The daemon's initialize takes two seconds before the next request is looked at. */
constexpr std::chrono::seconds kInitializeTime{2};

/** Opening is answered within five seconds, whatever the medium. */
constexpr std::chrono::seconds kOpenTime{6};

/** Stands for "the outcome of an open" among the answers that are waited for. */
constexpr long kOpenedAnswer = -1;

struct Operation {
    PlayerMethod method;
    PlayerCallBack answer;
    const char* name;
    Link::Answers answers = Link::Answers::inOrder;
};

constexpr Operation kRegister{PlayerMethod::registerCallBack, PlayerCallBack::setPlayerClientID,
                              "register"};
constexpr Operation kInitialize{PlayerMethod::initializePlayer, PlayerCallBack::initializePlayer,
                                "initialize"};
constexpr Operation kOpen{PlayerMethod::openPlayer, PlayerCallBack::openPlayer, "open"};
constexpr Operation kClose{PlayerMethod::closePlayer, PlayerCallBack::closePlayer, "close"};
constexpr Operation kPlay{PlayerMethod::play, PlayerCallBack::play, "play"};
constexpr Operation kPause{PlayerMethod::pause, PlayerCallBack::pause, "pause"};
constexpr Operation kSeek{PlayerMethod::seek, PlayerCallBack::seek, "seek"};
constexpr Operation kRepeat{PlayerMethod::setRepeat, PlayerCallBack::setRepeat, "repeat"};
constexpr Operation kStatus{PlayerMethod::getPlayerStatus, PlayerCallBack::getPlayerStatus,
                            "status", Link::Answers::shared};
constexpr Operation kPowerOff{PlayerMethod::powerOffMediaPlayer,
                              PlayerCallBack::powerOffMediaPlayer, "power off"};

/** A callback that keeps the promise whose future the caller holds. */
template<typename Value>
std::pair<std::future<Value>, std::shared_ptr<std::promise<Value>>> makePromise() {
    auto promise = std::make_shared<std::promise<Value>>();
    auto future = promise->get_future();
    return {std::move(future), std::move(promise)};
}

PlayerNotification readNotification(ArgumentReader& arguments) {
    PlayerNotification notification;
    int kind = 0;
    arguments.read(kind);
    notification.kind = static_cast<NotificationKind>(kind);
    arguments.read(notification.result);
    arguments.read(notification.text);
    arguments.read(notification.param1);
    arguments.read(notification.param2);
    arguments.read(notification.param3);
    arguments.read(notification.value1);
    arguments.read(notification.value2);
    arguments.read(notification.value);
    return notification;
}

PlayerStatus readStatus(ArgumentReader& arguments) {
    int state = 0;
    int reserved = 0;
    long position = 0;
    long duration = 0;
    arguments.read(state);
    arguments.read(reserved);
    arguments.read(position);
    arguments.read(duration);
    return {static_cast<PlayerState>(state), Nanoseconds(position), Nanoseconds(duration)};
}

} // namespace

/** The two objects that the daemon calls, and what waits for their events. */
class Player::Implementation {
public:
    explicit Implementation(std::shared_ptr<Link> link);
    ~Implementation();

    [[nodiscard]] int clientId() const { return mClientId; }
    void onNotification(NotificationHandler handler);

    /** A request whose answer is 0 for accepted. */
    void call(const Operation& operation, PackedArguments& arguments, Callback callback,
              std::chrono::milliseconds extraTime = {});
    void call(const Operation& operation, Callback callback,
              std::chrono::milliseconds extraTime = {});
    std::future<void> call(const Operation& operation, PackedArguments& arguments,
                           std::chrono::milliseconds extraTime = {});
    std::future<void> call(const Operation& operation, std::chrono::milliseconds extraTime = {});

    void send(const Operation& operation, PackedArguments& arguments, Link::Completion completion,
              std::chrono::milliseconds extraTime = {});
    void post(PlayerMethod method, PackedArguments& arguments);
    PackedArguments ownId() const;
    PackedArguments openArguments(const std::string& path) const;

    std::future<MediaInfo> openMedia(const std::string& path);

private:
    void registerClient();
    void notified(ArgumentReader& arguments);
    void opened(const PlayerNotification& notification);
    void awaitOpened(Callback failed);
    void failOpen(std::exception_ptr error);

    std::shared_ptr<Link> mpLink;
    int mClientId = 0;

    std::mutex mMutex; ///< guards the next two
    NotificationHandler mHandler;
    std::shared_ptr<std::promise<MediaInfo>> mpOpening;

    ObjectClaim mNotifyObject; ///< last: from here on events come
    ObjectClaim mCallBackObject;
};

Player::Implementation::Implementation(std::shared_ptr<Link> link)
    : mpLink(std::move(link)),
      mNotifyObject(mpLink, [this](long, ArgumentReader& arguments) { notified(arguments); }),
      mCallBackObject(mpLink, [this](long method, ArgumentReader& arguments) {
          mpLink->answer(mCallBackObject.id(), method, arguments);
      }) {
    if (mCallBackObject.id() == 0 || mNotifyObject.id() == 0)
        throw Error("too many players on one connection");
    registerClient();
}

Player::Implementation::~Implementation() {
    PackedArguments id = ownId();
    post(PlayerMethod::unregisterNotify, id);
    post(PlayerMethod::unregisterCallBack, id);
    mpLink->abandon(mCallBackObject.id());
    mpLink->abandon(mNotifyObject.id());
}

void Player::Implementation::registerClient() {
    PackedArguments arguments;
    arguments.int64(mCallBackObject.id()).int64(mpLink->identity());
    auto [future, promise] = makePromise<int>();
    send(kRegister, arguments, [promise](std::exception_ptr error, ArgumentReader* answer) {
        if (error)
            return promise->set_exception(error);
        int id = 0;
        answer->read(id);
        promise->set_value(id);
    });
    try {
        mClientId = future.get();
    } catch (const TimedOut&) {
        throw TimedOut("the daemon did not answer the registration of identity " +
                       std::to_string(mpLink->identity()) +
                       "; it serves an identity only once in its life, so another process may "
                       "have used this one before");
    }
    PackedArguments notify;
    notify.int64(mNotifyObject.id()).int64(mpLink->identity()).int32(mClientId);
    post(PlayerMethod::registerNotify, notify);
}

void Player::Implementation::onNotification(NotificationHandler handler) {
    const std::lock_guard lock(mMutex);
    mHandler = std::move(handler);
}

PackedArguments Player::Implementation::ownId() const {
    PackedArguments arguments;
    arguments.int32(mClientId);
    return arguments;
}

PackedArguments Player::Implementation::openArguments(const std::string& path) const {
    PackedArguments arguments = ownId();
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), path);
    return arguments;
}

void Player::Implementation::post(PlayerMethod method, PackedArguments& arguments) {
    mpLink->post(kPlayerAdapterId, static_cast<long>(method), arguments);
}

void Player::Implementation::send(const Operation& operation, PackedArguments& arguments,
                                  Link::Completion completion,
                                  std::chrono::milliseconds extraTime) {
    Link::Request request;
    request.service = kPlayerAdapterId;
    request.method = static_cast<long>(operation.method);
    request.replyObject = mCallBackObject.id();
    request.replyMethod = static_cast<long>(operation.answer);
    request.answers = operation.answers;
    request.deadline = mpLink->deadline() + extraTime;
    request.what = operation.name;
    mpLink->request(request, arguments, std::move(completion));
}

void Player::Implementation::call(const Operation& operation, PackedArguments& arguments,
                                  Callback callback, std::chrono::milliseconds extraTime) {
    const std::string name = operation.name;
    send(
        operation, arguments,
        [name, callback = std::move(callback)](std::exception_ptr error, ArgumentReader* answer) {
            int result = 0;
            if (answer != nullptr)
                answer->read(result);
            if (result != 0)
                error = std::make_exception_ptr(Refused(name + ": refused by the daemon"));
            PTC::barrier([&] { callback(error); });
        },
        extraTime);
}

void Player::Implementation::call(const Operation& operation, Callback callback,
                                  std::chrono::milliseconds extraTime) {
    PackedArguments arguments = ownId();
    call(operation, arguments, std::move(callback), extraTime);
}

std::future<void> Player::Implementation::call(const Operation& operation,
                                               PackedArguments& arguments,
                                               std::chrono::milliseconds extraTime) {
    auto [future, promise] = makePromise<void>();
    call(
        operation, arguments,
        [promise = promise](std::exception_ptr error) {
            error ? promise->set_exception(error) : promise->set_value();
        },
        extraTime);
    return std::move(future);
}

std::future<void> Player::Implementation::call(const Operation& operation,
                                               std::chrono::milliseconds extraTime) {
    PackedArguments arguments = ownId();
    return call(operation, arguments, extraTime);
}

std::future<MediaInfo> Player::Implementation::openMedia(const std::string& path) {
    auto [future, promise] = makePromise<MediaInfo>();
    failOpen(std::make_exception_ptr(TimedOut("open: another open took its place")));
    {
        const std::lock_guard lock(mMutex);
        mpOpening = promise;
    }
    const auto failed = [this](std::exception_ptr error) {
        if (error)
            failOpen(error);
    };
    awaitOpened(failed);
    PackedArguments arguments = openArguments(path);
    call(kOpen, arguments, failed);
    return std::move(future);
}

/** The outcome is no answer to a request but a notification, and has a deadline all the same. */
void Player::Implementation::awaitOpened(Callback failed) {
    Link::Request outcome;
    outcome.replyObject = mNotifyObject.id();
    outcome.replyMethod = kOpenedAnswer;
    outcome.answers = Link::Answers::shared;
    outcome.deadline = mpLink->deadline() + kOpenTime;
    outcome.what = kOpen.name;
    mpLink->await(outcome, [failed = std::move(failed)](std::exception_ptr error, ArgumentReader*) {
        failed(error);
    });
}

void Player::Implementation::failOpen(std::exception_ptr error) {
    std::shared_ptr<std::promise<MediaInfo>> promise;
    {
        const std::lock_guard lock(mMutex);
        promise = std::exchange(mpOpening, nullptr);
    }
    if (promise)
        promise->set_exception(error);
}

void Player::Implementation::notified(ArgumentReader& arguments) {
    const PlayerNotification notification = readNotification(arguments);
    if (notification.kind == NotificationKind::opened) {
        opened(notification);
        mpLink->answer(mNotifyObject.id(), kOpenedAnswer, arguments);
    }
    NotificationHandler handler;
    {
        const std::lock_guard lock(mMutex);
        handler = mHandler;
    }
    if (handler)
        PTC::barrier([&] { handler(notification); });
}

void Player::Implementation::opened(const PlayerNotification& notification) {
    if (notification.result != 0) {
        failOpen(std::make_exception_ptr(MediaError(notification.result, notification.text)));
        return;
    }
    std::shared_ptr<std::promise<MediaInfo>> promise;
    {
        const std::lock_guard lock(mMutex);
        promise = std::exchange(mpOpening, nullptr);
    }
    if (promise)
        promise->set_value(mediaInfoOf(notification));
}

Player::Player(Connection& connection)
    : mpImplementation(std::make_shared<Implementation>(connection.mpLink)) {}

Player::~Player() = default;

int Player::clientId() const {
    return mpImplementation->clientId();
}

void Player::onNotification(NotificationHandler handler) {
    mpImplementation->onNotification(std::move(handler));
}

std::future<void> Player::initialize() {
    return mpImplementation->call(kInitialize, kInitializeTime);
}

void Player::initialize(Callback callback) {
    mpImplementation->call(kInitialize, std::move(callback), kInitializeTime);
}

std::future<void> Player::open(const std::string& path) {
    PackedArguments arguments = mpImplementation->openArguments(path);
    return mpImplementation->call(kOpen, arguments);
}

void Player::open(const std::string& path, Callback callback) {
    PackedArguments arguments = mpImplementation->openArguments(path);
    mpImplementation->call(kOpen, arguments, std::move(callback));
}

std::future<MediaInfo> Player::openMedia(const std::string& path) {
    return mpImplementation->openMedia(path);
}

std::future<void> Player::close() {
    return mpImplementation->call(kClose);
}

void Player::close(Callback callback) {
    mpImplementation->call(kClose, std::move(callback));
}

std::future<void> Player::play() {
    return mpImplementation->call(kPlay);
}

void Player::play(Callback callback) {
    mpImplementation->call(kPlay, std::move(callback));
}

std::future<void> Player::pause() {
    return mpImplementation->call(kPause);
}

void Player::pause(Callback callback) {
    mpImplementation->call(kPause, std::move(callback));
}

std::future<void> Player::seek(Nanoseconds position, SeekMode mode) {
    PackedArguments arguments = mpImplementation->ownId();
    arguments.int32(static_cast<int>(mode)).int64(position.count()).boolean(false);
    return mpImplementation->call(kSeek, arguments);
}

void Player::seek(Nanoseconds position, SeekMode mode, Callback callback) {
    PackedArguments arguments = mpImplementation->ownId();
    arguments.int32(static_cast<int>(mode)).int64(position.count()).boolean(false);
    mpImplementation->call(kSeek, arguments, std::move(callback));
}

std::future<void> Player::repeat(Nanoseconds start, Nanoseconds end) {
    PackedArguments arguments = mpImplementation->ownId();
    arguments.boolean(true).int64(start.count()).int64(end.count());
    return mpImplementation->call(kRepeat, arguments);
}

void Player::repeat(Nanoseconds start, Nanoseconds end, Callback callback) {
    PackedArguments arguments = mpImplementation->ownId();
    arguments.boolean(true).int64(start.count()).int64(end.count());
    mpImplementation->call(kRepeat, arguments, std::move(callback));
}

std::future<void> Player::noRepeat() {
    PackedArguments arguments = mpImplementation->ownId();
    arguments.boolean(false).int64(0).int64(-1);
    return mpImplementation->call(kRepeat, arguments);
}

void Player::noRepeat(Callback callback) {
    PackedArguments arguments = mpImplementation->ownId();
    arguments.boolean(false).int64(0).int64(-1);
    mpImplementation->call(kRepeat, arguments, std::move(callback));
}

std::future<PlayerStatus> Player::status() {
    auto [future, promise] = makePromise<PlayerStatus>();
    status([promise = promise](std::exception_ptr error, PlayerStatus status) {
        error ? promise->set_exception(error) : promise->set_value(status);
    });
    return std::move(future);
}

void Player::status(StatusCallback callback) {
    PackedArguments arguments = mpImplementation->ownId();
    mpImplementation->send(
        kStatus, arguments,
        [callback = std::move(callback)](std::exception_ptr error, ArgumentReader* answer) {
            const PlayerStatus status = answer ? readStatus(*answer) : PlayerStatus{};
            PTC::barrier([&] { callback(error, status); });
        });
}

void Player::setSystemFormat(SystemFormat format) {
    PackedArguments arguments;
    arguments.int32(static_cast<int>(format));
    mpImplementation->post(PlayerMethod::setSystemFormat, arguments);
}

std::future<void> Player::powerOff() {
    return mpImplementation->call(kPowerOff);
}

void Player::powerOff(Callback callback) {
    mpImplementation->call(kPowerOff, std::move(callback));
}

} // namespace qnsmedia
