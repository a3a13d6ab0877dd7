// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/Event.h"
#include "ptc/IAdapter.h"

#include <functional>
#include <memory>
#include <string_view>
#include <utility>

/** An adapter whose behaviour is a function of the test. */
class TestAdapter : public PTC::IAdapterBase {
public:
    using Handler = std::function<void(PTC::Event&)>;

    explicit TestAdapter(long id, Handler handler = nullptr)
        : mId(id), mHandler(std::move(handler)) {}
    ~TestAdapter() override {
        if (onDestroyed)
            onDestroyed();
    }

    long getId() override { return mId; }
    void receive(PTC::Event* event) override {
        ++calls;
        if (mHandler)
            mHandler(*event);
    }
    void setTarget(void*) override {}

    int calls = 0;
    std::function<void()> onDestroyed;

private:
    long mId;
    Handler mHandler;
};

/** An event as a transport makes it: the block is freed by whoever consumes it. */
inline std::unique_ptr<PTC::Event> makeEvent(long objectId, long methodId, bool isCallback = false,
                                             std::string_view bytes = "x") {
    auto block = std::make_unique<char[]>(bytes.size());
    bytes.copy(block.get(), bytes.size());
    auto event = std::make_unique<PTC::Event>(objectId, methodId, nullptr,
                                              static_cast<long>(bytes.size()), true, isCallback);
    event->data = block.release();
    return event;
}
