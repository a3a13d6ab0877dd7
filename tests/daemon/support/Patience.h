// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

/**
 * Deadlines of tests. Each stands for an event that is to come: reaching one is a failure, so
 * they are generous, and longer still where a sanitizer slows everything down. The environment
 * variable QNS_TEST_PATIENCE multiplies them.
 */
namespace patience {

using Clock = std::chrono::steady_clock;

/** How much slower than a free machine with an optimised build everything may be. */
double factor();

/** A time that the product promises, stretched by factor(). */
std::chrono::milliseconds stretched(std::chrono::milliseconds promised);

/** For events whose time nobody promised. */
Clock::time_point deadline();

/** Milliseconds until `deadline` as poll(2) wants them, 0 when it has passed. */
int pollTimeout(Clock::time_point deadline);

} // namespace patience
