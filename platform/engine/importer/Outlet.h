// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <mutex>
#include <string>

#include "LibMediaPlayer/IMediaImporter.h"

namespace importer {

/** Where notifications leave the importer, one after another. Any thread. */
class Outlet {
public:
    using Function = std::function<void(LibMediaPlayer::MediaImporterNotify&)>;

    void setFunction(Function function);
    void tell(LibMediaPlayer::ImporterNotifyKind kind, int result, const std::wstring& text);

private:
    /** Held while a notification is delivered; the function may come back and set another. */
    std::recursive_mutex mDelivery;
    Function mFunction; ///< guarded by mDelivery
};

} // namespace importer
