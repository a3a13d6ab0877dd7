// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <nlohmann/json.hpp>
#include <set>
#include <unistd.h>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/HumanSize.h"
#include "cli/HumanTime.h"
#include "cli/ImportFiles.h"
#include "cli/ImportRun.h"
#include "cli/Output.h"
#include "qnsmedia/Discoverer.h"

namespace {

constexpr int kCancelled = 6;

bool isFolder(const std::string& path) {
    std::error_code error;
    return std::filesystem::is_directory(path, error);
}

/** The daemon knows which files of a folder are worth a try. */
std::set<std::string> extensionsFor(qnsmedia::Connection& connection,
                                    const std::vector<std::string>& paths) {
    if (std::none_of(paths.begin(), paths.end(), isFolder))
        return {};
    qnsmedia::Discoverer discoverer(connection);
    const std::vector<std::string> extensions = discoverer.extensions().get();
    return {extensions.begin(), extensions.end()};
}

/** What a run has come to. */
struct Summary {
    std::size_t imported = 0;
    std::int64_t bytes = 0;
    std::size_t failed = 0;
    std::size_t cancelled = 0; ///< or not begun
};

Summary summarize(const std::vector<ImportFile>& files, const ImportOutcomes& outcomes) {
    Summary summary;
    for (std::size_t index = 0; index < files.size(); ++index) {
        const auto& outcome = outcomes.of(index);
        if (!outcome.known || outcome.result == kCancelled) {
            ++summary.cancelled;
        } else if (outcome.result != 0) {
            ++summary.failed;
        } else {
            ++summary.imported;
            summary.bytes += files[index].size;
        }
    }
    return summary;
}

std::string filesText(std::size_t count) {
    return std::to_string(count) + (count == 1 ? " file" : " files");
}

std::string summaryText(const Summary& summary, std::chrono::milliseconds elapsed) {
    std::string text = "Imported " + filesText(summary.imported) + ", " + humanSize(summary.bytes) +
                       ", in " + humanTime(elapsed);
    if (summary.failed > 0)
        text += "; " + filesText(summary.failed) + " failed";
    if (summary.cancelled > 0)
        text += "; " + filesText(summary.cancelled) + " cancelled";
    return text + '\n';
}

void tellFailures(const std::vector<ImportFile>& files, const ImportOutcomes& outcomes) {
    for (std::size_t index = 0; index < files.size(); ++index) {
        const auto& outcome = outcomes.of(index);
        if (!outcome.known || outcome.result == 0 || outcome.result == kCancelled)
            continue;
        const bool namesIt = outcome.text.find(files[index].real) != std::string::npos ||
                             outcome.text.find(files[index].path) != std::string::npos;
        std::fprintf(stderr, "qnsmedia: %s%s%s\n", namesIt ? "" : files[index].path.c_str(),
                     namesIt ? "" : ": ", outcome.text.c_str());
    }
}

nlohmann::ordered_json summaryJson(const std::vector<ImportFile>& files,
                                   const ImportOutcomes& outcomes) {
    nlohmann::ordered_json imported = nlohmann::ordered_json::array();
    nlohmann::ordered_json failed = nlohmann::ordered_json::array();
    for (std::size_t index = 0; index < files.size(); ++index) {
        const auto& [known, result, text] = outcomes.of(index);
        const std::string& file = files[index].path;
        if (known && result == 0)
            imported.push_back({{"file", file}, {"path", text}});
        else
            failed.push_back({{"file", file},
                              {"result", known ? result : kCancelled},
                              {"message", known ? text : "not begun"}});
    }
    return {{"imported", std::move(imported)}, {"failed", std::move(failed)}};
}

} // namespace

int importCommand(const qnsmedia::Connection::Options& options, const ImportRequest& request) {
    qnsmedia::Connection connection(options);
    const ImportFiles found =
        findImportFiles(request.paths, extensionsFor(connection, request.paths));
    for (const std::string& folder : found.unreadable)
        std::fprintf(stderr, "qnsmedia: %s\n", folder.c_str());
    ImportRun run(connection, found.files, request.folder,
                  !request.json && ::isatty(STDOUT_FILENO) != 0);
    const int signal = run.run();
    tellFailures(found.files, run.outcomes());
    const Summary summary = summarize(found.files, run.outcomes());
    show(request.json ? summaryJson(found.files, run.outcomes())
                                .dump(2, ' ', false, nlohmann::json::error_handler_t::replace) +
                            '\n'
                      : summaryText(summary, run.elapsed()));
    if (signal != 0)
        return exitCodeOfSignal(signal);
    return summary.failed + summary.cancelled + found.unreadable.size() == 0 ? kDone : kFailed;
}
