// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <string>

namespace MediaServiceDefine {

/** What a client wants imported. */
struct _tagImportParam {
    int iClientID = -1;
    std::wstring strParam1; ///< the media file
    std::wstring strParam2; ///< the folder inside the library; empty: where the file lies
};

struct _tagMediaImporterStatus {
    int iStatus = 0;
    int iReserved = 0;
    long llValue1 = 0; ///< bytes done
    long llValue2 = 0; ///< bytes in all
};

/** A notification of the engine's importer, and what is known of the media file. */
struct _tagMediaImporterNotify {
    int iNotifyType = 0;
    int iRet = 0; ///< 0 when all is well, else the engine's result
    std::wstring strText1;
    std::wstring strText2;       ///< the video stream in words
    std::wstring strText3;       ///< the first audio stream in words
    std::array<int, 5> iValue{}; ///< width, height, frame rate (two numbers), sample rate
};

} // namespace MediaServiceDefine
