// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <sdbus-c++/sdbus-c++.h>
#include <string>
#include <vector>

/** What a desktop is on the bus. For one thread, on which it also hears of signals. */
class BusClient {
public:
    using Properties = std::map<std::string, sdbus::Variant>;

    BusClient();

    /** Works off what comes until the condition holds; false when it takes too long. */
    bool waitUntil(const std::function<bool()>& condition);

    /** The same for what changes without a signal, so that asking is the only way. */
    static bool askUntil(const std::function<bool()>& condition);

    /** Until somebody has the player's name, or nobody. */
    bool waitForName(bool there);

    /** Until so many clients are connected to the bus, this one included. */
    bool waitForClients(std::size_t count);

    /** Until PropertiesChanged has told that a property of the player is that. */
    template<typename Value>
    bool waitForChange(const std::string& name, const Value& value) {
        return waitUntil([&] {
            const auto found = mTold.find(name);
            return found != mTold.end() && found->second.template get<Value>() == value;
        });
    }

    /** Until PropertiesChanged has told of metadata with this entry. */
    bool waitForMetadata(const std::string& key);

    /** What PropertiesChanged has told of the player. */
    [[nodiscard]] const Properties& told() const { return mTold; }
    [[nodiscard]] Properties toldMetadata() const;

    /** Positions that Seeked has told. */
    [[nodiscard]] const std::vector<std::int64_t>& jumps() const { return mJumps; }

    /** Asks for a property. */
    template<typename Value>
    Value get(const std::string& name, const std::string& interface = kPlayer) {
        return mpPlayer->getProperty(name).onInterface(interface).template get<Value>();
    }

    template<typename Value>
    void set(const std::string& name, const Value& value) {
        mpPlayer->setProperty(name).onInterface(kPlayer).toValue(value);
    }

    template<typename... Arguments>
    void call(const std::string& method, const Arguments&... arguments) {
        mpPlayer->callMethod(method).onInterface(kPlayer).withArguments(arguments...);
    }

    /** Calls without waiting; what becomes of it is added to `errors`, empty when all is well. */
    void callLater(const std::string& method, const std::string& argument,
                   std::vector<std::string>& errors);

    static constexpr const char* kPlayer = "org.mpris.MediaPlayer2.Player";

private:
    bool hasOwner();
    std::size_t clientCount();
    void changed(const std::string& interface, const Properties& properties);

    std::unique_ptr<sdbus::IConnection> mpBus;
    std::unique_ptr<sdbus::IProxy> mpDaemon;
    std::unique_ptr<sdbus::IProxy> mpPlayer;
    Properties mTold;
    std::vector<std::int64_t> mJumps;
};
