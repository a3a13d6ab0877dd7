// SPDX-License-Identifier: MIT
#pragma once

#include "define/FileName.h"

#include <string>

namespace MediaServiceDefine {

struct _tagSeekParam {
    int iClientID = -1;
    int iSeekMode = 0;  ///< 0 accurate, 1 nearest key frame, 2 relative
    long lPosition = 0; ///< nanoseconds
    bool bSeekOption = false;
};

struct _tagRepeatParam {
    int iClientID = -1;
    bool bRepeat = false;
    long lRepeatStart = 0; ///< nanoseconds
    long lRepeatEnd = -1;  ///< nanoseconds; -1: the end of the file
};

/** Zero and non-zero are told apart; see MediaPlayerService::setSystemFormat. */
enum _emMediaServiceSystemFormat : int {};

struct _tagMediaPlayerStatus {
    int iStatus = 0;
    int iReserved = 0;
    long lStatusValue1 = 0; ///< position, nanoseconds
    long lStatusValue2 = 0; ///< duration, nanoseconds
};

/** A notification of the engine's player, field by field. */
struct _tagMediaPlayerNotify {
    int iNotifyType = 0;
    int iNotifyResult = 0; ///< 0 after an open: the player is ready
    std::wstring strNotifyText;
    int iNotifyParam1 = 0;
    int iNotifyParam2 = 0;
    int iNotifyParam3 = 0;
    unsigned long ulNotifyValue1 = 0;
    unsigned long ulNotifyValue2 = 0;
    long lNotifyValue = 0;
};

} // namespace MediaServiceDefine
