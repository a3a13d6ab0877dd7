// SPDX-License-Identifier: MIT
#include "client/src/ServiceClient.h"

#include <string>
#include <utility>

#include "client/src/Requests.h"
#include "qnsmedia/Error.h"

namespace qnsmedia {
namespace {

/** Among the answers' methods: nothing that a notify object gets answers a request. */
constexpr long kTold = -1;

int readClientId(const std::string& name, ArgumentReader& answer) {
    const std::optional<int> id = readInteger(answer);
    if (!id || *id <= 0)
        throw unreadable(name);
    return *id;
}

} // namespace

ServiceClient::ServiceClient(std::shared_ptr<Link> link, const Service& service,
                             Dispatcher::EventHandler notified)
    : mpLink(std::move(link)),
      mService(service),
      mCallBackObject(mpLink,
                      [this](long object, long method, const ArgumentReader& arguments) {
                          mpLink->answer(object, method, arguments);
                      }),
      mClientId(registerCallBack()) {
    if (mService.registerNotify == 0)
        return;
    mNotifyObject.emplace(mpLink, std::move(notified));
    registerNotify();
}

ServiceClient::~ServiceClient() {
    PackedArguments id = ownId();
    if (mNotifyObject)
        post(mService.unregisterNotify, id);
    post(mService.unregisterCallBack, id);
}

int ServiceClient::registerCallBack() const {
    const Operation registration(mService.registerCallBack, mService.clientIdCallBack, "register");
    PackedArguments arguments;
    arguments.int64(mCallBackObject.id()).int64(mpLink->identity());
    auto [id, completion] = futureFor<int>(registration.name, readClientId);
    send(registration, arguments, std::move(completion));
    try {
        return id.get();
    } catch (const TimedOut&) {
        throw TimedOut("the daemon gave no answer to the registration of identity " +
                       std::to_string(mpLink->identity()) +
                       "; unless it was started with --reconnect-clients it connects to each "
                       "identity only once in its life, and another process may have used this "
                       "one before");
    }
}

void ServiceClient::registerNotify() const {
    PackedArguments arguments;
    arguments.int64(mNotifyObject->id()).int64(mpLink->identity()).int32(mClientId);
    post(mService.registerNotify, arguments);
}

PackedArguments ServiceClient::ownId() const {
    PackedArguments arguments;
    arguments.int32(mClientId);
    return arguments;
}

Link::Request ServiceClient::requestFor(const Operation& operation) const {
    Link::Request request;
    request.service = mService.object;
    request.method = operation.method;
    request.replyObject = mCallBackObject.id();
    request.replyMethod = operation.answer;
    request.answers = operation.answers;
    request.extraTime = operation.extraTime;
    request.what = operation.name;
    return request;
}

void ServiceClient::send(const Operation& operation, PackedArguments& arguments,
                         Completion completion) const {
    mpLink->request(requestFor(operation), arguments, std::move(completion));
}

void ServiceClient::post(long method, PackedArguments& arguments) const {
    mpLink->post(mService.object, method, arguments);
}

long ServiceClient::await(const Operation& operation, Completion completion) const {
    Link::Request request = requestFor(operation);
    request.replyObject = mNotifyObject->id();
    request.replyMethod = kTold;
    // A notification that comes too late must not use up the next one's.
    request.answers = Answers::shared;
    return mpLink->await(request, std::move(completion));
}

void ServiceClient::finish(long ticket, const ArgumentReader& notification) const {
    mpLink->answerTicket(ticket, notification);
}

void ServiceClient::fail(long ticket, std::exception_ptr error) const {
    mpLink->failTicket(ticket, std::move(error));
}

void ServiceClient::fail(Completion completion, std::exception_ptr error) const {
    mpLink->fail(mCallBackObject.id(), std::move(completion), std::move(error));
}

} // namespace qnsmedia
