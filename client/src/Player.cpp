// SPDX-License-Identifier: MIT
#include "qnsmedia/Player.h"

#include <optional>
#include <tuple>
#include <type_traits>
#include <utility>

#include "client/src/PlayerClient.h"
#include "client/src/PlayerRecords.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr PlayerOperation kInitialize{PlayerMethod::initializePlayer,
                                      PlayerCallBack::initializePlayer, "initialize",
                                      Answers::inOrder, std::chrono::seconds(5)};
constexpr PlayerOperation kClose{PlayerMethod::closePlayer, PlayerCallBack::closePlayer, "close"};
constexpr PlayerOperation kPlay{PlayerMethod::play, PlayerCallBack::play, "play"};
constexpr PlayerOperation kPause{PlayerMethod::pause, PlayerCallBack::pause, "pause"};
constexpr PlayerOperation kSeek{PlayerMethod::seek, PlayerCallBack::seek, "seek"};
constexpr PlayerOperation kRepeat{PlayerMethod::setRepeat, PlayerCallBack::setRepeat, "repeat"};
constexpr PlayerOperation kStatus{PlayerMethod::getPlayerStatus, PlayerCallBack::getPlayerStatus,
                                  "status", Answers::shared};
constexpr PlayerOperation kPowerOff{PlayerMethod::powerOffMediaPlayer,
                                    PlayerCallBack::powerOffMediaPlayer, "power off"};

constexpr Nanoseconds kEndOfMedium{-1};

Error unreadable(const std::string& name) {
    return Error(name + ": the daemon's answer cannot be read");
}

void readAccepted(const std::string& name, ArgumentReader& answer) {
    const std::optional<int> result = readInteger(answer);
    if (!result)
        throw unreadable(name);
    if (*result != 0)
        throw Refused(name + ": refused by the daemon");
}

/** That an answer came is all that it says. */
void readNothing(const std::string&, ArgumentReader&) {}

PlayerStatus readStatusAnswer(const std::string& name, ArgumentReader& answer) {
    const std::optional<PlayerStatus> status = readStatus(answer);
    if (!status)
        throw unreadable(name);
    return *status;
}

MediaInfo readOutcome(const std::string& name, ArgumentReader& notification) {
    const std::optional<PlayerNotification> opened = readNotification(notification);
    if (!opened)
        throw unreadable(name);
    if (opened->result != 0)
        throw MediaError(opened->result, opened->text);
    return mediaInfoOf(*opened);
}

template<typename Value>
using Read = Value (*)(const std::string& name, ArgumentReader& answer);

/** A future, and the completion that keeps its promise. */
template<typename Value>
std::pair<std::future<Value>, Completion> futureFor(const char* name, Read<Value> read) {
    auto promise = std::make_shared<std::promise<Value>>();
    auto future = promise->get_future();
    const auto tell = [=](std::exception_ptr error, ArgumentReader* answer) {
        try {
            if (error)
                std::rethrow_exception(error);
            if constexpr (std::is_void_v<Value>) {
                read(name, *answer);
                promise->set_value();
            } else {
                promise->set_value(read(name, *answer));
            }
        } catch (...) {
            promise->set_exception(std::current_exception());
        }
    };
    return {std::move(future), Completion{tell, false}};
}

/** The completion that calls a callback: with the error alone, or with a value too. */
template<typename... Values, typename Value>
Completion completionFor(Link& link, std::function<void(std::exception_ptr, Values...)> callback,
                         const char* name, Read<Value> read) {
    const auto tell = [=, &link](std::exception_ptr error, ArgumentReader* answer) {
        std::tuple<Values...> values;
        try {
            if (error)
                std::rethrow_exception(error);
            if constexpr (std::is_void_v<Value>)
                read(name, *answer);
            else
                values = read(name, *answer);
        } catch (...) {
            error = std::current_exception();
        }
        if (callback)
            link.callUser([&] { std::apply(callback, std::tuple_cat(std::tie(error), values)); });
    };
    return {tell, true};
}

/** A daemon that has gone has done what was asked, even when its answer was lost on the way. */
Completion succeedWhenGone(Link& link, Completion completion) {
    if (!link.alive())
        return completion;
    const auto tell = [&link, tell = std::move(completion.tell)](std::exception_ptr error,
                                                                 ArgumentReader* answer) {
        ArgumentReader nothing(nullptr, 0);
        const bool isGone = error && !link.alive();
        isGone ? tell(nullptr, &nothing) : tell(error, answer);
    };
    return {tell, completion.callsUser};
}

PackedArguments seekArguments(const PlayerClient& client, Nanoseconds position, SeekMode mode) {
    PackedArguments arguments = client.ownId();
    arguments.int32(static_cast<int>(mode)).int64(position.count()).boolean(false);
    return arguments;
}

PackedArguments repeatArguments(const PlayerClient& client, bool repeat, Nanoseconds start,
                                Nanoseconds end) {
    PackedArguments arguments = client.ownId();
    arguments.boolean(repeat).int64(start.count()).int64(end.count());
    return arguments;
}

