// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "tests/daemon/support/WireFormat.h"

/**
 * A fenced block of docs/protocol.md. Behind the fence stands what it shows: the service unless it
 * is the player, the kind, and the method, such as `importer request 2`.
 */
struct PageBlock {
    std::string title;
    std::string service;
    std::string kind;
    long method = 0;
    std::vector<std::string> lines; ///< without comments

    /** The bytes of all lines. */
    [[nodiscard]] wire::Bytes bytes() const;

    /** A whole packet: lines are `offset: bytes`; what no line names is zero. */
    [[nodiscard]] wire::Bytes packet() const;
};

/** All blocks of the page, in order. */
std::vector<PageBlock> blocksOfPage();
