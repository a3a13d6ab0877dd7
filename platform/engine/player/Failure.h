// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "gst/Types.h"

namespace engine {

/** A LibMediaPlayer::Result that is not 0, and a text for people. */
struct Failure {
    int result = 0;
    std::wstring text;
};

/** The usual text of a Result. */
Failure failure(int result);

/**
 * What an error message of a pipeline means. The library's own texts differ from run to run for
 * the same file, and so are not passed on.
 */
Failure failureOf(GstMessage* error);

} // namespace engine
