// SPDX-License-Identifier: MIT
#pragma once

/**
 * System calls of this program's own code that fail when a test wants it. The program is linked so
 * that they come here first. Any thread may make them.
 */
namespace failing_calls {

/** Setting this socket option fails until the end of the scope. */
class FailingOption {
public:
    explicit FailingOption(int option);
    ~FailingOption();
    FailingOption(const FailingOption&) = delete;
    FailingOption& operator=(const FailingOption&) = delete;
};

/** Listening fails until the end of the scope. */
class FailingListen {
public:
    FailingListen();
    ~FailingListen();
    FailingListen(const FailingListen&) = delete;
    FailingListen& operator=(const FailingListen&) = delete;
};

/** The next so many acknowledgements cannot be sent. */
void failAcknowledgements(int count);

/** How many of them are still to fail. */
[[nodiscard]] int acknowledgementsToFail();

} // namespace failing_calls