/** The two forms of a request whose answer is "accepted" or "refused". */
std::future<void> call(PlayerClient& client, const PlayerOperation& operation,
                       PackedArguments arguments) {
    auto [future, completion] = futureFor<void>(operation.name, readAccepted);
    client.send(operation, arguments, std::move(completion));
    return std::move(future);
}

void call(PlayerClient& client, const PlayerOperation& operation, PackedArguments arguments,
          Player::Callback callback) {
    client.send(operation, arguments,
                completionFor(client.link(), std::move(callback), operation.name, readAccepted));
}

} // namespace

Player::Player(Connection& connection)
    : mpClient(std::make_unique<PlayerClient>(connection.mpLink)) {}

Player::~Player() = default;

int Player::clientId() const {
    return mpClient->clientId();
}

void Player::onNotification(NotificationHandler handler) {
    mpClient->onNotification(std::move(handler));
}

std::future<void> Player::initialize() {
    return call(*mpClient, kInitialize, mpClient->ownId());
}

void Player::initialize(Callback callback) {
    call(*mpClient, kInitialize, mpClient->ownId(), std::move(callback));
}

std::future<void> Player::open(const std::string& path) {
    auto [future, completion] = futureFor<void>("open", readAccepted);
    mpClient->open(path, std::move(completion));
    return std::move(future);
}

void Player::open(const std::string& path, Callback callback) {
    mpClient->open(path,
                   completionFor(mpClient->link(), std::move(callback), "open", readAccepted));
}

std::future<MediaInfo> Player::openMedia(const std::string& path) {
    auto [future, completion] = futureFor<MediaInfo>("open", readOutcome);
    mpClient->openMedia(path, std::move(completion));
    return std::move(future);
}

void Player::openMedia(const std::string& path, MediaCallback callback) {
    mpClient->openMedia(path,
                        completionFor(mpClient->link(), std::move(callback), "open", readOutcome));
}

std::future<void> Player::close() {
    return call(*mpClient, kClose, mpClient->ownId());
}

void Player::close(Callback callback) {
    call(*mpClient, kClose, mpClient->ownId(), std::move(callback));
}

std::future<void> Player::play() {
    return call(*mpClient, kPlay, mpClient->ownId());
}

void Player::play(Callback callback) {
    call(*mpClient, kPlay, mpClient->ownId(), std::move(callback));
}

std::future<void> Player::pause() {
    return call(*mpClient, kPause, mpClient->ownId());
}

void Player::pause(Callback callback) {
    call(*mpClient, kPause, mpClient->ownId(), std::move(callback));
}

std::future<void> Player::seek(Nanoseconds position, SeekMode mode) {
    return call(*mpClient, kSeek, seekArguments(*mpClient, position, mode));
}

void Player::seek(Nanoseconds position, SeekMode mode, Callback callback) {
    call(*mpClient, kSeek, seekArguments(*mpClient, position, mode), std::move(callback));
}

std::future<void> Player::repeat(Nanoseconds start, Nanoseconds end) {
    return call(*mpClient, kRepeat, repeatArguments(*mpClient, true, start, end));
}

void Player::repeat(Nanoseconds start, Nanoseconds end, Callback callback) {
    call(*mpClient, kRepeat, repeatArguments(*mpClient, true, start, end), std::move(callback));
}

std::future<void> Player::noRepeat() {
    return call(*mpClient, kRepeat, repeatArguments(*mpClient, false, {}, kEndOfMedium));
}

void Player::noRepeat(Callback callback) {
    call(*mpClient, kRepeat, repeatArguments(*mpClient, false, {}, kEndOfMedium),
         std::move(callback));
}

std::future<PlayerStatus> Player::status() {
    auto [future, completion] = futureFor<PlayerStatus>(kStatus.name, readStatusAnswer);
    PackedArguments arguments = mpClient->ownId();
    mpClient->send(kStatus, arguments, std::move(completion));
    return std::move(future);
}

void Player::status(StatusCallback callback) {
    PackedArguments arguments = mpClient->ownId();
    mpClient->send(
        kStatus, arguments,
        completionFor(mpClient->link(), std::move(callback), kStatus.name, readStatusAnswer));
}

void Player::setSystemFormat(SystemFormat format) {
    PackedArguments arguments;
    arguments.int32(static_cast<int>(format));
    mpClient->post(PlayerMethod::setSystemFormat, arguments);
}

std::future<void> Player::powerOff() {
    auto [future, completion] = futureFor<void>(kPowerOff.name, readNothing);
    PackedArguments arguments = mpClient->ownId();
    mpClient->send(kPowerOff, arguments, succeedWhenGone(mpClient->link(), std::move(completion)));
    return std::move(future);
}

void Player::powerOff(Callback callback) {
    PackedArguments arguments = mpClient->ownId();
    mpClient->send(
        kPowerOff, arguments,
        succeedWhenGone(mpClient->link(), completionFor(mpClient->link(), std::move(callback),
                                                        kPowerOff.name, readNothing)));
}

} // namespace qnsmedia
