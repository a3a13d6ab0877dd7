// SPDX-License-Identifier: MIT
#include "client/src/PlayerClient.h"

#include <future>
#include <utility>

#include "client/src/PlayerRecords.h"
#include "define/ObjectIds.h"
#include "pack/CPack_Simplebuffer.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr PlayerOperation kRegister{PlayerMethod::registerCallBack,
                                    PlayerCallBack::setPlayerClientID, "register"};
constexpr PlayerOperation kOpen{PlayerMethod::openPlayer, PlayerCallBack::openPlayer, "open"};

/** The engine tells of an open within five seconds, whatever the medium. */
constexpr std::chrono::seconds kOpenTime{6};

/** Stands for the outcome of an open, which answers no request, among the answers' methods. */
constexpr long kOutcome = -1;

constexpr int kCancelled = 6;

} // namespace

PlayerClient::PlayerClient(std::shared_ptr<Link> link)
    : mpLink(std::move(link)),
      mNotifyObject(
          mpLink,
          [this](long method, const ArgumentReader& arguments) { notified(method, arguments); }),
      mCallBackObject(mpLink, [this](long method, const ArgumentReader& arguments) {
          mpLink->answer(mCallBackObject.id(), method, arguments);
      }) {
    registerClient();
}

PlayerClient::~PlayerClient() {
    PackedArguments id = ownId();
    post(PlayerMethod::unregisterNotify, id);
    post(PlayerMethod::unregisterCallBack, id);
}

void PlayerClient::registerClient() {
    PackedArguments arguments;
    arguments.int64(mCallBackObject.id()).int64(mpLink->identity());
    const auto promise = std::make_shared<std::promise<int>>();
    std::future<int> id = promise->get_future();
    const auto tell = [promise](std::exception_ptr error, ArgumentReader* answer) {
        error ? promise->set_exception(error)
              : promise->set_value(readInteger(*answer).value_or(0));
    };
    send(kRegister, arguments, {tell});
    try {
        mClientId = id.get();
    } catch (const TimedOut&) {
        throw TimedOut("the daemon gave no answer to the registration of identity " +
                       std::to_string(mpLink->identity()) +
                       "; it connects to each identity only once in its life, and another process "
                       "may have used this one before");
    }
    if (mClientId <= 0)
        throw Error("register: the daemon's answer cannot be read");
    PackedArguments notify;
    notify.int64(mNotifyObject.id()).int64(mpLink->identity()).int32(mClientId);
    post(PlayerMethod::registerNotify, notify);
}

void PlayerClient::onNotification(Player::NotificationHandler handler) {
    const std::lock_guard lock(mMutex);
    mHandler = std::move(handler);
}

PackedArguments PlayerClient::ownId() const {
    PackedArguments arguments;
    arguments.int32(mClientId);
    return arguments;
}

void PlayerClient::post(PlayerMethod method, PackedArguments& arguments) {
    mpLink->post(kPlayerAdapterId, static_cast<long>(method), arguments);
}

void PlayerClient::send(const PlayerOperation& operation, PackedArguments& arguments,
                        Completion completion) {
    Link::Request request;
    request.service = kPlayerAdapterId;
    request.method = static_cast<long>(operation.method);
    request.replyObject = mCallBackObject.id();
    request.replyMethod = static_cast<long>(operation.answer);
    request.answers = operation.answers;
    request.extraTime = operation.extraTime;
    request.what = operation.name;
    mpLink->request(request, arguments, std::move(completion));
}

void PlayerClient::open(const std::string& path, Completion completion) {
    if (path.find('\0') != std::string::npos)
        return mpLink->fail(mCallBackObject.id(), std::move(completion),
                            std::make_exception_ptr(Error("open: a path has no zero byte")));
    PackedArguments arguments = ownId();
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), path);
    send(kOpen, arguments, std::move(completion));
}

void PlayerClient::openMedia(const std::string& path, Completion completion) {
    const long ticket = awaitOpened(path, std::move(completion));
    const auto failOutcome = [link = mpLink.get(), ticket](std::exception_ptr error,
                                                           ArgumentReader* answer) {
        if (!error && readInteger(*answer).value_or(1) != 0)
            error = std::make_exception_ptr(Refused("open: refused by the daemon"));
        if (error)
            link->failTicket(ticket, error);
    };
    open(path, {failOutcome});
}

/** From here on a notification can be that of this open: it may come before the acceptance. */
long PlayerClient::awaitOpened(const std::string& path, Completion completion) {
    Link::Request outcome;
    outcome.replyObject = mNotifyObject.id();
    outcome.replyMethod = kOutcome;
    outcome.answers = Answers::shared;
    outcome.extraTime = kOpenTime;
    outcome.what = kOpen.name;
    const long ticket = mpLink->await(outcome, std::move(completion));
    Opening replaced;
    {
        const std::lock_guard lock(mMutex);
        replaced = std::exchange(mOpening, {ticket, path});
    }
    mpLink->failTicket(replaced.ticket, std::make_exception_ptr(MediaError(
                                            kCancelled, "open: another open took its place")));
    return ticket;
}

void PlayerClient::notified(long method, const ArgumentReader& arguments) {
    ArgumentReader copy = arguments;
    const std::optional<PlayerNotification> notification = readNotification(copy);
    if (method != static_cast<long>(PlayerNotify::mediaPlayerNotify) || !notification)
        return;
    if (notification->kind == NotificationKind::opened)
        opened(*notification, arguments);
    Player::NotificationHandler handler;
    {
        const std::lock_guard lock(mMutex);
        handler = mHandler;
    }
    if (handler)
        mpLink->callUser([&] { handler(*notification); });
}

/** A success names its medium, and may be that of the picture with which the engine warms up. */
void PlayerClient::opened(const PlayerNotification& notification, const ArgumentReader& arguments) {
    long ticket = 0;
    {
        const std::lock_guard lock(mMutex);
        const bool isOther = notification.result == 0 && notification.text != mOpening.path;
        if (!isOther)
            ticket = std::exchange(mOpening, {}).ticket;
    }
    mpLink->answerTicket(ticket, arguments);
}

} // namespace qnsmedia
