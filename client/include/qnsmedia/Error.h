// SPDX-License-Identifier: MIT
#pragma once

#include <stdexcept>
#include <string>

#include "qnsmedia/Export.h"

namespace qnsmedia {

/**
 * Base of everything that the library throws or stores in a future. what() is for people. An
 * object of this very class tells of wrong arguments, or of an answer that cannot be read.
 */
class QNSMEDIA_API Error : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/** Nobody listens at the daemon's port. */
class QNSMEDIA_API DaemonNotRunning : public Error {
public:
    using Error::Error;
};

/** The identity that was asked for, or every one, is used by another process. */
class QNSMEDIA_API IdentityInUse : public Error {
public:
    using Error::Error;
};

/** The daemon answered that it will not do it. */
class QNSMEDIA_API Refused : public Error {
public:
    using Error::Error;
};

/** No answer within the deadline. */
class QNSMEDIA_API TimedOut : public Error {
public:
    using Error::Error;
};

/** The daemon has gone, or the player that asked has been destroyed, before an answer came. */
class QNSMEDIA_API ConnectionLost : public Error {
public:
    using Error::Error;
};

/** The medium could not be opened or played. */
class QNSMEDIA_API MediaError : public Error {
public:
    MediaError(int result, const std::string& message) : Error(message), mResult(result) {}

    /**
     * The engine's code: 1 not found, 2 access denied, 3 not media or no decoder, 4 damaged,
     * 5 not available, 6 cancelled, 7 timed out, 8 no space, 9 internal, -1 not possible.
     */
    [[nodiscard]] int result() const noexcept { return mResult; }

private:
    int mResult;
};

/** The engine's code in a few words: "not found". Any thread. */
QNSMEDIA_API std::string resultText(int result);

} // namespace qnsmedia
