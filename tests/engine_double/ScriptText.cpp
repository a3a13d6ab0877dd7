// SPDX-License-Identifier: MIT
#include "tests/engine_double/ScriptText.h"

#include <cstdio>
#include <cwchar>

namespace script {

namespace {

std::string escaped(wchar_t character) {
    if (character == L'"' || character == L'\\')
        return {'\\', static_cast<char>(character)};
    if (character >= L' ' && character <= L'~')
        return {static_cast<char>(character)};
    char escape[16];
    std::snprintf(escape, sizeof(escape), "\\x{%lx}", static_cast<unsigned long>(character));
    return escape;
}

/** Takes the character that `rest` starts with. `rest` is not empty. */
wchar_t takeCharacter(std::string_view& rest) {
    if (rest.substr(0, 3) == "\\x{") {
        const auto end = rest.find('}');
        const std::string digits(rest.substr(3, end - 3));
        rest.remove_prefix(end == std::string_view::npos ? rest.size() : end + 1);
        return static_cast<wchar_t>(std::strtoul(digits.c_str(), nullptr, 16));
    }
    if (rest.front() == '\\' && rest.size() > 1)
        rest.remove_prefix(1);
    const char character = rest.front();
    rest.remove_prefix(1);
    return static_cast<wchar_t>(character);
}

/** Takes a word that ends before `end`, and the end too. */
std::wstring takeWord(std::string_view& rest, char end) {
    std::wstring word;
    while (!rest.empty() && rest.front() != end)
        word += takeCharacter(rest);
    rest.remove_prefix(rest.empty() ? 0 : 1);
    return word;
}

} // namespace

std::string quoted(std::wstring_view text) {
    std::string word = "\"";
    for (const wchar_t character : text)
        word += escaped(character);
    return word + '"';
}

std::vector<std::wstring> words(std::string_view line) {
    std::vector<std::wstring> result;
    while (!line.empty()) {
        if (line.front() == ' ') {
            line.remove_prefix(1);
        } else if (line.front() == '"') {
            line.remove_prefix(1);
            result.push_back(takeWord(line, '"'));
        } else {
            result.push_back(takeWord(line, ' '));
        }
    }
    return result;
}

long number(const std::wstring& word) {
    return std::wcstol(word.c_str(), nullptr, 10);
}

unsigned long unsignedNumber(const std::wstring& word) {
    return std::wcstoul(word.c_str(), nullptr, 10);
}

int resultIn(const std::vector<std::wstring>& answer) {
    return answer.size() > 1 ? static_cast<int>(number(answer[1])) : 0;
}

int resultIn(std::string_view answer) {
    return resultIn(words(answer));
}

} // namespace script
