// SPDX-License-Identifier: MIT
#include "ptc/Registration.h"

#include "define/RegistrationInfo.h"
#include "pack/ArgumentReader.h"
#include "ptc/Event.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <utility>

namespace PTC {

namespace {

template<typename... Fields>
void decode(const Event& event, Fields&... fields) {
    ArgumentReader reader(event.data, event.size);
    (reader.read(fields), ...);
}

/** A field of a record in memory; 0 when the block does not reach to its end. */
template<typename Field>
Field fieldAt(const Event& event, std::size_t offset) {
    Field field = 0;
    if (event.data && event.size >= static_cast<long>(offset + sizeof(field)))
        std::memcpy(&field, event.data + offset, sizeof(field));
    return field;
}

void deleteRecord(Event& event) {
    delete[] std::exchange(event.data, nullptr);
    event.size = 0;
}

} // namespace

Registration takeCallBackRegistration(Event& event) {
    Registration registration;
    if (event.isRemote) {
        decode(event, registration.objectId, registration.identity);
        return registration;
    }
    registration.objectId = fieldAt<int32_t>(event, offsetof(_tagCallBackInfo, lObjectID));
    deleteRecord(event);
    return registration;
}

Registration takeNotifyRegistration(Event& event, RecordObjectId width) {
    Registration registration;
    if (event.isRemote) {
        decode(event, registration.objectId, registration.identity, registration.clientId);
        return registration;
    }
    constexpr std::size_t offset = offsetof(_tagNotifyInfo, lObjectID);
    registration.objectId = width == RecordObjectId::bits32 ? fieldAt<int32_t>(event, offset)
                                                            : fieldAt<long>(event, offset);
    registration.clientId = fieldAt<int>(event, offsetof(_tagNotifyInfo, iClientID));
    deleteRecord(event);
    return registration;
}

} // namespace PTC
