// SPDX-License-Identifier: MIT
#include "importer/Graph.h"

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <unistd.h>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "handle/SystemResult.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

constexpr char kFormat[] = R"(digraph importer {
  rankdir=LR; node [shape=box];
  queue [label="queue\n%zu waiting"];
  batch [label="batch\n%s\n%lld of %lld bytes"];
  queue -> batch -> probe -> copy -> sync -> "database\nmedia.db" -> notify;
  probe -> sync [label="catalogued where it lies"];
  "database\nmedia.db" -> thumbnails [dir=both, label="drawn while the machine is idle"];
}
)";

constexpr const char* kStateNames[] = {"idle", "running", "cancelling"};

} // namespace

int writeGraph(const std::string& path, const JobQueue& queue) {
    const qns::UniqueFd file(
        ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NONBLOCK, 0666));
    if (!file)
        return handle::resultOfErrno(errno);
    MediaImporterStatus bytes;
    const ImporterState state = queue.status(bytes);
    const int written =
        ::dprintf(file.get(), kFormat, queue.waitingCount(), kStateNames[state],
                  static_cast<long long>(bytes.done), static_cast<long long>(bytes.total));
    return written > 0 ? kOk : handle::resultOfErrno(errno);
}

} // namespace importer
