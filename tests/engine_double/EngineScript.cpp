// SPDX-License-Identifier: MIT
#include "tests/engine_double/EngineScript.h"

#include <cstdlib>
#include <stdexcept>

#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/un.h>

namespace {

script::Clock::time_point patience() {
    return script::Clock::now() + EngineScript::kPatience;
}

std::filesystem::path makeFolder() {
    std::string folder = std::filesystem::temp_directory_path() / "engine-script-XXXXXX";
    if (!::mkdtemp(folder.data()))
        throw std::runtime_error("cannot make " + folder);
    return folder;
}

qns::UniqueFd listenAt(const std::string& path) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    if (path.copy(address.sun_path, sizeof(address.sun_path) - 1) != path.size())
        throw std::runtime_error("path too long: " + path);
    qns::UniqueFd listener(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
    constexpr int kBacklog = 8; // both connections of a player, before any is accepted
    if (::bind(listener.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0 ||
        ::listen(listener.get(), kBacklog) != 0)
        throw std::runtime_error("cannot listen at " + path);
    return listener;
}

std::string toLine(const LibMediaPlayer::MediaPlayerNotify& notification) {
    std::string line = "notify";
    for (const int value : {notification.type, notification.result, notification.param1,
                            notification.param2, notification.param3})
        line += ' ' + std::to_string(value);
    for (const unsigned long value : {notification.uvalue1, notification.uvalue2})
        line += ' ' + std::to_string(value);
    return line + ' ' + std::to_string(notification.value) + ' ' +
           script::quoted(notification.text);
}

std::string toLine(const LibMediaPlayer::MediaImporterNotify& notification) {
    return "notify " + std::to_string(notification.kind) + ' ' +
           std::to_string(notification.result) + ' ' + script::quoted(notification.text);
}

} // namespace

EngineScript::EngineScript()
    : mFolder(makeFolder()), mAddress(mFolder / "socket"), mListener(listenAt(mAddress)) {}

EngineScript::~EngineScript() {
    std::error_code ignored;
    std::filesystem::remove_all(mFolder, ignored);
}

std::string EngineScript::nextCall() {
    const auto deadline = patience();
    do {
        if (mCalls.isOpen()) {
            if (auto call = mCalls.receive(deadline))
                return *std::move(call);
        }
    } while (script::Clock::now() < deadline && acceptPlayer());
    ADD_FAILURE() << "the engine is not called";
    return {};
}

void EngineScript::answer(std::string_view answer) {
    mCalls.send(answer);
}

void EngineScript::expectCall(std::string_view call, std::string_view answer) {
    EXPECT_EQ(nextCall(), call);
    this->answer(answer);
}

void EngineScript::notify(const LibMediaPlayer::MediaPlayerNotify& notification) {
    notifyAtOnce({notification});
}

void EngineScript::notifyAtOnce(
    const std::vector<LibMediaPlayer::MediaPlayerNotify>& notifications) {
    startNotify(notifications);
    awaitNotified();
}

void EngineScript::notifyImport(const LibMediaPlayer::MediaImporterNotify& notification) {
    notifyImportsAtOnce({notification});
}

void EngineScript::notifyImportsAtOnce(
    const std::vector<LibMediaPlayer::MediaImporterNotify>& notifications) {
    order(notifications);
    awaitNotified();
}

void EngineScript::startNotify(
    const std::vector<LibMediaPlayer::MediaPlayerNotify>& notifications) {
    order(notifications);
}

template<typename Notification>
void EngineScript::order(const std::vector<Notification>& notifications) {
    for (const auto& notification : notifications)
        mOrders.send(toLine(notification));
    mOrders.send("deliver");
}

void EngineScript::awaitNotified() {
    EXPECT_EQ(mOrders.receive(patience()), "delivered");
}

bool EngineScript::acceptPlayer() {
    mCalls = script::LineChannel(acceptConnection());
    mOrders = script::LineChannel(mCalls.isOpen() ? acceptConnection() : qns::UniqueFd());
    return mOrders.isOpen();
}

qns::UniqueFd EngineScript::acceptConnection() {
    if (!script::waitReadable(mListener.get(), patience()))
        return {};
    return qns::UniqueFd(::accept4(mListener.get(), nullptr, nullptr, SOCK_CLOEXEC));
}
