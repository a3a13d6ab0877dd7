// SPDX-License-Identifier: MIT
#pragma once

#include "define/FileName.h"
#include "pack/ArgumentReader.h"

namespace PTC {

/** Reads the record with which clients of several services open a file. */
inline void readFileName(MediaServiceDefine::_tagFileName& record, ArgumentReader& reader) {
    reader.read(record.iClientID);
    reader.read(record.strFileName);
}

} // namespace PTC
