// SPDX-License-Identifier: MIT
// In the place of the one that writes: inputs name any files of the machine.
#include "discoverer/ClientFile.h"

#include "discoverer/BlackPicture.h"
#include "fuzz/support/Require.h"

void qns::writeClientFile(const std::wstring&, const void* bytes, std::size_t size) {
    fuzz::require(bytes != nullptr && size <= qns::kMaxBlackPixels * sizeof(uint32_t));
}
