// SPDX-License-Identifier: MIT
// Tells the client library anything in answer to its requests, or unasked. Needs the ports of the
// daemon and of its clients for itself.
#include <array>
#include <atomic>
#include <chrono>
#include <exception>
#include <functional>
#include <future>
#include <iterator>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "define/ObjectIds.h"
#include "fuzz/support/Daemon.h"
#include "fuzz/support/Input.h"
#include "fuzz/support/Require.h"
#include "qnsmedia/Discoverer.h"
#include "qnsmedia/Error.h"
#include "qnsmedia/Importer.h"
#include "qnsmedia/Player.h"

using namespace qnsmedia;

namespace {

using fuzz::require;

/** An answer that never comes must not keep an input waiting, nor be told meanwhile. */
Connection::Options patient() {
    Connection::Options options;
    options.deadline = std::chrono::hours(1);
    return options;
}

/** What all inputs use. */
struct Process {
    Process() { daemon.answerStatusOf(told.clientId()); }

    /** Returns when all that was sent before has been worked off. */
    void settle() { told.status().get(); }

    fuzz::Daemon daemon;
    Connection connection{patient()};
    Player told{connection};
};

Process& process() {
    static Process instance;
    return instance;
}

void requireOwnError(const std::exception_ptr& error) {
    try {
        if (error)
            std::rethrow_exception(error);
    } catch (const Error& own) {
        require(own.what() != nullptr);
    } catch (...) {
        require(false);
    }
}

/** What has been asked for, and how it was answered: each once, with a value or an Error. */
class Outcomes {
public:
    template<typename Value>
    void await(std::future<Value> future) {
        auto shared = std::make_shared<std::future<Value>>(std::move(future));
        mFutures.push_back([shared] {
            require(shared->wait_for(std::chrono::seconds(0)) == std::future_status::ready);
            try {
                shared->get();
            } catch (...) {
                requireOwnError(std::current_exception());
            }
        });
    }

    /** A callback; what it throws must not disturb the library. */
    auto callback() {
        ++mAsked;
        return [this](const std::exception_ptr& error, const auto&...) {
            requireOwnError(error);
            if (++mTold % 2 == 0)
                throw 0;
        };
    }

    void requireAll() const {
        require(mTold == mAsked);
        for (const auto& requireOne : mFutures)
            requireOne();
    }

private:
    std::vector<std::function<void()>> mFutures;
    int mAsked = 0;
    std::atomic<int> mTold{0};
};

/** One client of each service. */
struct Clients {
    Player player{process().connection};
    Discoverer discoverer{process().connection};
    Importer importer{process().connection};
};

using Ask = void (*)(Clients&, Outcomes&);

constexpr auto kKeyFrame = SeekMode::keyFrame;

constexpr Ask kAsks[] = {
    [](Clients& c, Outcomes& o) { o.await(c.player.initialize()); },
    [](Clients& c, Outcomes& o) { o.await(c.player.open("/f")); },
    [](Clients& c, Outcomes& o) { o.await(c.player.openMedia("/f")); },
    [](Clients& c, Outcomes& o) { o.await(c.player.close()); },
    [](Clients& c, Outcomes& o) { o.await(c.player.play()); },
    [](Clients& c, Outcomes& o) { o.await(c.player.pause()); },
    [](Clients& c, Outcomes& o) { o.await(c.player.seek(Nanoseconds(1))); },
    [](Clients& c, Outcomes& o) { o.await(c.player.repeat(Nanoseconds(1), Nanoseconds(2))); },
    [](Clients& c, Outcomes& o) { o.await(c.player.status()); },
    [](Clients& c, Outcomes& o) { o.await(c.player.powerOff()); },
    [](Clients& c, Outcomes& o) { o.await(c.discoverer.open("/f")); },
    [](Clients& c, Outcomes& o) { o.await(c.discoverer.close()); },
    [](Clients& c, Outcomes& o) { o.await(c.discoverer.metadata()); },
    [](Clients& c, Outcomes& o) {
        o.await(c.discoverer.makeImage(Nanoseconds(1), 2, 2, "/i.png"));
    },
    [](Clients& c, Outcomes& o) { o.await(c.discoverer.extensions()); },
    [](Clients& c, Outcomes& o) { o.await(c.importer.initialize()); },
    [](Clients& c, Outcomes& o) { o.await(c.importer.importFile("/f", "g")); },
    [](Clients& c, Outcomes& o) { o.await(c.importer.cancel()); },
    [](Clients& c, Outcomes& o) { o.await(c.importer.status()); },
    [](Clients& c, Outcomes& o) { c.player.openMedia("/g", o.callback()); },
    [](Clients& c, Outcomes& o) { c.player.seek(Nanoseconds(1), kKeyFrame, o.callback()); },
    [](Clients& c, Outcomes& o) { c.player.status(o.callback()); },
    [](Clients& c, Outcomes& o) { c.player.powerOff(o.callback()); },
    [](Clients& c, Outcomes& o) { c.discoverer.open("/g", o.callback()); },
    [](Clients& c, Outcomes& o) { c.discoverer.close(o.callback()); },
    [](Clients& c, Outcomes& o) { c.discoverer.metadata(o.callback()); },
    [](Clients& c, Outcomes& o) { c.discoverer.extensions(o.callback()); },
    [](Clients& c, Outcomes& o) { c.importer.importFile("/g", "", o.callback()); },
    [](Clients& c, Outcomes& o) { c.importer.status(o.callback()); },
};

class Run {
public:
    Run(const uint8_t* data, std::size_t size) : mInput(data, size) {}

    void run() {
        mClients.emplace();
        listen();
        for (int steps = 0; steps < kMostSteps && !mInput.isEmpty(); ++steps)
            step();
        process().settle();
        mClients.reset();
        mOutcomes.requireAll();
        require(process().connection.alive());
    }

private:
    static constexpr int kMostSteps = 40;

    void listen() {
        mClients->player.onNotification([](const PlayerNotification& told) {
            require(told.text.size() <= PTC::kPacketSize);
            throw 0;
        });
        mClients->importer.onNotification([](const ImportNotification& told) {
            require(told.text.size() + told.video.size() <= PTC::kPacketSize);
        });
        process().settle(); // so that the daemon knows the objects
    }

    void step() {
        switch (mInput.byte() % 4) {
        case 0:
            return kAsks[mInput.byte() % std::size(kAsks)](*mClients, mOutcomes);
        case 1:
            return tell();
        case 2:
            return tellAnything();
        default:
            return process().settle();
        }
    }

    void tell() {
        PTC::EventPacket header{};
        header.receiverId = toModuleId(process().connection.identity());
        header.objectId = process().daemon.object(mInput.byte() % fuzz::Daemon::kKinds);
        header.methodId = mInput.byte();
        header.isCallback = 1;
        header.isRemote = 1;
        const std::string payload = mInput.block();
        header.size = static_cast<long>(payload.size());
        process().daemon.send(header, payload);
    }

    void tellAnything() {
        PTC::EventPacket header{};
        header.receiverId = mInput.number<int8_t>();
        header.objectId = process().daemon.object(0) + mInput.number<int8_t>();
        header.methodId = mInput.number<long>();
        header.isCallback = mInput.byte();
        header.isRemote = mInput.byte();
        header.size = mInput.number<int16_t>();
        process().daemon.send(header, mInput.block());
    }

    fuzz::Input mInput;
    Outcomes mOutcomes;
    std::optional<Clients> mClients; ///< before the outcomes that they tell
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Run(data, size).run();
    return 0;
}
