// SPDX-License-Identifier: MIT
#include "main/MediaServiceMain.h"

#include "base/StandardOutput.h"
#include "base/SystemPaths.h"
#include "base/Text.h"
#include "qnsys.h"

MediaServiceMain::MediaServiceMain() {
    qns::printLine("MediaServiceMain::MediaServiceMain");
}

MediaServiceMain::~MediaServiceMain() {
    qns::printLine("MediaServiceMain::~MediaServiceMain");
}

bool MediaServiceMain::initialize() {
    qns::printLine("MediaServiceMain::initialize");
    return qnsys_init() >= 0;
}

void MediaServiceMain::import() {
    qns::printLine("MediaServiceMain::import");
}

void MediaServiceMain::importController() {
    qns::printLine("MediaServiceMain::importController");
}

std::string MediaServiceMain::wstringToStringType(std::wstring text) {
    return qns::narrow(text);
}

std::wstring MediaServiceMain::stringToWstring(std::string text) {
    return qns::widen(text);
}

bool MediaServiceMain::getSystemHvPrefixPath(std::wstring& out) {
    return qns::systemPrefixPath(out);
}

bool MediaServiceMain::getSystemHvDataPath(std::wstring& out) {
    return qns::systemDataPath(out);
}
