// SPDX-License-Identifier: MIT
#pragma once

namespace gst {

/**
 * Loads GStreamer's registry, once per process; later calls return at once, and those made
 * meanwhile wait. It takes milliseconds, or a second when plugins have to be scanned first, so
 * it belongs on an engine thread. Unless GST_DEBUG is set nothing is printed any more.
 */
void initialise();

} // namespace gst
