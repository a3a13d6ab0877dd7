// SPDX-License-Identifier: MIT
#include "client/src/PlayerClient.h"

#include <utility>

#include "client/src/PlayerRecords.h"
#include "client/src/Requests.h"
#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "pack/CPack_Simplebuffer.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr long number(PlayerMethod method) {
    return static_cast<long>(method);
}

constexpr Service kPlayer{kPlayerAdapterId,
                          number(PlayerMethod::registerCallBack),
                          number(PlayerMethod::unregisterCallBack),
                          static_cast<long>(PlayerCallBack::setPlayerClientID),
                          number(PlayerMethod::registerNotify),
                          number(PlayerMethod::unregisterNotify)};

constexpr Operation kOpen{PlayerMethod::openPlayer, PlayerCallBack::openPlayer, "open"};

/** The engine tells of an open within five seconds, whatever the medium. */
constexpr Operation kOutcome{PlayerMethod::openPlayer, PlayerCallBack::openPlayer, "open",
                             Answers::shared, std::chrono::seconds(6)};

constexpr int kCancelled = 6;

} // namespace

PlayerClient::PlayerClient(std::shared_ptr<Link> link)
    : mService(std::move(link), kPlayer,
               [this](long, long method, const ArgumentReader& arguments) {
                   notified(method, arguments);
               }) {}

void PlayerClient::open(const std::string& path, Completion completion) {
    if (path.find('\0') != std::string::npos)
        return mService.fail(std::move(completion),
                             std::make_exception_ptr(Error("open: a path has no zero byte")));
    PackedArguments arguments = mService.ownId();
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), path);
    mService.send(kOpen, arguments, std::move(completion));
}

void PlayerClient::openMedia(const std::string& path, Completion completion) {
    const long ticket = awaitOpened(path, std::move(completion));
    const auto failOutcome = [this, ticket](std::exception_ptr error, ArgumentReader* answer) {
        try {
            if (error)
                std::rethrow_exception(error);
            readAccepted(kOpen.name, *answer);
        } catch (...) {
            mService.fail(ticket, std::current_exception());
        }
    };
    open(path, {failOutcome});
}

/** From here on a notification can be that of this open: it may come before the acceptance. */
long PlayerClient::awaitOpened(const std::string& path, Completion completion) {
    const long ticket = mService.await(kOutcome, std::move(completion));
    Opening replaced;
    {
        const std::lock_guard lock(mMutex);
        replaced = std::exchange(mOpening, {ticket, path});
    }
    mService.fail(replaced.ticket, std::make_exception_ptr(MediaError(
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
    mHandler.tell(mService.link(), *notification);
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
    mService.finish(ticket, arguments);
}

} // namespace qnsmedia
