// SPDX-License-Identifier: MIT
#pragma once

namespace PTC {
struct Event;
}

namespace fuzz {

/** That a client finds in the event what its method promises: so many values, and nothing else. */
void requireDecodable(long interfaceId, const PTC::Event& event);

} // namespace fuzz
