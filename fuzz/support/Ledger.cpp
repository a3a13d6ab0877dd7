// SPDX-License-Identifier: MIT
#include "fuzz/support/Ledger.h"

#include <algorithm>
#include <iterator>
#include <memory>

#include "define/DiscovererMethods.h"
#include "define/ImporterMethods.h"
#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "fuzz/support/Packets.h"
#include "fuzz/support/Require.h"
#include "ptc/Event.h"

using namespace MediaServiceDefine;

namespace fuzz {

namespace {

constexpr long kInterfaces[] = {kDiscovererCallBackId, kImporterCallBackId, kImporterNotifyId,
                                kPlayerCallBackId, kPlayerNotifyId};

/** A request, and the callback that answers it. Requests that have none are not here. */
struct Exchange {
    template<typename Method, typename CallBack>
    constexpr Exchange(long adapter, Method request, long callback, CallBack reply)
        : object(adapter),
          method(static_cast<long>(request)),
          interfaceId(callback),
          answer(static_cast<long>(reply)) {}

    long object;
    long method;
    long interfaceId;
    long answer;
};

template<typename Method, typename CallBack>
constexpr Exchange player(Method request, CallBack reply) {
    return {kPlayerAdapterId, request, kPlayerCallBackId, reply};
}

template<typename Method, typename CallBack>
constexpr Exchange discoverer(Method request, CallBack reply) {
    return {kDiscovererAdapterId, request, kDiscovererCallBackId, reply};
}

template<typename Method, typename CallBack>
constexpr Exchange importer(Method request, CallBack reply) {
    return {kImporterAdapterId, request, kImporterCallBackId, reply};
}

using DM = DiscovererMethod;
using DC = DiscovererCallBack;
using IM = ImporterMethod;
using IC = ImporterCallBack;
using PM = PlayerMethod;
using PC = PlayerCallBack;

constexpr Exchange kExchanges[] = {
    player(PM::initializePlayer, PC::initializePlayer),
    player(PM::openPlayer, PC::openPlayer),
    player(PM::closePlayer, PC::closePlayer),
    player(PM::play, PC::play),
    player(PM::pause, PC::pause),
    player(PM::seek, PC::seek),
    player(PM::getPlayerStatus, PC::getPlayerStatus),
    player(PM::setRepeat, PC::setRepeat),
    player(PM::powerOffMediaPlayer, PC::powerOffMediaPlayer),
    player(PM::registerCallBack, PC::setPlayerClientID),
    discoverer(DM::initializeDiscoverer, DC::initializeDiscoverer),
    discoverer(DM::openDiscoverer, DC::openDiscoverer),
    discoverer(DM::closeDiscoverer, DC::closeDiscoverer),
    discoverer(DM::getMetadata, DC::getMetadata),
    discoverer(DM::getImage, DC::getImage),
    discoverer(DM::getSupportedExtensions, DC::getSupportedExtensions),
    discoverer(DM::registerCallBack, DC::setDiscovererClientID),
    importer(IM::initializeImporter, IC::initializeImporter),
    importer(IM::import, IC::import),
    importer(IM::cancel, IC::cancel),
    importer(IM::getImporterStatus, IC::getImporterStatus),
    importer(IM::registerCallBack, IC::setImporterClientID),
};

bool isNotify(long interfaceId) {
    return interfaceId == kPlayerNotifyId || interfaceId == kImporterNotifyId;
}

} // namespace

Ledger::Ledger() {
    for (std::size_t index = 0; index < mSenders.size(); ++index) {
        mSenders[index].pLedger = this;
        mSenders[index].interfaceId = kInterfaces[index];
    }
}

void Ledger::requested(long object, long method) {
    const auto* const exchange =
        std::find_if(std::begin(kExchanges), std::end(kExchanges), [=](const Exchange& row) {
            return row.object == object && row.method == method;
        });
    if (exchange == std::end(kExchanges))
        return;
    const std::lock_guard lock(mMutex);
    ++mAnswersLeft[{exchange->interfaceId, exchange->answer}];
    // The engine's refusal of a file is told like an event of the engine.
    if (object == kImporterAdapterId && method == static_cast<long>(IM::import))
        ++mHappened[kImporterNotifyId];
}

void Ledger::connected(long interfaceId) {
    const std::lock_guard lock(mMutex);
    ++mClients[interfaceId];
}

void Ledger::happened(long interfaceId) {
    const std::lock_guard lock(mMutex);
    ++mHappened[interfaceId];
}

PTC::ISender* Ledger::senderOf(long interfaceId) {
    const auto sender = std::find_if(mSenders.begin(), mSenders.end(), [=](const Sender& known) {
        return known.interfaceId == interfaceId;
    });
    require(sender != mSenders.end());
    return &*sender;
}

void Ledger::Sender::send(PTC::Event* event) {
    const std::unique_ptr<PTC::Event> owned(event);
    pLedger->sent(interfaceId, *event);
}

void Ledger::sent(long interfaceId, const PTC::Event& event) {
    require(event.isCallback && event.isRemote && event.data && event.size > 0);
    requireDecodable(interfaceId, event);
    const std::lock_guard lock(mMutex);
    if (isNotify(interfaceId))
        countNotification(interfaceId);
    else
        countAnswer(interfaceId, event.methodId);
}

void Ledger::countAnswer(long interfaceId, long method) {
    require(--mAnswersLeft[{interfaceId, method}] >= 0);
}

void Ledger::countNotification(long interfaceId) {
    require(++mNotified[interfaceId] <= mHappened[interfaceId] * mClients[interfaceId]);
}

} // namespace fuzz
