// SPDX-License-Identifier: MIT
#include "qnsmedia/Importer.h"

#include <optional>
#include <utility>

#include "client/src/ImporterClient.h"
#include "client/src/ImporterRecords.h"
#include "client/src/Requests.h"
#include "define/ImporterMethods.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr Operation kInitialize{ImporterMethod::initializeImporter,
                                ImporterCallBack::initializeImporter, "initialize"};
constexpr Operation kCancel{ImporterMethod::cancel, ImporterCallBack::cancel, "cancel"};
constexpr Operation kStatus{ImporterMethod::getImporterStatus, ImporterCallBack::getImporterStatus,
                            "status", Answers::shared};

ImporterStatus readStatusAnswer(const std::string& name, ArgumentReader& answer) {
    const std::optional<ImporterStatus> status = readImporterStatus(answer);
    if (!status)
        throw unreadable(name);
    return *status;
}

} // namespace

Importer::Importer(Connection& connection)
    : mpClient(std::make_unique<ImporterClient>(connection.mpLink)) {}

Importer::~Importer() = default;

int Importer::clientId() const {
    return mpClient->service().clientId();
}

void Importer::onNotification(NotificationHandler handler) {
    mpClient->onNotification(std::move(handler));
}

std::future<void> Importer::initialize() {
    return ask(mpClient->service(), kInitialize);
}

void Importer::initialize(Callback callback) {
    ask(mpClient->service(), kInitialize, std::move(callback));
}

std::future<void> Importer::importFile(const std::string& path, const std::string& folder) {
    auto [future, completion] = futureFor<void>("import", readNothing);
    mpClient->importFile(path, folder, std::move(completion));
    return std::move(future);
}

void Importer::importFile(const std::string& path, const std::string& folder, Callback callback) {
    mpClient->importFile(
        path, folder,
        completionFor(mpClient->service().link(), std::move(callback), "import", readNothing));
}

std::future<void> Importer::cancel() {
    return ask(mpClient->service(), kCancel);
}

void Importer::cancel(Callback callback) {
    ask(mpClient->service(), kCancel, std::move(callback));
}

std::future<ImporterStatus> Importer::status() {
    return ask(mpClient->service(), kStatus, mpClient->service().ownId(), readStatusAnswer);
}

void Importer::status(StatusCallback callback) {
    ask(mpClient->service(), kStatus, mpClient->service().ownId(), readStatusAnswer,
        std::move(callback));
}

} // namespace qnsmedia
