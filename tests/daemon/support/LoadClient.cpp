// SPDX-License-Identifier: MIT
#include "tests/daemon/support/LoadClient.h"

#include <gtest/gtest.h>

namespace load {

namespace {

/** Answers in order that a client leaves open. */
constexpr std::size_t kWindow = 32;

/**
 * A request is accepted before it is done. Who never waits for what the engine answers would only
 * measure how long the queue in front of it grows.
 */
constexpr unsigned kMostUnbraked = 64;

} // namespace

Client::Client(long identity, unsigned seed, Board& board)
    : mBoard(board),
      mLink(identity, seed),
      mPlayer(mLink, board),
      mImporter(mLink, board),
      mDiscoverer(mLink, board) {}

void Client::registerAll() {
    mPlayer.registerAll();
    mImporter.registerAll();
    mDiscoverer.registerAll();
    takeOwn();
}

void Client::work() {
    while (!mBoard.stop)
        if (!mustWait())
            ask();
        else if (!takeNext())
            return;
    takeOwn();
}

bool Client::mustWait() const {
    return mLink.owed() >= kWindow || (mUnbraked >= kMostUnbraked && mDiscoverer.isWaiting());
}

void Client::ask() {
    ++mUnbraked;
    const auto number = mLink.below(10);
    if (mUnbraked >= kMostUnbraked || number == 0)
        mDiscoverer.ask();
    else if (number < 8)
        mPlayer.ask();
    else
        mImporter.ask();
}

/** False when the daemon tells nothing more. */
bool Client::takeNext() {
    const auto packet = mLink.receive();
    if (!packet)
        return false;
    if (mDiscoverer.take(*packet))
        mUnbraked = 0;
    else if (!mPlayer.take(*packet) && !mImporter.take(*packet))
        mLink.take(*packet);
    return true;
}

void Client::takeOwn() {
    while (mLink.owed() > 0 || mDiscoverer.isWaiting())
        if (!takeNext()) {
            EXPECT_TRUE(mBoard.mayEnd) << mLink.identity() << " is not answered.";
            return;
        }
}

void Client::settle() {
    mDiscoverer.askForExtensions();
    takeOwn();
}

void Client::makeIdle() {
    mPlayer.close();
    mImporter.cancel();
    do {
        mImporter.askForState();
        settle();
    } while (!mImporter.isIdle() && !testing::Test::HasFailure());
}

void Client::catchUp(const Client& other) {
    while (played().count() < other.played().count() ||
           imported().count() < other.imported().count())
        if (!takeNext()) {
            ADD_FAILURE() << mLink.identity() << " is told less than others.";
            return;
        }
}

} // namespace load
