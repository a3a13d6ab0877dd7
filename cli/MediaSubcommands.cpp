// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <vector>

#include "cli/Commands.h"
#include "cli/Subcommands.h"

namespace {

/** "640x360"; one of the two may be 0. */
void readSize(const std::string& text, ImageRequest& request) {
    int end = 0;
    const int fields =
        std::sscanf(text.c_str(), "%5dx%5d%n", &request.width, &request.height, &end);
    if (fields != 2 || static_cast<std::size_t>(end) != text.size() || request.width < 0 ||
        request.height < 0)
        throw CLI::ValidationError("--size", "not a size such as 640x360: " + text);
}

void readTime(const std::string& text, ImageRequest& request) {
    const auto time = parseMediaTime(text);
    if (!time)
        throw CLI::ValidationError("--at", "not a time such as 1:23.5 or 50%: " + text);
    request.at = *time;
}

} // namespace

void addPlay(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const play = app.add_subcommand("play", "Play a file or a URI to its end");
    const auto file = std::make_shared<std::string>();
    play->add_option("FILE", *file, "Path or URI")->required();
    play->footer("Keys in a terminal: space pauses and resumes, left and right seek 5 seconds,\n"
                 "down and up 30, a marks the start of a loop and b its end, and either of them\n"
                 "ends it again, q quits.\n\nExample: qnsmedia play film.mp4");
    play->callback([=, &options, &command] {
        command = [=, &options] { return playCommand(options, *file); };
    });
}

void addStatus(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const status = app.add_subcommand("status", "Tell the player's state and position");
    const auto json = std::make_shared<bool>(false);
    status->add_flag("--json", *json, "As a JSON object; times in nanoseconds");
    status->footer("Example: qnsmedia status --json");
    status->callback([=, &options, &command] {
        command = [=, &options] { return statusCommand(options, *json); };
    });
}

void addInfo(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const info = app.add_subcommand("info", "Tell what files are: streams and tags");
    const auto files = std::make_shared<std::vector<std::string>>();
    const auto json = std::make_shared<bool>(false);
    info->add_option("FILE", *files, "Paths")->required();
    info->add_flag("--json", *json, "As an array of JSON objects; times in nanoseconds");
    info->footer("Example: qnsmedia info *.mp3");
    info->callback([=, &options, &command] {
        command = [=, &options] { return infoCommand(options, *files, *json); };
    });
}

void addImage(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const image = app.add_subcommand("image", "Write a picture of a file");
    const auto request = std::make_shared<ImageRequest>();
    image->add_option("FILE", request->file, "Path")->required();
    image->add_option("-o,--output", request->output, "File to write: .png, .jpg, or raw pixels")
        ->required();
    image->add_option_function<std::string>(
        "--at", [=](const std::string& text) { readTime(text, *request); },
        "Moment, such as 1:23.5 or 50%; without it the beginning");
    image->add_option_function<std::string>(
        "--size", [=](const std::string& text) { readSize(text, *request); },
        "Width and height, one of which may be 0; without it the natural size");
    image->footer("Example: qnsmedia image film.mp4 -o film.jpg --at 50% --size 320x0");
    image->callback([=, &options, &command] {
        command = [=, &options] { return imageCommand(options, *request); };
    });
}

void addExtensions(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const extensions =
        app.add_subcommand("extensions", "Tell which files the daemon can open");
    const auto json = std::make_shared<bool>(false);
    extensions->add_flag("--json", *json, "As a JSON array");
    extensions->footer("Example: qnsmedia extensions");
    extensions->callback([=, &options, &command] {
        command = [=, &options] { return extensionsCommand(options, *json); };
    });
}
