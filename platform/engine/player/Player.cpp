// SPDX-License-Identifier: MIT
#include "player/Player.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <fcntl.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/SystemResult.h"
#include "player/Failure.h"
#include "player/Reporter.h"
#include "text/Text.h"

namespace engine {

using namespace LibMediaPlayer;

namespace {

/** A device's clock drifts from ours; compare them when somebody looks and the last is so old. */
constexpr std::chrono::seconds kAnchorAge{1};

/** Brings the ends inside the medium; false when nothing is between them. */
bool fitLoop(RepeatParam& param, Nanoseconds duration) {
    if (!param.repeat)
        return true;
    param.start = std::max(param.start, 0L);
    param.end = std::max(param.end, -1L);
    const long last = duration > Nanoseconds::zero() ? duration.count() : LONG_MAX;
    if (param.end > last)
        param.end = last;
    return param.start < (param.end < 0 ? last : param.end);
}

} // namespace

template<typename Order>
void Player::post(Order order) {
    const std::lock_guard lock(mMutex);
    mpEngine->post(std::move(order));
}

Player::Player(void* window, unsigned int flags)
    : mOptions{window, flags},
      mpEngine(Engine::start(mpFront, mOptions)),
      mWatchdog([this](const auto& ticket, auto overdue) { onOverdue(ticket, overdue); }) {}

Player::~Player() {
    close();
    const std::lock_guard lock(mMutex);
    mpEngine->stop();
}

int Player::open(const std::wstring& path, int format) {
    const std::uint64_t session = mpFront->outlet.beginSession();
    mpFront->status.begin(session, kNotReady);
    auto ticket = std::make_shared<OpenTicket>(session, path, format);
    post(OpenOrder{ticket});
    post(RepeatOrder{std::exchange(mNextLoop, {})});
    mWatchdog.watch(std::move(ticket));
    return kOk;
}

int Player::close() {
    const std::uint64_t session = mpFront->outlet.beginSession();
    mpFront->status.begin(session, kClosed);
    post(CloseOrder{});
    mpFront->outlet.drain();
    return kOk;
}

int Player::play() {
    if (!isOpen())
        return kWrongState;
    post(PlayOrder{});
    return kOk;
}

int Player::pause() {
    if (!isOpen())
        return kWrongState;
    post(PauseOrder{});
    return kOk;
}

int Player::seek(long position, int mode) {
    if (!isOpen() || mode < kSeekAccurate || mode > kSeekRelative)
        return kWrongState;
    post(SeekOrder{Nanoseconds(position), mode});
    return kOk;
}

int Player::status(long& position, long& duration) {
    const StatusClock::Reading reading = mpFront->status.read();
    position = reading.position.count();
    duration = reading.duration.count();
    if (reading.anchored != kNever && SteadyClock::now() - reading.anchored > kAnchorAge)
        post(RefreshOrder{});
    return reading.state;
}

void Player::setNotify(std::function<void(MediaPlayerNotify&)> notify) {
    mpFront->outlet.setFunction(std::move(notify));
}

int Player::dumpGraph(const std::wstring& path) {
    if (!isOpen() || path.empty())
        return kWrongState;
    qns::UniqueFd file(
        ::open(toBytes(path).c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NONBLOCK, 0666));
    if (!file)
        return handle::resultOfErrno(errno);
    post(DumpOrder{std::move(file)});
    return kOk;
}

int Player::repeat(RepeatParam& param) {
    const StatusClock::Reading reading = mpFront->status.read();
    if (!fitLoop(param, reading.duration))
        return kWrongState;
    if (isOpen())
        post(RepeatOrder{param});
    else
        mNextLoop = param;
    return kOk;
}

bool Player::isOpen() const {
    const PlayerState state = mpFront->status.read().state;
    return state != kClosed && state != kFailed;
}

void Player::onOverdue(const std::shared_ptr<OpenTicket>& ticket, Watchdog::Overdue overdue) {
    if (overdue == Watchdog::Overdue::kTaking) {
        replaceEngine(true);
        return;
    }
    if (!ticket->claimAnswer())
        return;
    replaceEngine(false);
    Reporter reporter(*mpFront, ticket->session());
    reporter.tellFailure(kNotifyOpened, failure(kTimedOut));
    reporter.setState(kFailed);
    mpFront->outlet.endSession(ticket->session());
}

void Player::replaceEngine(bool keepOrders) {
    const std::lock_guard lock(mMutex);
    std::deque<Item> orders = mpEngine->abandon();
    mpEngine = Engine::start(mpFront, mOptions);
    if (!keepOrders)
        return;
    for (Item& order : orders)
        mpEngine->post(std::move(order));
}

} // namespace engine
