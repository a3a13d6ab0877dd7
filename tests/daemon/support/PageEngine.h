// SPDX-License-Identifier: MIT
#pragma once

#include "tests/daemon/support/DaemonProcess.h"
#include "tests/daemon/support/ProtocolPage.h"
#include "tests/engine_double/EngineScript.h"

/** The scripted engine of a daemon, which does what docs/protocol.md tells. */
class PageEngine {
public:
    /** Has the daemon that is started with these options use it. */
    void addTo(DaemonOptions& options) const;

    /** Lets the daemon create what it needs. */
    void expectCreation();

    /** Takes the calls that the page's request leads to, and answers them. */
    void carryOut(const PageBlock& request);

    /** Notifies what the block shows: the first notification of its service, or a whole packet. */
    void notify(const PageBlock& notification);

    EngineScript& player() { return mPlayer; }

private:
    struct Call;

    [[nodiscard]] const std::vector<Call>& callsFor(const PageBlock& request) const;

    EngineScript mPlayer;
    EngineScript mDiscoverers;
    EngineScript mImporter;
    bool mOpen = false; ///< the player
};
