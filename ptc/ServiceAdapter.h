// SPDX-License-Identifier: MIT
#pragma once

#include "pack/ArgumentReader.h"
#include "ptc/Adapter.h"
#include "ptc/ClientNotify.h"
#include "ptc/Event.h"
#include "ptc/IProxy.h"
#include "ptc/IProxyHolder.h"
#include "ptc/Registration.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <memory>
#include <type_traits>
#include <utility>

namespace PTC {

template<typename Operation>
struct OperationParameter;

template<typename Service, typename Parameter>
struct OperationParameter<void (Service::*)(Parameter)> {
    using Type = std::decay_t<Parameter>;
};

/**
 * What the request adapters of all services share. A service's adapter adds its table of
 * methods, and how its records are decoded:
 *
 *     void ExampleAdapter::receive(PTC::Event* event) {
 *         static constexpr Method kMethods[] = {
 *             {ExampleMethod::play, call<&IExample::play>},
 *             {ExampleMethod::open, call<&IExample::open, decodeFileName>},
 *             {ExampleMethod::registerCallBack, registerCallBack<&IExample::registerCallBack, 63>},
 *         };
 *         dispatch(kMethods, *event);
 *     }
 *
 * Owns its target. Called by one thread at a time: the one that dispatches events. `Objects` are
 * the interfaces of the objects that clients register with the service.
 */
template<typename Service, typename... Objects>
class ServiceAdapter : public Adapter, public IProxyHolder {
public:
    using Adapter::Adapter;

    /** Takes over `target`, which must have been converted from a `Service*`. */
    void setTarget(void* target) override { mpTarget.reset(static_cast<Service*>(target)); }

    /** Always false for the objects of a service that is no ClientNotify: nobody knows its users.
     */
    [[nodiscard]] bool letGo([[maybe_unused]] IProxyBase& proxy) override {
        return (letGoOf(dynamic_cast<Objects*>(&proxy)) && ...);
    }

protected:
    using Handler = void (*)(ServiceAdapter& adapter, Event& event);

    /** One row of an adapter's table. Ids are numbers or values of an enum. */
    struct Method {
        template<typename Id>
        constexpr Method(Id methodId, Handler handler)
            : id(static_cast<long>(methodId)), handle(handler) {}

        long id;
        Handler handle;
    };

    /** Null before setTarget(). No handler runs without a target. */
    [[nodiscard]] Service* target() const { return mpTarget.get(); }

    /** Runs the event's handler. An id that is not in the table is ignored. */
    template<std::size_t count>
    void dispatch(const Method (&methods)[count], Event& event) {
        const auto method =
            std::find_if(std::begin(methods), std::end(methods),
                         [&event](const Method& row) { return row.id == event.methodId; });
        if (mpTarget && method != std::end(methods))
            method->handle(*this, event);
    }

    /** Handler of an operation whose argument is one number. */
    template<auto operation>
    static void call(ServiceAdapter& adapter, Event& event) {
        call<operation, readOne<ParameterOf<operation>>>(adapter, event);
    }

    /**
     * Handler of an operation whose argument is one record: `deserialize(record, reader)` reads
     * its fields. What the block lacks stays as a new record has it.
     */
    template<auto operation, auto deserialize>
    static void call(ServiceAdapter& adapter, Event& event) {
        ParameterOf<operation> parameter{};
        ArgumentReader reader(event.data, event.size);
        deserialize(parameter, reader);
        (adapter.target()->*operation)(std::move(parameter));
    }

    /**
     * Handler of the operation that takes a client's callback object: a proxy made for
     * `interfaceId`, or null when the client cannot be reached.
     */
    template<auto operation, long interfaceId>
    static void registerCallBack(ServiceAdapter& adapter, Event& event) {
        const auto client = takeCallBackRegistration(event);
        auto* const proxy = adapter.createProxy(interfaceId, client.objectId, client.identity);
        (adapter.target()->*operation)(dynamic_cast<ParameterOf<operation>>(proxy));
    }

    /** The same for a notify object; the operation takes a record {pNotify, client id}. */
    template<auto operation, long interfaceId, RecordObjectId width = RecordObjectId::bits64>
    static void registerNotify(ServiceAdapter& adapter, Event& event) {
        using Record = ParameterOf<operation>;
        const auto client = takeNotifyRegistration(event, width);
        auto* const proxy = adapter.createProxy(interfaceId, client.objectId, client.identity);
        (adapter.target()->*operation)(
            Record{dynamic_cast<decltype(Record::pNotify)>(proxy), client.clientId});
    }

private:
    template<auto operation>
    using ParameterOf = typename OperationParameter<decltype(operation)>::Type;

    template<typename Object>
    bool letGoOf(Object* object) const {
        if (object == nullptr)
            return true;
        auto* const registry = dynamic_cast<ClientNotify*>(target());
        if (registry == nullptr)
            return false;
        registry->forget(object);
        return !registry->isInUse();
    }

    template<typename Number>
    static void readOne(Number& number, ArgumentReader& reader) {
        reader.read(number);
    }

    std::unique_ptr<Service> mpTarget;
};

} // namespace PTC
