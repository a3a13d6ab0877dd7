// SPDX-License-Identifier: MIT
#include "cli/Terminal.h"

#include <array>
#include <string_view>
#include <unistd.h>

namespace {

struct KeyName {
    std::string_view bytes;
    Key key;
};

constexpr KeyName kKeys[] = {
    {" ", Key::pause},           {"\x1b[D", Key::back},
    {"\x1b[C", Key::forward},    {"\x1b[B", Key::backFar},
    {"\x1b[A", Key::forwardFar}, {"a", Key::loopStart},
    {"b", Key::loopEnd},         {"q", Key::quit},
};

/** A job in the background that changes the terminal is stopped. */
bool isInForeground() {
    const pid_t group = ::tcgetpgrp(STDIN_FILENO);
    return group == -1 || group == ::getpgrp();
}

} // namespace

Terminal::Terminal()
    : mInteractive(::isatty(STDIN_FILENO) && ::isatty(STDOUT_FILENO) && isInForeground()) {
    if (!mInteractive || ::tcgetattr(STDIN_FILENO, &mBefore) != 0) {
        mInteractive = false;
        return;
    }
    termios raw = mBefore;
    raw.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    raw.c_cc[VMIN] = 0;
    raw.c_cc[VTIME] = 0;
    ::tcsetattr(STDIN_FILENO, TCSANOW, &raw);
}

Terminal::~Terminal() {
    if (mInteractive)
        ::tcsetattr(STDIN_FILENO, TCSANOW, &mBefore);
}

int Terminal::input() const {
    return mInteractive ? STDIN_FILENO : -1;
}

Key Terminal::readKey() {
    std::array<char, 3> bytes{};
    if (::read(STDIN_FILENO, bytes.data(), 1) != 1)
        return Key::quit;
    std::size_t length = 1;
    if (bytes[0] == '\x1b') {
        const ssize_t more = ::read(STDIN_FILENO, bytes.data() + 1, 2);
        length += more > 0 ? static_cast<std::size_t>(more) : 0;
    }
    const std::string_view pressed(bytes.data(), length);
    for (const KeyName& name : kKeys)
        if (name.bytes == pressed)
            return name.key;
    return Key::none;
}
