// SPDX-License-Identifier: MIT
#include "bench/rpc/DbusPeer.h"

#include <chrono>
#include <fcntl.h>
#include <systemd/sd-bus.h>
#include <thread>
#include <unistd.h>

#include "base/UniqueFd.h"

namespace bench {
namespace {

constexpr const char* kName = "org.example.Bench";
constexpr const char* kPath = "/org/example/bench";

int answerStatus(sd_bus_message* message, void*, sd_bus_error*) {
    int32_t clientId = 0;
    sd_bus_message_read(message, "i", &clientId);
    return sd_bus_reply_method_return(message, "iixx", 2, 0, int64_t{0}, int64_t{0});
}

// clang-format off
const sd_bus_vtable kTable[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_METHOD("Status", "i", "iixx", answerStatus, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_VTABLE_END
};
// clang-format on

sd_bus* connectBus(const std::string& address) {
    sd_bus* bus = nullptr;
    if (sd_bus_new(&bus) < 0)
        return nullptr;
    if (sd_bus_set_address(bus, address.c_str()) < 0 || sd_bus_set_bus_client(bus, 1) < 0 ||
        sd_bus_start(bus) < 0) {
        sd_bus_unref(bus);
        return nullptr;
    }
    return bus;
}

void serve(const std::string& address) {
    sd_bus* bus = connectBus(address);
    if (bus == nullptr)
        return;
    sd_bus_add_object_vtable(bus, nullptr, kPath, kName, kTable, nullptr);
    sd_bus_request_name(bus, kName, 0);
    for (;;) {
        const int handled = sd_bus_process(bus, nullptr);
        if (handled < 0)
            return;
        if (handled == 0)
            sd_bus_wait(bus, UINT64_MAX);
    }
}

std::string readLine(int fd) {
    std::string line;
    char byte;
    while (::read(fd, &byte, 1) == 1 && byte != '\n')
        line.push_back(byte);
    return line;
}

/** Runs a bus of its own; empty when that does not work. */
std::string startBus(ChildProcess& daemon) {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0)
        return {};
    const qns::UniqueFd readEnd(ends[0]);
    {
        const qns::UniqueFd writeEnd(ends[1]);
        daemon = ChildProcess::run({"dbus-daemon", "--session", "--nofork", "--nopidfile",
                                    "--address=unix:tmpdir=/tmp", "--print-address"},
                                   writeEnd.get());
    }
    return readLine(readEnd.get());
}

} // namespace

DbusConnection::DbusConnection(const std::string& address) : mpBus(connectBus(address)) {}

DbusConnection::~DbusConnection() {
    sd_bus_flush_close_unref(mpBus);
}

bool DbusConnection::call() {
    sd_bus_message* reply = nullptr;
    int32_t status = 0;
    int32_t reserved = 0;
    int64_t position = 0;
    int64_t duration = 0;
    const bool answered =
        sd_bus_call_method(mpBus, kName, kPath, kName, "Status", nullptr, &reply, "i", 1) >= 0 &&
        sd_bus_message_read(reply, "iixx", &status, &reserved, &position, &duration) > 0;
    sd_bus_message_unref(reply);
    return answered && status == 2;
}

DbusPeer::DbusPeer(int connections) {
    const std::string address = startBus(mBusDaemon);
    mService = ChildProcess::call([&] { serve(address); });
    bool areConnected = true;
    for (int i = 0; i < connections; ++i)
        areConnected = mConnections.emplace_back(address).ready() && areConnected;
    mReady = areConnected && awaitService();
}

bool DbusPeer::awaitService() {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (!mConnections.front().call()) {
        if (std::chrono::steady_clock::now() > deadline)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
}

} // namespace bench
