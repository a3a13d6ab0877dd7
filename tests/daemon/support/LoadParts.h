// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>

#include "tests/daemon/support/LoadLink.h"

namespace load {

/** What all clients of a load have in common. */
struct Board {
    std::string film;     ///< what is played, described, drawn and imported
    std::string sound;    ///< what is imported too
    std::string folder;   ///< for pictures
    wire::Bytes metadata; ///< the answer that describes the film
    wire::Bytes extensions;

    /**
     * Answers that may go to another client than the one that asked: only their number is known.
     * Never negative.
     */
    std::atomic<long> statesOwed{0};
    std::atomic<long> importerStatesOwed{0};

    std::atomic<bool> stop{false};   ///< nobody asks any more
    std::atomic<bool> mayEnd{false}; ///< the daemon, and answers with it
};

/** What is told to all clients at the same time. */
class Notifications {
public:
    void take(const wire::Packet& packet);

    [[nodiscard]] std::size_t count() const { return mCount; }

    /** Stands for all of them, in their order. */
    [[nodiscard]] std::size_t digest() const { return mDigest; }

private:
    std::size_t mCount = 0;
    std::size_t mDigest = 0;
};

/** A client of the player, which is everybody's. */
class PlayerPart {
public:
    PlayerPart(Link& link, Board& board) : mLink(link), mBoard(board) {}

    void registerAll();
    void ask();
    void close();

    /** Takes the answers that are not given in order; false for the others. */
    bool take(const wire::Packet& packet);

    [[nodiscard]] const Notifications& notifications() const { return mNotifications; }

private:
    void askForState();
    void askForLoop();
    void seek();
    [[nodiscard]] wire::Bytes id() const { return wire::integer(mId); }

    Link& mLink;
    Board& mBoard;
    std::int32_t mId = -1;
    Notifications mNotifications;
};

/** A client of the importer, which is everybody's too. */
class ImporterPart {
public:
    ImporterPart(Link& link, Board& board) : mLink(link), mBoard(board) {}

    void registerAll();
    void ask();
    void cancel();
    void askForState();
    bool take(const wire::Packet& packet);

    [[nodiscard]] const Notifications& notifications() const { return mNotifications; }

    /** What the status said last. */
    [[nodiscard]] bool isIdle() const { return mIdle; }

private:
    void import();
    [[nodiscard]] wire::Bytes id() const { return wire::integer(mId); }

    Link& mLink;
    Board& mBoard;
    std::int32_t mId = -1;
    bool mIdle = false;
    Notifications mNotifications;
};

/** A client of the discoverer with a place of its own: all that it is told is known before. */
class DiscovererPart {
public:
    DiscovererPart(Link& link, Board& board) : mLink(link), mBoard(board) {}

    void registerAll();

    /** Writes the answers that are always the same to the board. */
    void learn();

    /** Asks for something, unless an answer is still to come. */
    void ask();
    void askForExtensions();
    bool take(const wire::Packet& packet);

    /** An answer that waits for the engine is still to come. */
    [[nodiscard]] bool isWaiting() const { return mAwaited != 0; }

private:
    void open();
    void close();
    void askForImage();
    void askFor(long method, const wire::Bytes& arguments, long answerMethod,
                const wire::Bytes& answer);
    [[nodiscard]] wire::Bytes id() const { return wire::integer(mId); }

    Link& mLink;
    Board& mBoard;
    std::int32_t mId = -1;
    bool mOpen = false;
    long mAwaited = 0; ///< method of the answer
    wire::Bytes mAnswer;
};

} // namespace load
