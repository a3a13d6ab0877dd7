// SPDX-License-Identifier: MIT
#include "ptc/RemoteSender.h"

namespace PTC {

RemoteSender::RemoteSender(long id) : mId(id) {}

long RemoteSender::getId() {
    return mId;
}

bool RemoteSender::initialize(long identity) {
    mIdentity = identity;
    return true;
}

void RemoteSender::setId(long id) {
    mId = id;
}

long RemoteSender::getIdentity() {
    return mIdentity;
}

} // namespace PTC
