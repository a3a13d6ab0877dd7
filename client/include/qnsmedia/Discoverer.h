// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <functional>
#include <future>
#include <memory>
#include <string>
#include <vector>

#include "qnsmedia/Connection.h"
#include "qnsmedia/DiscovererTypes.h"

namespace qnsmedia {

class DiscovererClient;

/**
 * Reads what a file is, and draws pictures of it. A discoverer has one file open at a time;
 * several discoverers, also of one connection, work side by side. The daemon has room for ten of
 * all clients together; a further one registers, and each of its requests fails.
 *
 * Each request comes twice: it returns a future, or it takes a callback, which is called once,
 * with null when all went well. Otherwise the future or the callback carries MediaError,
 * TimedOut, ConnectionLost or Error. Any thread may call; see Connection for the thread that
 * calls back.
 */
class QNSMEDIA_API Discoverer {
public:
    using Callback = std::function<void(std::exception_ptr error)>;
    using MetadataCallback = std::function<void(std::exception_ptr error, Metadata metadata)>;
    using ExtensionsCallback =
        std::function<void(std::exception_ptr error, std::vector<std::string> extensions)>;

    /** Registers with the daemon and waits until it has given an id. Throws as the futures do. */
    explicit Discoverer(Connection& connection);

    /** Leaves the daemon. What still waits for an answer is told ConnectionLost. */
    ~Discoverer();

    Discoverer(const Discoverer&) = delete;
    Discoverer& operator=(const Discoverer&) = delete;

    /** The id that the daemon gave this client: 1 or above. */
    [[nodiscard]] int clientId() const;

    /**
     * Opens a file; the daemon reads a relative path from its own folder. MediaError 5 also when
     * a file is open already, or when there is no room for this discoverer.
     */
    std::future<void> open(const std::string& path);
    void open(const std::string& path, Callback callback);

    /** Ready when the next file can be opened. */
    std::future<void> close();
    void close(Callback callback);

    /** Of the open file. */
    std::future<Metadata> metadata();
    void metadata(MetadataCallback callback);

    /**
     * Has the daemon write the picture that is shown at `position` to `path`: PNG or JPEG by the
     * name's ending, otherwise 32-bit pixels 0xAARRGGBB without a header. The size is exact, with
     * black borders; one of width and height 0 follows from the other, both 0 is the natural
     * size. When there is no such picture, MediaError, and the file is black pixels.
     */
    std::future<void> makeImage(Nanoseconds position, int width, int height,
                                const std::string& path);
    void makeImage(Nanoseconds position, int width, int height, const std::string& path,
                   Callback callback);

    /** Of the files that the daemon can open, without a dot, in lower case, sorted. */
    std::future<std::vector<std::string>> extensions();
    void extensions(ExtensionsCallback callback);

private:
    std::unique_ptr<DiscovererClient> mpClient;
};

} // namespace qnsmedia
