// SPDX-License-Identifier: MIT
#include "client/src/ImporterClient.h"

#include <chrono>
#include <utility>

#include "client/src/ImporterRecords.h"
#include "client/src/Requests.h"
#include "define/ImporterMethods.h"
#include "define/ObjectIds.h"
#include "pack/CPack_Simplebuffer.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr long number(ImporterMethod method) {
    return static_cast<long>(method);
}

constexpr Service kImporter{kImporterAdapterId,
                            number(ImporterMethod::registerCallBack),
                            number(ImporterMethod::unregisterCallBack),
                            static_cast<long>(ImporterCallBack::setImporterClientID),
                            number(ImporterMethod::registerNotify),
                            number(ImporterMethod::unregisterNotify)};

constexpr Operation kImport{ImporterMethod::import, ImporterCallBack::import, "import"};
/** Not shared, since an answer to an earlier question says nothing of the import. */
constexpr Operation kTurn{ImporterMethod::getImporterStatus, ImporterCallBack::getImporterStatus,
                          "import", Answers::mayBeLost};

/** Its two requests have deadlines of their own, which come before this. */
constexpr Operation kWhole{ImporterMethod::import, ImporterCallBack::import, "import",
                           Answers::shared, std::chrono::hours(25)};

bool hasZeroByte(const std::string& text) {
    return text.find('\0') != std::string::npos;
}

} // namespace

ImporterClient::ImporterClient(std::shared_ptr<Link> link)
    : mService(std::move(link), kImporter,
               [this](long, long method, const ArgumentReader& arguments) {
                   notified(method, arguments);
               }) {}

void ImporterClient::importFile(const std::string& path, const std::string& folder,
                                Completion completion) {
    if (hasZeroByte(path) || hasZeroByte(folder))
        return mService.fail(std::move(completion),
                             std::make_exception_ptr(Error("import: a path has no zero byte")));
    PackedArguments arguments = mService.ownId();
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), path);
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), folder);
    const long ticket = mService.await(kWhole, std::move(completion));
    const auto accepted = [this, ticket](std::exception_ptr error, ArgumentReader* answer) {
        try {
            if (error)
                std::rethrow_exception(error);
            readAccepted(kImport.name, *answer);
            awaitTurn(ticket);
        } catch (...) {
            mService.fail(ticket, std::current_exception());
        }
    };
    mService.send(kImport, arguments, {accepted});
}

/** The daemon works off imports and questions in order: an answer means that it was our turn. */
void ImporterClient::awaitTurn(long ticket) {
    PackedArguments arguments = mService.ownId();
    const auto told = [this, ticket](std::exception_ptr error, ArgumentReader* answer) {
        if (error)
            mService.fail(ticket, error);
        else
            mService.finish(ticket, *answer);
    };
    mService.send(kTurn, arguments, {told});
}

void ImporterClient::notified(long method, ArgumentReader arguments) {
    const auto notification = readImportNotification(arguments);
    if (method == static_cast<long>(ImporterNotify::mediaImporterNotify) && notification)
        mHandler.tell(mService.link(), *notification);
}

} // namespace qnsmedia
