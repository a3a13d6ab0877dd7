// SPDX-License-Identifier: MIT
#include "tests/daemon/support/ProtocolPage.h"

#include <fstream>
#include <sstream>

#include <gtest/gtest.h>

namespace {

PageBlock blockTitled(const std::string& title) {
    PageBlock block;
    block.title = title;
    std::istringstream words(title);
    words >> block.service;
    if (block.service != "discoverer" && block.service != "importer") {
        block.service = "player";
        words.seekg(0);
    }
    words >> block.kind >> block.method;
    return block;
}

} // namespace

wire::Bytes PageBlock::bytes() const {
    wire::Bytes all;
    for (const auto& line : lines)
        all += wire::hex(line);
    return all;
}

wire::Bytes PageBlock::packet() const {
    wire::Bytes packet(wire::kPacketSize, '\0');
    for (const auto& line : lines) {
        const auto part = wire::hex(line.substr(line.find(':') + 1));
        packet.replace(std::stoul(line, nullptr, 16), part.size(), part);
    }
    return packet;
}

std::vector<PageBlock> blocksOfPage() {
    std::ifstream page(QNS_SOURCE_DIR "/docs/protocol.md");
    EXPECT_TRUE(page);
    std::vector<PageBlock> blocks;
    bool inside = false;
    for (std::string line; std::getline(page, line);) {
        const bool fence = line.rfind("```", 0) == 0;
        if (fence && !inside)
            blocks.push_back(blockTitled(line.substr(3)));
        else if (!fence && inside)
            blocks.back().lines.push_back(line.substr(0, line.find('#')));
        inside = fence != inside;
    }
    return blocks;
}
