// SPDX-License-Identifier: MIT
// A client process that asks for something and then hangs, to be killed in the middle of it.
// usage: daemon_test_client IDENTITY play FILE - | image FILE PICTURE | import FILE FOLDER
#include <cstdio>
#include <cstdlib>
#include <string>
#include <unistd.h>

#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/ImporterClient.h"
#include "tests/daemon/support/ItemReader.h"
#include "tests/daemon/support/Life.h"
#include "tests/daemon/support/PlayerClient.h"

namespace {

constexpr std::int64_t kOpened = 1;

void play(Life& client, const std::string& file) {
    const auto id = client.registerCallBack(kPlayerService);
    client.registerNotify(kPlayerService, id);
    client.request(kPlayerService, request::kOpenPlayer, wire::integer(id) + wire::text(file));
    client.expectResult(kPlayerService, callback::kOpenPlayer, 0);
    while (ItemReader(client.receive()->payload).integer() != kOpened) {
    }
    client.request(kPlayerService, request::kSetRepeat,
                   wire::integer(id) + wire::boolean(true) + wire::integer(0) + wire::integer(-1));
    client.request(kPlayerService, request::kPlay, wire::integer(id));
    // What the daemon has not read when a client is killed may be lost.
    while (client.receive()->method != callback::kPlay) {
    }
}

void drawImage(Life& client, const std::string& file, const std::string& picture) {
    const auto id = client.registerCallBack(kDiscovererService);
    client.request(kDiscovererService, discoverer::kInitialize, wire::integer(id));
    client.expectResult(kDiscovererService, discoverer::kInitializeCallBack, 0);
    client.request(kDiscovererService, discoverer::kOpen, wire::integer(id) + wire::text(file));
    client.expectResult(kDiscovererService, discoverer::kOpenCallBack, 0);
    client.request(kDiscovererService, discoverer::kGetImage,
                   wire::integer(id) + wire::integer(320) + wire::integer(0) + wire::integer(0) +
                       wire::text(picture) + wire::text(""));
}

void import(Life& client, const std::string& file, const std::string& folder) {
    const auto id = client.registerCallBack(kImporterService);
    client.registerNotify(kImporterService, id);
    client.request(kImporterService, importer::kImport,
                   wire::integer(id) + wire::text(file) + wire::text(folder));
    client.expectResult(kImporterService, importer::kImportCallBack, 0);
}

} // namespace

int main(int count, char** arguments) {
    if (count != 5)
        return EXIT_FAILURE;
    const std::string task = arguments[2];
    const std::string file = arguments[3];
    Life client(std::atol(arguments[1]));
    if (task == "play")
        play(client, file);
    else if (task == "image")
        drawImage(client, file, arguments[4]);
    else
        import(client, file, arguments[4]);
    std::puts("asked");
    std::fflush(stdout);
    for (;;)
        ::pause();
}
