// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <functional>
#include <future>
#include <memory>
#include <optional>
#include <string>
#include <tuple>
#include <type_traits>
#include <utility>

#include "client/src/ServiceClient.h"
#include "qnsmedia/Error.h"

/**
 * How a public class asks and is answered: with a future or with a callback. An answer is read
 * by a function that returns its value or throws, and knows the request's name for the text.
 */
namespace qnsmedia {

template<typename Value>
using Read = Value (*)(const std::string& name, ArgumentReader& answer);

/** Nothing when the arguments have ended. */
std::optional<int> readInteger(ArgumentReader& arguments);

/** What to throw when an answer has ended early. */
Error unreadable(const std::string& name);

/** An answer that is a result: 0 for accepted. */
void readAccepted(const std::string& name, ArgumentReader& answer);

/** An answer that tells by coming. */
void readNothing(const std::string& name, ArgumentReader& answer);

/** A future, and the completion that keeps its promise. */
template<typename Value>
std::pair<std::future<Value>, Completion> futureFor(const char* name, Read<Value> read) {
    auto promise = std::make_shared<std::promise<Value>>();
    auto future = promise->get_future();
    const auto tell = [=](std::exception_ptr error, ArgumentReader* answer) {
        try {
            if (error)
                std::rethrow_exception(error);
            if constexpr (std::is_void_v<Value>) {
                read(name, *answer);
                promise->set_value();
            } else {
                promise->set_value(read(name, *answer));
            }
        } catch (...) {
            promise->set_exception(std::current_exception());
        }
    };
    return {std::move(future), Completion{tell, false}};
}

/** The completion that calls a callback: with the error alone, or with a value too. */
template<typename... Values, typename Value>
Completion completionFor(Link& link, std::function<void(std::exception_ptr, Values...)> callback,
                         const char* name, Read<Value> read) {
    const auto tell = [=, &link](std::exception_ptr error, ArgumentReader* answer) {
        std::tuple<Values...> values;
        try {
            if (error)
                std::rethrow_exception(error);
            if constexpr (std::is_void_v<Value>)
                read(name, *answer);
            else
                values = read(name, *answer);
        } catch (...) {
            error = std::current_exception();
        }
        if (callback)
            link.callUser([&] { std::apply(callback, std::tuple_cat(std::tie(error), values)); });
    };
    return {tell, true};
}

/** Sends a request; the future gets what is read from its answer. */
template<typename Value>
std::future<Value> ask(const ServiceClient& client, const Operation& operation,
                       PackedArguments arguments, Read<Value> read) {
    auto [future, completion] = futureFor<Value>(operation.name, read);
    client.send(operation, arguments, std::move(completion));
    return std::move(future);
}

/** The same with a callback. */
template<typename... Values, typename Value>
void ask(const ServiceClient& client, const Operation& operation, PackedArguments arguments,
         Read<Value> read, std::function<void(std::exception_ptr, Values...)> callback) {
    client.send(operation, arguments,
                completionFor(client.link(), std::move(callback), operation.name, read));
}

using AcceptedCallback = std::function<void(std::exception_ptr error)>;

/** Requests whose answer is "accepted" or "refused"; without arguments the client's id is all. */
std::future<void> ask(const ServiceClient& client, const Operation& operation);
void ask(const ServiceClient& client, const Operation& operation, AcceptedCallback callback);
std::future<void> ask(const ServiceClient& client, const Operation& operation,
                      PackedArguments arguments);
void ask(const ServiceClient& client, const Operation& operation, PackedArguments arguments,
         AcceptedCallback callback);

} // namespace qnsmedia
