// SPDX-License-Identifier: MIT
#pragma once

#include "bench/Report.h"

#include <array>
#include <chrono>
#include <string>
#include <vector>

namespace bench {

/** Makes the compiler believe that `value`, and all of memory, is looked at here. */
template<class Value>
inline void keep(const Value& value) {
    asm volatile("" : : "g"(&value) : "memory");
}

/** Nanoseconds a call, over one batch. The operation gets the number of the call. */
template<class Operation>
double timeBatch(const Operation& operation, int calls) {
    const auto start = std::chrono::steady_clock::now();
    for (int call = 0; call < calls; ++call)
        operation(static_cast<unsigned>(call));
    const std::chrono::duration<double, std::nano> took = std::chrono::steady_clock::now() - start;
    return took.count() / calls;
}

/** One way to do the measured thing. */
template<class Operation>
struct Contender {
    const char* who;
    Operation run;
    Role role;
};

template<class Operation>
Contender<Operation> ours(Operation run) {
    return {"QNSMediaService", run, Role::ours};
}

template<class Operation>
Contender<Operation> theirs(Operation run) {
    return {"msgpack-c", run, Role::peer};
}

/** For wide text, which the other library does not know: the C library narrows it first. */
template<class Operation>
Contender<Operation> theirsNarrowing(Operation run) {
    return {"msgpack-c + wcstombs", run, Role::peer};
}

/** Theirs with the text narrow beforehand: the least that is left to do. */
template<class Operation>
Contender<Operation> theirsReady(Operation run) {
    return {"msgpack-c, narrow text", run, Role::floor};
}

/**
 * Times small operations in turn, batch by batch, so that a change of the machine's speed meets
 * them all.
 */
class Comparison {
public:
    Comparison(Report& report, int rounds) : mReport(report), mRounds(rounds) {}

    template<class... Operations>
    void compare(std::string name, const Contender<Operations>&... contenders) const {
        constexpr int kCalls = 2000;
        (timeBatch(contenders.run, kCalls), ...);
        std::array<std::vector<double>, sizeof...(contenders)> samples;
        for (int round = 0; round < mRounds; ++round) {
            auto next = samples.begin();
            ((next++)->push_back(timeBatch(contenders.run, kCalls)), ...);
        }
        auto next = samples.begin();
        mReport.add(
            Row{std::move(name), "ns", {{contenders.who, summarize(*next++), contenders.role}...}});
    }

private:
    Report& mReport;
    int mRounds;
};

/** The three parts of the subcommand. */
void comparePacking(const Comparison& comparison);
void compareUnpacking(const Comparison& comparison);
void compareRecords(const Comparison& comparison);

} // namespace bench
