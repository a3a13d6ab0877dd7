// SPDX-License-Identifier: MIT
#include "mpris/MetadataMap.h"

#include <charconv>
#include <chrono>
#include <cstdint>
#include <vector>

#include "mpris/FileUri.h"
#include "mpris/Utf8.h"

namespace mpris {
namespace {

enum class Form { text, list, number };

struct TagName {
    const char* tag;
    const char* key;
    Form form;
};

constexpr TagName kTagNames[] = {
    {"TITLE", "xesam:title", Form::text},
    {"ARTIST", "xesam:artist", Form::list},
    {"ALBUM", "xesam:album", Form::text},
    {"ALBUMARTIST", "xesam:albumArtist", Form::list},
    {"DATE", "xesam:contentCreated", Form::text},
    {"GENRE", "xesam:genre", Form::list},
    {"TRACKNUMBER", "xesam:trackNumber", Form::number},
    {"DISCNUMBER", "xesam:discNumber", Form::number},
    {"COMPOSER", "xesam:composer", Form::list},
    {"COMMENT", "xesam:comment", Form::list},
};

/** "3/12" is the third of twelve. */
void addNumber(MetadataMap& map, const char* key, const std::string& value) {
    std::int32_t number = 0;
    if (std::from_chars(value.data(), value.data() + value.size(), number).ec == std::errc())
        map[key] = number;
}

void addToList(MetadataMap& map, const char* key, const std::string& value) {
    const auto found = map.find(key);
    auto list = found == map.end() ? std::vector<std::string>()
                                   : found->second.get<std::vector<std::string>>();
    list.push_back(toUtf8(value));
    map[key] = list;
}

void addTag(MetadataMap& map, const TagName& name, const std::string& value) {
    switch (name.form) {
    case Form::text:
        map[name.key] = toUtf8(value);
        return;
    case Form::list:
        return addToList(map, name.key, value);
    case Form::number:
        return addNumber(map, name.key, value);
    }
}

void addTags(MetadataMap& map, const Track& track) {
    for (const auto& [tag, value] : track.tags)
        for (const TagName& name : kTagNames)
            if (tag == name.tag)
                addTag(map, name, value);
}

void addPlace(MetadataMap& map, const std::string& path) {
    if (path.empty())
        return;
    map["xesam:url"] = isUri(path) ? toUtf8(path) : fileUri(path);
    const std::string named = filePath(path).value_or(path);
    map["xesam:title"] = toUtf8(named.substr(named.rfind('/') + 1));
}

} // namespace

std::string trackId(int number) {
    return "/qnsmedia/track/" + std::to_string(number);
}

MetadataMap metadataOf(const Track& track) {
    MetadataMap map;
    if (track.number == 0)
        return map;
    map["mpris:trackid"] = sdbus::ObjectPath(trackId(track.number));
    using std::chrono::microseconds;
    const auto length = std::chrono::duration_cast<microseconds>(track.duration);
    if (length.count() > 0)
        map["mpris:length"] = static_cast<std::int64_t>(length.count());
    if (!track.picture.empty())
        map["mpris:artUrl"] = fileUri(track.picture);
    addPlace(map, track.path);
    addTags(map, track);
    return map;
}

} // namespace mpris
