// SPDX-License-Identifier: MIT
#include "qnsmedia/Player.h"

#include <optional>
#include <utility>

#include "client/src/PlayerClient.h"
#include "client/src/PlayerRecords.h"
#include "client/src/Requests.h"
#include "define/PlayerMethods.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr Operation kInitialize{PlayerMethod::initializePlayer, PlayerCallBack::initializePlayer,
                                "initialize", Answers::inOrder, std::chrono::seconds(5)};
constexpr Operation kClose{PlayerMethod::closePlayer, PlayerCallBack::closePlayer, "close"};
constexpr Operation kPlay{PlayerMethod::play, PlayerCallBack::play, "play"};
constexpr Operation kPause{PlayerMethod::pause, PlayerCallBack::pause, "pause"};
constexpr Operation kSeek{PlayerMethod::seek, PlayerCallBack::seek, "seek"};
constexpr Operation kRepeat{PlayerMethod::setRepeat, PlayerCallBack::setRepeat, "repeat"};
constexpr Operation kStatus{PlayerMethod::getPlayerStatus, PlayerCallBack::getPlayerStatus,
                            "status", Answers::shared};
constexpr Operation kPowerOff{PlayerMethod::powerOffMediaPlayer,
                              PlayerCallBack::powerOffMediaPlayer, "power off"};

constexpr Nanoseconds kEndOfMedium{-1};

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

void sendPowerOff(const ServiceClient& client, Completion completion) {
    PackedArguments arguments = client.ownId();
    client.send(kPowerOff, arguments, succeedWhenGone(client.link(), std::move(completion)));
}

PackedArguments seekArguments(const ServiceClient& client, Nanoseconds position, SeekMode mode) {
    PackedArguments arguments = client.ownId();
    arguments.int32(static_cast<int>(mode)).int64(position.count()).boolean(false);
    return arguments;
}

PackedArguments repeatArguments(const ServiceClient& client, bool repeat, Nanoseconds start,
                                Nanoseconds end) {
    PackedArguments arguments = client.ownId();
    arguments.boolean(repeat).int64(start.count()).int64(end.count());
    return arguments;
}

} // namespace

Player::Player(Connection& connection)
    : mpClient(std::make_unique<PlayerClient>(connection.mpLink)) {}

Player::~Player() = default;

int Player::clientId() const {
    return mpClient->service().clientId();
}

void Player::onNotification(NotificationHandler handler) {
    mpClient->onNotification(std::move(handler));
}

std::future<void> Player::initialize() {
    return ask(mpClient->service(), kInitialize);
}

void Player::initialize(Callback callback) {
    ask(mpClient->service(), kInitialize, std::move(callback));
}

std::future<void> Player::open(const std::string& path) {
    auto [future, completion] = futureFor<void>("open", readAccepted);
    mpClient->open(path, std::move(completion));
    return std::move(future);
}

void Player::open(const std::string& path, Callback callback) {
    mpClient->open(
        path, completionFor(mpClient->service().link(), std::move(callback), "open", readAccepted));
}

std::future<MediaInfo> Player::openMedia(const std::string& path) {
    auto [future, completion] = futureFor<MediaInfo>("open", readOutcome);
    mpClient->openMedia(path, std::move(completion));
    return std::move(future);
}

void Player::openMedia(const std::string& path, MediaCallback callback) {
    mpClient->openMedia(
        path, completionFor(mpClient->service().link(), std::move(callback), "open", readOutcome));
}

std::future<void> Player::close() {
    return ask(mpClient->service(), kClose);
}

void Player::close(Callback callback) {
    ask(mpClient->service(), kClose, std::move(callback));
}

std::future<void> Player::play() {
    return ask(mpClient->service(), kPlay);
}

void Player::play(Callback callback) {
    ask(mpClient->service(), kPlay, std::move(callback));
}

std::future<void> Player::pause() {
    return ask(mpClient->service(), kPause);
}

void Player::pause(Callback callback) {
    ask(mpClient->service(), kPause, std::move(callback));
}

std::future<void> Player::seek(Nanoseconds position, SeekMode mode) {
    return ask(mpClient->service(), kSeek, seekArguments(mpClient->service(), position, mode));
}

void Player::seek(Nanoseconds position, SeekMode mode, Callback callback) {
    ask(mpClient->service(), kSeek, seekArguments(mpClient->service(), position, mode),
        std::move(callback));
}

std::future<void> Player::repeat(Nanoseconds start, Nanoseconds end) {
    return ask(mpClient->service(), kRepeat,
               repeatArguments(mpClient->service(), true, start, end));
}

void Player::repeat(Nanoseconds start, Nanoseconds end, Callback callback) {
    ask(mpClient->service(), kRepeat, repeatArguments(mpClient->service(), true, start, end),
        std::move(callback));
}

std::future<void> Player::noRepeat() {
    return ask(mpClient->service(), kRepeat,
               repeatArguments(mpClient->service(), false, {}, kEndOfMedium));
}

void Player::noRepeat(Callback callback) {
    ask(mpClient->service(), kRepeat, repeatArguments(mpClient->service(), false, {}, kEndOfMedium),
        std::move(callback));
}

std::future<PlayerStatus> Player::status() {
    return ask(mpClient->service(), kStatus, mpClient->service().ownId(), readStatusAnswer);
}

void Player::status(StatusCallback callback) {
    ask(mpClient->service(), kStatus, mpClient->service().ownId(), readStatusAnswer,
        std::move(callback));
}

void Player::setSystemFormat(SystemFormat format) {
    PackedArguments arguments;
    arguments.int32(static_cast<int>(format));
    mpClient->service().post(static_cast<long>(PlayerMethod::setSystemFormat), arguments);
}

std::future<void> Player::powerOff() {
    auto [future, completion] = futureFor<void>(kPowerOff.name, readNothing);
    sendPowerOff(mpClient->service(), std::move(completion));
    return std::move(future);
}

void Player::powerOff(Callback callback) {
    const ServiceClient& service = mpClient->service();
    sendPowerOff(service,
                 completionFor(service.link(), std::move(callback), kPowerOff.name, readNothing));
}

} // namespace qnsmedia
