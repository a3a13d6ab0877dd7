// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>
#include <string>

/** The process's top-level object: initialises the platform, and converts texts and paths. */
class MediaServiceMain : public QObject {
    Q_OBJECT

public:
    MediaServiceMain();
    ~MediaServiceMain() override;

    /** Initialises the platform library. False when that fails. */
    virtual bool initialize();

    /** Conversions in the environment's locale; see base/Text.h. */
    static std::string wstringToStringType(std::wstring text);
    static std::wstring stringToWstring(std::string text);

    /** The platform's directories; see base/SystemPaths.h. */
    static bool getSystemHvPrefixPath(std::wstring& out);
    static bool getSystemHvDataPath(std::wstring& out);

public Q_SLOTS:
    virtual void import();
    virtual void importController();
};
