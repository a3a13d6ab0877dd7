// SPDX-License-Identifier: MIT
#include "importer/Outlet.h"

#include <utility>

#include "handle/Barrier.h"

namespace importer {

using namespace LibMediaPlayer;

void Outlet::setFunction(Function function) {
    const std::lock_guard lock(mDelivery);
    mFunction = std::move(function);
}

void Outlet::tell(ImporterNotifyKind kind, int result, const std::wstring& text) {
    const std::lock_guard lock(mDelivery);
    MediaImporterNotify notification{kind, result, text};
    // A copy, because the function may set another one.
    if (const Function function = mFunction)
        handle::guarded([&] { function(notification); });
}

} // namespace importer
