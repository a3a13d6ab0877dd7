// SPDX-License-Identifier: MIT
#include "tests/engine_double/ScriptedDiscoverer.h"

#include <mutex>

#include "tests/engine_double/LineChannel.h"
#include "tests/engine_double/MetadataText.h"
#include "tests/engine_double/ScriptText.h"

namespace {

/** The process's connection to the script. */
class Script {
public:
    static Script& ofProcess() {
        static Script script;
        return script;
    }

    std::string ask(const std::string& call) {
        const std::lock_guard lock(mMutex);
        return mCalls.ask(call);
    }

    int nextNumber() {
        const std::lock_guard lock(mMutex);
        return mNextNumber++;
    }

private:
    Script() = default;

    static script::LineChannel connect() {
        return script::LineChannel::connectToNamedBy("QNS_DISCOVERER_DOUBLE");
    }

    std::mutex mMutex; ///< guards all below
    script::LineChannel mCalls = connect();
    script::LineChannel mOrders = connect(); ///< there are none, but scripts wait for it
    int mNextNumber = 0;
};

} // namespace

std::unique_ptr<ScriptedDiscoverer> ScriptedDiscoverer::create() {
    Script& script = Script::ofProcess();
    const int number = script.nextNumber();
    if (script.ask("discoverer " + std::to_string(number) + " create") == "null")
        return nullptr;
    return std::unique_ptr<ScriptedDiscoverer>(new ScriptedDiscoverer(number));
}

ScriptedDiscoverer::~ScriptedDiscoverer() {
    static_cast<void>(call("destroy"));
}

int ScriptedDiscoverer::open(const std::wstring& path) {
    return call("open " + script::quoted(path));
}

int ScriptedDiscoverer::close() {
    return call("close");
}

int ScriptedDiscoverer::metadata(LibMediaPlayer::MediaMetaInfo& info) {
    const auto answer = ask("metadata");
    info = script::metadataIn(answer);
    return script::resultIn(answer);
}

int ScriptedDiscoverer::reserved5() {
    return call("reserved5");
}

int ScriptedDiscoverer::makeImage(int64_t position, int32_t width, int32_t height,
                                  const std::wstring& path) {
    return call("makeImage " + std::to_string(position) + ' ' + std::to_string(width) + ' ' +
                std::to_string(height) + ' ' + script::quoted(path));
}

int ScriptedDiscoverer::reserved7() {
    return call("reserved7");
}

int ScriptedDiscoverer::supportedExtensions(LibMediaPlayer::SupportedExtensions& extensions) {
    const auto answer = ask("extensions");
    if (answer.size() > 3)
        extensions = {answer[2], static_cast<int32_t>(script::number(answer[3]))};
    return script::resultIn(answer);
}

std::vector<std::wstring> ScriptedDiscoverer::ask(std::string_view call) const {
    const std::string line = "discoverer " + std::to_string(mNumber) + ' ' + std::string(call);
    return script::words(Script::ofProcess().ask(line));
}

int ScriptedDiscoverer::call(std::string_view call) const {
    return script::resultIn(ask(call));
}
