// SPDX-License-Identifier: MIT
#include "cli/EventText.h"

#include "cli/HumanTime.h"
#include "cli/StateName.h"
#include "qnsmedia/Error.h"

using qnsmedia::ImportNotification;
using qnsmedia::ImportNotificationKind;
using qnsmedia::Nanoseconds;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerNotification;
using qnsmedia::PlayerState;

namespace {

const char* nameOf(NotificationKind kind) {
    switch (kind) {
    case NotificationKind::opened:
        return "opened";
    case NotificationKind::state:
        return "state";
    case NotificationKind::end:
        return "end";
    case NotificationKind::failure:
        return "failure";
    case NotificationKind::loop:
        return "loop";
    case NotificationKind::buffering:
        return "buffering";
    case NotificationKind::seekFinished:
        return "sought";
    }
    return "unknown";
}

const char* nameOf(ImportNotificationKind kind) {
    switch (kind) {
    case ImportNotificationKind::progress:
        return "progress";
    case ImportNotificationKind::finished:
        return "finished";
    case ImportNotificationKind::started:
        return "started";
    }
    return "unknown";
}

const char* stateOf(int number) {
    return stateName(static_cast<PlayerState>(number));
}

std::string positionText(const PlayerNotification& notification) {
    return "at " + humanTime(Nanoseconds(notification.value));
}

std::string openedText(const PlayerNotification& opened) {
    const qnsmedia::MediaInfo media = mediaInfoOf(opened);
    return opened.text + ": " + std::to_string(media.videoStreams) + " video, " +
           std::to_string(media.audioStreams) + " audio, " + std::to_string(media.textStreams) +
           " text, " + humanTime(media.duration) + (media.seekable ? ", seekable" : "") +
           (media.live ? ", live" : "");
}

std::string failureText(int result, const std::string& text) {
    return "failed: " + (text.empty() ? qnsmedia::resultText(result) : text);
}

std::string detailsOf(const PlayerNotification& notification) {
    if (notification.result != 0)
        return failureText(notification.result, notification.text);
    switch (notification.kind) {
    case NotificationKind::opened:
        return openedText(notification);
    case NotificationKind::state:
        return std::string(stateOf(notification.param2)) + " -> " + stateOf(notification.param1) +
               ", " + positionText(notification);
    case NotificationKind::buffering:
        return std::to_string(notification.param1) + "%";
    default:
        return positionText(notification);
    }
}

} // namespace

std::string eventText(const qnsmedia::PlayerStatus& status) {
    return std::string("player    status  ") + stateName(status.state) + ", at " +
           humanTime(status.position) + " of " + humanTime(status.duration) + '\n';
}

std::string eventText(const PlayerNotification& notification) {
    return std::string("player    ") + nameOf(notification.kind) + "  " + detailsOf(notification) +
           '\n';
}

std::string eventText(const ImportNotification& notification) {
    return std::string("importer  ") + nameOf(notification.kind) + "  " +
           (notification.result == 0 ? notification.text
                                     : failureText(notification.result, notification.text)) +
           '\n';
}

nlohmann::ordered_json eventJson(const qnsmedia::PlayerStatus& status) {
    return {{"service", "player"},
            {"event", "status"},
            {"state", stateName(status.state)},
            {"position_ns", status.position.count()},
            {"duration_ns", status.duration.count()}};
}

nlohmann::ordered_json eventJson(const PlayerNotification& notification) {
    nlohmann::ordered_json object = {{"service", "player"},
                                     {"event", nameOf(notification.kind)},
                                     {"result", notification.result}};
    if (!notification.text.empty())
        object["text"] = notification.text;
    if (notification.kind == NotificationKind::opened && notification.result == 0) {
        const qnsmedia::MediaInfo media = mediaInfoOf(notification);
        object.update({{"video_streams", media.videoStreams},
                       {"audio_streams", media.audioStreams},
                       {"text_streams", media.textStreams},
                       {"duration_ns", media.duration.count()},
                       {"seekable", media.seekable},
                       {"live", media.live}});
        return object;
    }
    if (notification.kind == NotificationKind::state)
        object.update(
            {{"state", stateOf(notification.param1)}, {"before", stateOf(notification.param2)}});
    if (notification.kind == NotificationKind::buffering)
        object["percent"] = notification.param1;
    else
        object["position_ns"] = notification.value;
    return object;
}

nlohmann::ordered_json eventJson(const ImportNotification& notification) {
    return {{"service", "importer"},
            {"event", nameOf(notification.kind)},
            {"result", notification.result},
            {"text", notification.text}};
}
