// SPDX-License-Identifier: MIT
#include "gst/Library.h"

#include <gst/gst.h>

#include <cstdlib>
#include <mutex>

namespace gst {

namespace {

void load() {
    gst_init_check(nullptr, nullptr, nullptr);
    if (!std::getenv("GST_DEBUG"))
        gst_debug_set_active(FALSE);
}

} // namespace

void initialise() {
    static std::once_flag once;
    std::call_once(once, load);
}

} // namespace gst
