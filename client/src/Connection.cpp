// SPDX-License-Identifier: MIT
#include "qnsmedia/Connection.h"

#include <utility>

#include "client/src/Link.h"

namespace qnsmedia {

Connection::Connection() : Connection(Options{}) {}

Connection::Connection(const Options& options) : mpLink(std::make_shared<Link>(options)) {}

Connection::~Connection() = default;

int Connection::identity() const {
    return mpLink->identity();
}

bool Connection::alive() const {
    return mpLink->alive();
}

void Connection::onLost(std::function<void()> handler) {
    mpLink->onLost(std::move(handler));
}

void Connection::onError(std::function<void(std::exception_ptr)> handler) {
    mpLink->onError(std::move(handler));
}

} // namespace qnsmedia
