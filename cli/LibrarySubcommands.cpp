// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <vector>

#include "cli/Commands.h"
#include "cli/LibraryReader.h"
#include "cli/Subcommands.h"

namespace {

/** What every command of the library needs. */
struct LibraryArguments {
    std::string database = libraryFile();
    std::string key;
    std::vector<std::string> words;
    bool json = false;
};

using Run = int (*)(const LibraryArguments& arguments);

CLI::App* addLibraryCommand(CLI::App& library, const char* name, const char* description,
                            const std::shared_ptr<LibraryArguments>& arguments, Command& command,
                            Run run) {
    CLI::App* const added = library.add_subcommand(name, description);
    added->add_flag("--json", arguments->json,
                    "As JSON; times in nanoseconds, dates in seconds since 1970");
    added->callback([=, &command] { command = [=] { return run(*arguments); }; });
    return added;
}

} // namespace

void addImport(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const import = app.add_subcommand("import", "Take files into the media library");
    const auto request = std::make_shared<ImportRequest>();
    import->add_option("PATH", request->paths, "Files, and folders with all that is below")
        ->required();
    import->add_option("--to", request->folder,
                       "Copy into this folder inside the library, instead of leaving the files "
                       "where they are");
    import->add_flag("--json", request->json, "What has become of each file, as a JSON object");
    import->footer("Ctrl-C cancels what is not done yet: the whole of the daemon's queue.\n\n"
                   "Example: qnsmedia import ~/Music holiday.mp4 --to 2024/holiday");
    import->callback([=, &options, &command] {
        command = [=, &options] { return importCommand(options, *request);
};
});
}

void addLibrary(CLI::App& app, Command& command) {
    CLI::App* const library = app.add_subcommand("library", "Read the media library");
    const auto arguments = std::make_shared<LibraryArguments>();
    library->require_subcommand(1);
    library->add_option("--database", arguments->database, "The library's database")
        ->capture_default_str();
    const auto add = [&](const char* name, const char* description, Run run) {
        return addLibraryCommand(*library, name, description, arguments, command, run);
    };
    add("list", "All media, by artist, album and title", [](const LibraryArguments& given) {
        return libraryListCommand(given.database, given.json);
    });
    add("search", "Media with all these words in title, artist, album or path",
        [](const LibraryArguments& given) {
            return librarySearchCommand(given.database, given.words, given.json);
        })
        ->add_option("WORDS", arguments->words, "Words or their beginnings")
        ->required();
    add("show", "All that is known of a medium",
        [](const LibraryArguments& given) {
            return libraryShowCommand(given.database, given.key, given.json);
        })
        ->add_option("ID", arguments->key, "Its number, or a path")
        ->required();
    add("export", "The whole library as JSON",
        [](const LibraryArguments& given) { return libraryExportCommand(given.database); });
    library->footer("Examples: qnsmedia library search miles blue\n"
                    "          qnsmedia library export >library.json");
}
