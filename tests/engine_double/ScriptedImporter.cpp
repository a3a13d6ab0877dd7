// SPDX-License-Identifier: MIT
#include "tests/engine_double/ScriptedImporter.h"

#include <cstddef>
#include <optional>
#include <utility>

#include "tests/engine_double/ScriptText.h"

using LibMediaPlayer::MediaImporterNotify;

namespace {

constexpr char kVariable[] = "QNS_IMPORTER_DOUBLE";

std::optional<MediaImporterNotify> toNotification(const std::vector<std::wstring>& words) {
    if (words.size() != 4)
        return std::nullopt;
    return MediaImporterNotify{static_cast<int32_t>(script::number(words[1])),
                               static_cast<int32_t>(script::number(words[2])), words[3]};
}

} // namespace

std::unique_ptr<ScriptedImporter> ScriptedImporter::create() {
    auto calls = script::LineChannel::connectToNamedBy(kVariable);
    auto orders = script::LineChannel::connectToNamedBy(kVariable);
    if (calls.ask("importer create") == "null")
        return nullptr;
    return std::unique_ptr<ScriptedImporter>(
        new ScriptedImporter(std::move(calls), std::move(orders)));
}

ScriptedImporter::ScriptedImporter(script::LineChannel calls, script::LineChannel orders)
    : mCalls(std::move(calls)), mNotifications(std::move(orders), toNotification) {}

ScriptedImporter::~ScriptedImporter() {
    static_cast<void>(mCalls.ask("importer destroy"));
}

int ScriptedImporter::import(const std::wstring& path, const std::wstring& folder) {
    return script::resultIn(
        mCalls.ask("importer import " + script::quoted(path) + ' ' + script::quoted(folder)));
}

int ScriptedImporter::cancel() {
    return script::resultIn(mCalls.ask("importer cancel"));
}

int ScriptedImporter::status(LibMediaPlayer::MediaImporterStatus& status) {
    const auto answer = script::words(mCalls.ask("importer status"));
    const auto number = [&](std::size_t index) {
        return answer.size() > index ? script::number(answer[index]) : 0;
    };
    status = {number(2), number(3)};
    return static_cast<int>(number(1));
}

void ScriptedImporter::setNotify(std::function<void(MediaImporterNotify&)> notify) {
    mNotifications.setFunction(std::move(notify));
}

int ScriptedImporter::dumpGraph(const std::wstring& path) {
    return script::resultIn(mCalls.ask("importer dumpGraph " + script::quoted(path)));
}
