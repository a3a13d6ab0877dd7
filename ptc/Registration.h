// SPDX-License-Identifier: MIT
#pragma once

namespace PTC {

struct Event;

/** What a client tells about an object that it registers. What it leaves out is 0. */
struct Registration {
    long objectId = 0; ///< the object inside the client process
    long identity = 0; ///< the client process; 0 for a caller inside this process
    int clientId = 0;  ///< only with a notify object
};

/** How wide a service reads the object id in a record that comes from inside the process. */
enum class RecordObjectId { bits32, bits64 };

/**
 * Reads the argument block of a registration: encoded fields when the event is remote, else a
 * `_tagCallBackInfo` or `_tagNotifyInfo` as it stands in memory. Such a record ends with the
 * call: it is freed and the event left without data. Any block is safe to read, also one whose
 * size is not that of the record.
 */
Registration takeCallBackRegistration(Event& event);
Registration takeNotifyRegistration(Event& event, RecordObjectId width);

} // namespace PTC
