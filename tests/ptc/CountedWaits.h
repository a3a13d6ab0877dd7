// SPDX-License-Identifier: MIT
#pragma once

/**
 * The semaphores of this program's own code, which is linked so that calls come here first. Any
 * thread may use them.
 */
namespace counted_waits {

/** How often a thread has been woken by a post since the program began. */
[[nodiscard]] int wakeUps();

/** The next wait fails for good. */
void failNextWait();

/** Posts fail until the end of the scope. */
class FailingPosts {
public:
    FailingPosts();
    ~FailingPosts();
    FailingPosts(const FailingPosts&) = delete;
    FailingPosts& operator=(const FailingPosts&) = delete;
};

} // namespace counted_waits
