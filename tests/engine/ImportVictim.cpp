// SPDX-License-Identifier: MIT
// Imports files until it is killed, and writes a line for each that is done.
// usage: engine_import_victim DATA_FOLDER FILE...
#include <algorithm>
#include <condition_variable>
#include <mutex>
#include <unistd.h>

#include "importer/Importer.h"
#include "tests/engine/TestImporter.h"

using namespace LibMediaPlayer;

namespace {

void writeLine(const std::wstring& text) {
    const std::string line = std::filesystem::path(text).string() + "\n";
    if (::write(STDOUT_FILENO, line.data(), line.size()) < 0)
        ::_exit(1);
}

} // namespace

int main(int argc, char** argv) {
    TestImporter importer(argv[1], anyMedium(), [](const auto& notification) {
        if (notification.kind == kImportFinished && notification.result == kOk)
            writeLine(notification.text);
    });
    for (int number = 2; number < argc; ++number)
        importer->import(wide(argv[number]), number % 3 ? L"Films" : L"");
    for (int number = 2; number < argc; ++number)
        importer.awaitFinished();
    return 0;
}
