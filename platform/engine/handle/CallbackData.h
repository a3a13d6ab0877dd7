// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <utility>

namespace handle {

/**
 * What a C library keeps for a callback, made on one thread, used on others, and deleted by the
 * last. The library orders these by means of its own, which are not part of C++'s memory model
 * and which tools cannot see; so the order is stated here again.
 */
template<typename Value>
class CallbackData {
public:
    explicit CallbackData(Value value) : mValue(std::move(value)) { leave(); }
    ~CallbackData() { enter(); }
    CallbackData(const CallbackData&) = delete;
    CallbackData& operator=(const CallbackData&) = delete;

    template<typename Function>
    decltype(auto) use(Function&& function) {
        enter();
        const Leave leave{*this};
        return std::forward<Function>(function)(mValue);
    }

private:
    struct Leave {
        CallbackData& data;
        ~Leave() { data.leave(); }
    };

    void enter() { mOrder.load(std::memory_order_acquire); }
    void leave() { mOrder.fetch_add(1, std::memory_order_acq_rel); }

    Value mValue;
    std::atomic<unsigned int> mOrder{0};
};

} // namespace handle
