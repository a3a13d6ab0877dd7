// SPDX-License-Identifier: MIT
#pragma once

namespace PTC {

/**
 * One call: method `methodId` of object `objectId`, with one argument block.
 *
 * Whoever consumes an event last deletes it. A receiver frees `data` too; a sender does not.
 */
struct Event {
    /** The order of the arguments differs from the order of the fields. */
    Event(long object, long method, void* block, long length, bool remote, bool callback)
        : objectId(object),
          methodId(method),
          data(static_cast<char*>(block)),
          isCallback(callback),
          size(length),
          isRemote(remote) {}

    long objectId;
    long methodId;
    char* data;      ///< argument block, allocated with `new char[]`
    bool isCallback; ///< false: request to a service; true: callback or notification to a client
    long size;       ///< length of `data` in bytes
    bool isRemote;   ///< true: `data` is encoded; false: `data` is the argument record itself
};

} // namespace PTC
