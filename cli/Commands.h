// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "cli/MediaTime.h"
#include "qnsmedia/Connection.h"

/** A picture of a file, to be written to another. */
struct ImageRequest {
    std::string file;
    std::string output;
    MediaTime at;
    int width = 0;  ///< 0: from the height, or as it is
    int height = 0; ///< the same
};

/** Files and folders to import. */
struct ImportRequest {
    std::vector<std::string> paths;
    std::string folder; ///< inside the library; empty: they stay where they are
    bool json = false;
};

/** The subcommands. Each returns an ExitCode and throws qnsmedia::Error. */
int playCommand(const qnsmedia::Connection::Options& options, const std::string& file);
int statusCommand(const qnsmedia::Connection::Options& options, bool json);
int infoCommand(const qnsmedia::Connection::Options& options, const std::vector<std::string>& files,
                bool json);
int imageCommand(const qnsmedia::Connection::Options& options, const ImageRequest& request);
int extensionsCommand(const qnsmedia::Connection::Options& options, bool json);
int monitorCommand(const qnsmedia::Connection::Options& options, bool json);
int powerOffCommand(const qnsmedia::Connection::Options& options, bool ask);
int importCommand(const qnsmedia::Connection::Options& options, const ImportRequest& request);

/** Those that read the library's database also throw SQLite::Exception. */
int libraryListCommand(const std::string& database, bool json);
int librarySearchCommand(const std::string& database, const std::vector<std::string>& words,
                         bool json);
int libraryShowCommand(const std::string& database, const std::string& key, bool json);
int libraryExportCommand(const std::string& database);
