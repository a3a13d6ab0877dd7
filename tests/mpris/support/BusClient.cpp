// SPDX-License-Identifier: MIT
#include "tests/mpris/support/BusClient.h"

#include <algorithm>
#include <poll.h>

#include "tests/daemon/support/Patience.h"

namespace {

constexpr const char* kName = "org.mpris.MediaPlayer2.qnsmedia";
constexpr const char* kProperties = "org.freedesktop.DBus.Properties";
constexpr const char* kBus = "org.freedesktop.DBus";

} // namespace

BusClient::BusClient()
    : mpBus(sdbus::createSessionBusConnection()),
      mpDaemon(sdbus::createProxy(*mpBus, kBus, "/org/freedesktop/DBus")),
      mpPlayer(sdbus::createProxy(*mpBus, kName, "/org/mpris/MediaPlayer2")) {
    // Only wakes those who wait for names and clients.
    mpDaemon->uponSignal("NameOwnerChanged")
        .onInterface(kBus)
        .call([](const std::string&, const std::string&, const std::string&) {});
    mpDaemon->finishRegistration();
    mpPlayer->uponSignal("PropertiesChanged")
        .onInterface(kProperties)
        .call([this](const std::string& interface, const Properties& properties,
                     const std::vector<std::string>&) { changed(interface, properties); });
    mpPlayer->uponSignal("Seeked").onInterface(kPlayer).call(
        [this](std::int64_t position) { mJumps.push_back(position); });
    mpPlayer->finishRegistration();
}

bool BusClient::waitUntil(const std::function<bool()>& condition) {
    const auto deadline = patience::deadline();
    while (true) {
        while (mpBus->processPendingRequest()) {
        }
        if (condition())
            return true;
        const auto bus = mpBus->getEventLoopPollData();
        const int left = patience::pollTimeout(deadline);
        if (left == 0)
            return false;
        pollfd poll{bus.fd, bus.events, 0};
        const int busTime = bus.getPollTimeout();
        ::poll(&poll, 1, busTime < 0 ? left : std::min(left, busTime));
    }
}

bool BusClient::askUntil(const std::function<bool()>& condition) {
    const auto deadline = patience::deadline();
    while (patience::Clock::now() < deadline)
        if (condition())
            return true;
    return false;
}

bool BusClient::waitForName(bool there) {
    return waitUntil([&] { return hasOwner() == there; });
}

bool BusClient::waitForClients(std::size_t count) {
    return waitUntil([&] { return clientCount() == count; });
}

bool BusClient::waitForMetadata(const std::string& key) {
    return waitUntil([&] { return toldMetadata().count(key) == 1; });
}

BusClient::Properties BusClient::toldMetadata() const {
    const auto found = mTold.find("Metadata");
    return found == mTold.end() ? Properties() : found->second.get<Properties>();
}

void BusClient::callLater(const std::string& method, const std::string& argument,
                          std::vector<std::string>& errors) {
    mpPlayer->callMethodAsync(method).onInterface(kPlayer).withArguments(argument).uponReplyInvoke(
        [&errors](const sdbus::Error* error) {
            errors.push_back(error ? error->getMessage() : "");
        });
}

bool BusClient::hasOwner() {
    bool has = false;
    mpDaemon->callMethod("NameHasOwner")
        .onInterface(kBus)
        .withArguments(std::string(kName))
        .storeResultsTo(has);
    return has;
}

std::size_t BusClient::clientCount() {
    std::vector<std::string> names;
    mpDaemon->callMethod("ListNames").onInterface(kBus).storeResultsTo(names);
    return static_cast<std::size_t>(std::count_if(
        names.begin(), names.end(), [](const std::string& name) { return name.front() == ':'; }));
}

void BusClient::changed(const std::string& interface, const Properties& properties) {
    if (interface != kPlayer)
        return;
    for (const auto& [name, value] : properties)
        mTold[name] = value;
}
