// SPDX-License-Identifier: MIT
#pragma once

#include "define/FileName.h"

#include <cstdint>
#include <string>

namespace MediaServiceDefine {

/** The picture that a client wants of its open file. */
struct _tagImageParam {
    int32_t iClientID = -1;
    int32_t iWidth = 0;
    int32_t iHeight = 0;
    int64_t lPosition = 0; ///< nanoseconds
    std::wstring strImagePath;
    std::wstring strNoticePath; ///< a file to be written when the request is answered
};

/** What became of a picture. */
struct _tagMediaImageInfo {
    int32_t iResult = -1; ///< 0: the engine's picture; 1: none, or a black one in its place
    int32_t iRet = 0;     ///< the engine's return code
    std::wstring strFileName;
    std::wstring strImagePath;
};

struct _tagSupportedExtensions {
    std::wstring strExtensions;
    int32_t iReserved = 0; ///< always 0
    int32_t iExtensionValue = 0;
};

/** What the engine tells of a whole file. */
struct _tagSystemMetaInfo {
    std::wstring strNarrowInfo;
    std::wstring strWideInfo;
    uint8_t bFlag1 = 0;
    uint8_t bFlag2 = 0;
    int64_t lDuration = 0; ///< nanoseconds
};

/** What the engine tells of a video stream. */
struct _tagVideoMetaInfo {
    std::wstring strNarrowInfo;
    std::wstring strWideInfo;
    int32_t iVideoInfo1 = 0;
    int32_t iVideoInfo2 = 0;
    int32_t iVideoInfo3 = 0;
    int32_t iVideoInfo4 = 0;
    int32_t iVideoInfo5 = 1;
    int32_t iVideoInfo6 = 1;
    int32_t iVideoInfo7 = 1;
    bool bVideoFlag1 = false;
    int32_t iVideoInfo8 = 0;
    int32_t iVideoInfo9 = 0;
    bool bVideoFlag2 = true;
};

/** What the engine tells of an audio stream. */
struct _tagAudioMetaInfo {
    std::wstring strNarrowInfo;
    std::wstring strWideInfo;
    int32_t iAudioInfo1 = 0;
    int32_t iAudioInfo2 = 0;
    int32_t iAudioInfo3 = 0;
    int32_t iAudioInfo4 = 0;
    int32_t iAudioInfo5 = 0;
};

/** All that is told of a file. The blocks of packed stream records are borrowed. */
struct _tagMediaMetaInfo {
    int32_t iResult = -1; ///< 0: read; 1: failed
    int32_t iRet = 0;     ///< the engine's return code; -1 without an engine
    _tagSystemMetaInfo systemInfo;
    const uint8_t* pVideoData = nullptr;
    int32_t iVideoDataSize = 0;
    int32_t iVideoCount = 0;
    const uint8_t* pAudioData = nullptr;
    int32_t iAudioDataSize = 0;
    int32_t iAudioCount = 0;
};

} // namespace MediaServiceDefine
