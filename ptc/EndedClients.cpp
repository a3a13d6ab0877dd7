// SPDX-License-Identifier: MIT
#include "ptc/EndedClients.h"

#include "ptc/IProxyHolder.h"
#include "ptc/SocketRemoteSender.h"

#include <utility>

namespace PTC {

void EndedClients::addHolder(IProxyHolder& holder) {
    mHolders.push_back(&holder);
}

void EndedClients::release(ClientConnections& connections) {
    takeEnded(connections);
    mEnded.remove_if([this](const ClientConnection& ended) { return letGo(ended); });
}

void EndedClients::takeEnded(ClientConnections& connections) {
    for (auto client = connections.begin(); client != connections.end();) {
        auto* const sender = dynamic_cast<SocketRemoteSender*>(client->second.pSender.get());
        if (sender == nullptr || !sender->hasEnded()) {
            ++client;
            continue;
        }
        sender->giveUp();
        mEnded.push_back(std::move(client->second));
        client = connections.erase(client);
    }
}

bool EndedClients::letGo(const ClientConnection& connection) const {
    bool isFree = true;
    for (const auto& proxy : connection.proxies)
        for (IProxyHolder* holder : mHolders)
            isFree = holder->letGo(*proxy) && isFree;
    return isFree;
}

} // namespace PTC
