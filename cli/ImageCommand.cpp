// SPDX-License-Identifier: MIT
#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/MediaPath.h"
#include "qnsmedia/Discoverer.h"

int imageCommand(const qnsmedia::Connection::Options& options, const ImageRequest& request) {
    qnsmedia::Connection connection(options);
    qnsmedia::Discoverer discoverer(connection);
    discoverer.open(mediaPath(request.file)).get();
    const qnsmedia::Nanoseconds duration = discoverer.metadata().get().duration;
    discoverer
        .makeImage(request.at.in(duration), request.width, request.height,
                   mediaPath(request.output))
        .get();
    return kDone;
}
