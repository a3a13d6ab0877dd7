// SPDX-License-Identifier: MIT
#pragma once

#include <optional>

#include "pack/ArgumentReader.h"
#include "qnsmedia/ImporterTypes.h"

/** What the daemon's importer sends, decoded; nothing when it ends early. */
namespace qnsmedia {

std::optional<ImporterStatus> readImporterStatus(ArgumentReader& arguments);
std::optional<ImportNotification> readImportNotification(ArgumentReader& arguments);

} // namespace qnsmedia
