// SPDX-License-Identifier: MIT
#include "reader/TagText.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <string_view>

#include "text/Text.h"

namespace reader {

namespace {

constexpr wchar_t kReplacement = 0xfffd;

/** In the order in which they are told. */
constexpr std::string_view kWellKnown[] = {"TITLE",    "ARTIST", "ALBUM",       "ALBUMARTIST",
                                           "DATE",     "GENRE",  "TRACKNUMBER", "DISCNUMBER",
                                           "COMPOSER", "COMMENT"};

struct Rename {
    std::string_view from;
    std::string_view to;
};

/** What libavformat calls otherwise than everybody's tags do. */
constexpr Rename kRenames[] = {
    {"ALBUM_ARTIST", "ALBUMARTIST"}, {"DISC", "DISCNUMBER"}, {"TRACK", "TRACKNUMBER"}};

/** Facts about the file rather than about what it holds. */
constexpr std::string_view kLeftOut[] = {"MAJOR_BRAND", "MINOR_VERSION", "COMPATIBLE_BRANDS",
                                         "DURATION"};

std::string keyOf(std::string_view name) {
    std::string key;
    for (const char character : name) {
        if (character >= 'a' && character <= 'z')
            key += static_cast<char>(character - 'a' + 'A');
        else if (character > ' ' && character <= '~' && character != '=')
            key += character;
    }
    const auto* const renamed = std::find_if(std::begin(kRenames), std::end(kRenames),
                                             [&](const Rename& row) { return row.from == key; });
    return renamed == std::end(kRenames) ? key : std::string(renamed->to);
}

std::wstring decoded(std::string_view bytes) {
    std::wstring text = engine::fromUtf8(bytes);
    if (text.find(kReplacement) == std::wstring::npos)
        return text;
    text.clear();
    for (const char byte : bytes)
        text += static_cast<wchar_t>(static_cast<unsigned char>(byte));
    return text;
}

/** One line, without what a terminal would obey. */
std::wstring cleaned(std::wstring text) {
    const auto isControl = [](wchar_t wide) { return wide < 0x20 || (wide > 0x7e && wide < 0xa0); };
    std::replace_if(text.begin(), text.end(), isControl, L' ');
    const std::size_t first = text.find_first_not_of(L' ');
    if (first == std::wstring::npos)
        return {};
    return text.substr(first, text.find_last_not_of(L' ') + 1 - first);
}

std::size_t utf8Size(wchar_t wide) {
    return wide < 0x80 ? 1 : wide < 0x800 ? 2 : wide < 0x10000 ? 3 : 4;
}

std::size_t utf8Size(std::wstring_view text) {
    std::size_t size = 0;
    for (const wchar_t wide : text)
        size += utf8Size(wide);
    return size;
}

std::wstring cut(std::wstring text, std::size_t most) {
    std::size_t size = 0;
    const auto end = std::find_if(text.begin(), text.end(),
                                  [&](wchar_t wide) { return (size += utf8Size(wide)) > most; });
    text.erase(end, text.end());
    return text;
}

using Tags = std::map<std::string, std::wstring>;

/** The first that names a tag has it. */
void collect(const AVDictionary* dictionary, Tags& tags) {
    const AVDictionaryEntry* entry = nullptr;
    while ((entry = av_dict_get(dictionary, "", entry, AV_DICT_IGNORE_SUFFIX))) {
        const std::string key = keyOf(entry->key);
        const std::wstring value = cut(cleaned(decoded(entry->value)), kTagValueBytes);
        const bool wanted =
            std::find(std::begin(kLeftOut), std::end(kLeftOut), key) == std::end(kLeftOut);
        if (wanted && !key.empty() && !value.empty())
            tags.emplace(key, value);
    }
}

/** Ogg keeps its tags in the stream. */
Tags tagsOf(const AVFormatContext& context) {
    Tags tags;
    collect(context.metadata, tags);
    const AVStream* const* const streams = context.streams;
    const bool inStreams = std::string_view(context.iformat->name) == "ogg";
    for (unsigned int index = 0; inStreams && index < context.nb_streams; ++index)
        collect(streams[index]->metadata, tags);
    return tags;
}

class Lines {
public:
    void add(const std::string& key, const std::wstring& value) {
        const std::size_t size = key.size() + utf8Size(value) + 2;
        if (mSize + size > kTagBytes)
            return;
        mSize += size;
        mText.append(key.begin(), key.end());
        mText += L'=' + value + L'\n';
    }

    [[nodiscard]] std::wstring take() { return std::move(mText); }

private:
    std::wstring mText;
    std::size_t mSize = 0;
};

} // namespace

std::wstring tagText(const AVFormatContext& context) {
    Tags tags = tagsOf(context);
    Lines lines;
    for (const std::string_view key : kWellKnown) {
        const auto tag = tags.find(std::string(key));
        if (tag == tags.end())
            continue;
        lines.add(tag->first, tag->second);
        tags.erase(tag);
    }
    for (const auto& [key, value] : tags)
        lines.add(key, value);
    return lines.take();
}

} // namespace reader
