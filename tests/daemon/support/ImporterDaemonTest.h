// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/ImporterClient.h"

/**
 * A daemon whose importer and discoverers report every call to the test and block until they are
 * told.
 */
class ImporterDaemonTest : public DaemonTest {
protected:
    /** What the engine makes for the importer's service. */
    struct Engine {
        bool importer = true;
        bool discoverer = true;
    };

    /** Starts the daemon. */
    void SetUp() override;

    void startImporter(Engine engine);
    void startImporter() { startImporter({}); }

    /** An import's first half: the discoverer is asked about the file. */
    void expectLook(const std::string& file, const std::string& opened = "return 0",
                    const std::string& metadata = "return 0");

    /** All of it, up to where the engine takes the import. */
    void expectImport(const std::string& file, const std::string& folder = "");

    EngineScript mImporter;
    EngineScript mDiscoverers;
};

/** The same with a client, which has a notify object unless it is unregistered. */
class ImporterClientTest : public ImporterDaemonTest {
protected:
    void SetUp() override;

    /** The client's registrations. The second is done when a request after it is answered. */
    void registerClient();

    /** Imports a file, as far as the engine's queue. */
    void import(const std::string& file, const std::string& folder = "");

    /** All that was asked of the engine has been carried out. */
    void expectStatus();

    /** All that a module has written to the system log, with codes, as it stands there. */
    std::vector<std::string> logOf(const std::string& module, std::size_t count);

    static constexpr long kObject = 100;
    static constexpr long kNotifyObject = 200;

    ImporterClient mClient{1000};
    std::int32_t mId = -1;
};

/** A line of the importer's service as logOf() tells it. */
std::string serviceLine(int level, int code, const std::string& text);

/** The same of its controller. */
std::string controllerLine(int level, int code, const std::string& text);
