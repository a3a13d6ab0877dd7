// SPDX-License-Identifier: MIT
#include "qnsmedia/Discoverer.h"

#include <optional>
#include <utility>

#include "client/src/DiscovererClient.h"
#include "client/src/DiscovererRecords.h"
#include "client/src/Requests.h"

namespace qnsmedia {
namespace {

void requireSuccess(const std::string& name, int result) {
    if (result != 0)
        throw MediaError(result, name + ": " + resultText(result));
}

void readOpened(const std::string& name, ArgumentReader& answer) {
    const std::optional<int> result = readInteger(answer);
    if (!result)
        throw unreadable(name);
    requireSuccess(name, *result);
}

Metadata readMetadataAnswer(const std::string& name, ArgumentReader& arguments) {
    std::optional<MetadataAnswer> answer = readMetadata(arguments);
    if (!answer)
        throw unreadable(name);
    requireSuccess(name, answer->outcome.result);
    return std::move(answer->metadata);
}

void readImageAnswer(const std::string& name, ArgumentReader& arguments) {
    const std::optional<Outcome> outcome = readImageOutcome(arguments);
    if (!outcome)
        throw unreadable(name);
    requireSuccess(name, outcome->result);
}

std::vector<std::string> readExtensionsAnswer(const std::string& name, ArgumentReader& arguments) {
    std::optional<std::vector<std::string>> extensions = readExtensions(arguments);
    if (!extensions)
        throw unreadable(name);
    return *std::move(extensions);
}

} // namespace

Discoverer::Discoverer(Connection& connection)
    : mpClient(std::make_unique<DiscovererClient>(connection.mpLink)) {}

Discoverer::~Discoverer() = default;

int Discoverer::clientId() const {
    return mpClient->service().clientId();
}

std::future<void> Discoverer::open(const std::string& path) {
    auto [future, completion] = futureFor<void>("open", readOpened);
    mpClient->open(path, std::move(completion));
    return std::move(future);
}

void Discoverer::open(const std::string& path, Callback callback) {
    mpClient->open(
        path, completionFor(mpClient->service().link(), std::move(callback), "open", readOpened));
}

std::future<void> Discoverer::close() {
    auto [future, completion] = futureFor<void>("close", readNothing);
    mpClient->close(completion);
    return std::move(future);
}

void Discoverer::close(Callback callback) {
    mpClient->close(
        completionFor(mpClient->service().link(), std::move(callback), "close", readNothing));
}

std::future<Metadata> Discoverer::metadata() {
    auto [future, completion] = futureFor<Metadata>("metadata", readMetadataAnswer);
    mpClient->metadata(std::move(completion));
    return std::move(future);
}

void Discoverer::metadata(MetadataCallback callback) {
    mpClient->metadata(completionFor(mpClient->service().link(), std::move(callback), "metadata",
                                     readMetadataAnswer));
}

std::future<void> Discoverer::makeImage(Nanoseconds position, int width, int height,
                                        const std::string& path) {
    auto [future, completion] = futureFor<void>("image", readImageAnswer);
    mpClient->makeImage(position.count(), width, height, path, std::move(completion));
    return std::move(future);
}

void Discoverer::makeImage(Nanoseconds position, int width, int height, const std::string& path,
                           Callback callback) {
    mpClient->makeImage(
        position.count(), width, height, path,
        completionFor(mpClient->service().link(), std::move(callback), "image", readImageAnswer));
}

std::future<std::vector<std::string>> Discoverer::extensions() {
    auto [future, completion] =
        futureFor<std::vector<std::string>>("extensions", readExtensionsAnswer);
    mpClient->extensions(std::move(completion));
    return std::move(future);
}

void Discoverer::extensions(ExtensionsCallback callback) {
    mpClient->extensions(completionFor(mpClient->service().link(), std::move(callback),
                                       "extensions", readExtensionsAnswer));
}

} // namespace qnsmedia
