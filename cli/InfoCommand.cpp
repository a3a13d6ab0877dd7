// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cstdio>
#include <deque>
#include <exception>
#include <future>
#include <optional>
#include <vector>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/InfoText.h"
#include "cli/MediaPath.h"
#include "cli/Output.h"
#include "qnsmedia/Discoverer.h"
#include "qnsmedia/Error.h"

using qnsmedia::Discoverer;
using qnsmedia::Metadata;

namespace {

/** The daemon has room for ten discoverers, and other clients want some too. */
constexpr std::size_t kAtOnce = 4;

/** One discoverer and the file that it is at. */
class Reader {
public:
    explicit Reader(qnsmedia::Connection& connection) : mDiscoverer(connection) {}

    /** Asks for everything at once; the daemon works it off in order. */
    void begin(const std::string& file) {
        mOpened = mDiscoverer.open(mediaPath(file));
        mMetadata = mDiscoverer.metadata();
    }

    /** Throws what went wrong; afterwards the next file can begin. */
    Metadata finish() {
        try {
            mOpened.get();
        } catch (const qnsmedia::MediaError&) {
            mMetadata.wait();
            throw;
        }
        Metadata metadata = mMetadata.get();
        mDiscoverer.close().get();
        return metadata;
    }

private:
    Discoverer mDiscoverer;
    std::future<void> mOpened;
    std::future<Metadata> mMetadata;
};

/** Tells of each file when its turn comes. */
class Teller {
public:
    explicit Teller(bool json) : mJson(json) {}

    void tell(const std::string& file, Reader& reader) {
        try {
            tell(file, reader.finish());
        } catch (const qnsmedia::MediaError& error) {
            mFailed = true;
            std::fprintf(stderr, "qnsmedia: %s: %s\n", file.c_str(), error.what());
        }
    }

    int finish() {
        if (mJson)
            show(mObjects.dump(2, ' ', false, nlohmann::json::error_handler_t::replace) + '\n');
        return mFailed ? kFailed : kDone;
    }

private:
    void tell(const std::string& file, const Metadata& metadata) {
        if (!mJson)
            return show(file + '\n' + infoText(metadata));
        nlohmann::ordered_json object = {{"file", file}};
        object.update(infoJson(metadata));
        mObjects.push_back(std::move(object));
    }

    const bool mJson;
    bool mFailed = false;
    nlohmann::ordered_json mObjects = nlohmann::ordered_json::array();
};

} // namespace

int infoCommand(const qnsmedia::Connection::Options& options, const std::vector<std::string>& files,
                bool json) {
    qnsmedia::Connection connection(options);
    std::deque<Reader> readers;
    for (std::size_t index = 0; index < std::min(files.size(), kAtOnce); ++index)
        readers.emplace_back(connection).begin(files[index]);
    Teller teller(json);
    for (std::size_t index = 0; index < files.size(); ++index) {
        Reader& reader = readers[index % readers.size()];
        teller.tell(files[index], reader);
        if (const std::size_t next = index + readers.size(); next < files.size())
            reader.begin(files[next]);
    }
    return teller.finish();
}
