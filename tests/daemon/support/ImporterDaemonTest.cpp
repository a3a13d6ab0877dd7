// SPDX-License-Identifier: MIT
#include "tests/daemon/support/ImporterDaemonTest.h"

namespace {

/** Made by the discoverer's service, and before the importer's. */
constexpr int kOtherDiscoverers = 10;

const std::string kDiscoverer = "discoverer 10 ";

constexpr int kLocal0 = 16 * 8;

std::string line(int level, const std::string& module, int code, const std::string& text) {
    return '<' + std::to_string(kLocal0 + level) + '>' + module + ' ' + std::to_string(code) +
           ": " + text;
}

} // namespace

void ImporterDaemonTest::SetUp() {
    startImporter();
}

void ImporterDaemonTest::startImporter(Engine engine) {
    auto options = withEngineDouble();
    options.environment["QNS_IMPORTER_DOUBLE"] = mImporter.address();
    options.environment["QNS_DISCOVERER_DOUBLE"] = mDiscoverers.address();
    start(options);
    for (int number = 0; number < kOtherDiscoverers; ++number)
        mDiscoverers.expectCall("discoverer " + std::to_string(number) + " create");
    mImporter.expectCall("importer create", engine.importer ? "return 0" : "null");
    mDiscoverers.expectCall(kDiscoverer + "create", engine.discoverer ? "return 0" : "null");
    ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
}

void ImporterDaemonTest::expectLook(const std::string& file, const std::string& opened,
                                    const std::string& metadata) {
    mDiscoverers.expectCall(
        kDiscoverer + "open " + script::quoted(std::wstring(file.begin(), file.end())), opened);
    mDiscoverers.expectCall(kDiscoverer + "metadata", metadata);
    mDiscoverers.expectCall(kDiscoverer + "close");
}

void ImporterDaemonTest::expectImport(const std::string& file, const std::string& folder) {
    expectLook(file);
    mImporter.expectCall("importer import \"" + file + "\" \"" + folder + '"');
}

void ImporterClientTest::SetUp() {
    ASSERT_NO_FATAL_FAILURE(startImporter());
    registerClient();
    expectStatus();
}

void ImporterClientTest::registerClient() {
    mId = mClient.registerCallBack(kObject);
    mClient.registerNotify(kNotifyObject, mId);
}

void ImporterClientTest::import(const std::string& file, const std::string& folder) {
    mClient.import(mId, file, folder);
    mClient.expectResult(kObject, importer::kImportCallBack, 0);
    expectImport(file, folder);
}

void ImporterClientTest::expectStatus() {
    mClient.request(importer::kGetStatus, mId);
    mImporter.expectCall("importer status", "return 1 2 3");
    mClient.expectCallBack(kObject, importer::kStatusCallBack, importer::status(1, 2, 3));
}

std::vector<std::string> ImporterClientTest::logOf(const std::string& module, std::size_t count) {
    const std::string start = ": " + module + ' ';
    EXPECT_TRUE(mSyslog.waitForLine(start, count));
    auto lines = mSyslog.lines(start);
    for (auto& line : lines)
        line.erase(line.find('>') + 1, line.find("]: ") + 3 - (line.find('>') + 1));
    return lines;
}

std::string serviceLine(int level, int code, const std::string& text) {
    return line(level, "MediaImporterService", code, "MediaImporterService::" + text);
}

std::string controllerLine(int level, int code, const std::string& text) {
    return line(level, "MediaImporterController", code, text);
}
