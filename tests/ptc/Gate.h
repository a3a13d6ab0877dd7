// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <future>

/** How long a test waits for what must happen. */
constexpr std::chrono::seconds kPatience{60};

/** Opened once, by any thread; the others wait for it. */
class Gate {
public:
    void open() { mPromise.set_value(); }
    [[nodiscard]] bool wait() const {
        return mFuture.wait_for(kPatience) == std::future_status::ready;
    }
    [[nodiscard]] bool isOpen() const {
        return mFuture.wait_for(std::chrono::seconds(0)) == std::future_status::ready;
    }

private:
    std::promise<void> mPromise;
    std::shared_future<void> mFuture = mPromise.get_future().share();
};
