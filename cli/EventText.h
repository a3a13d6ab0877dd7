// SPDX-License-Identifier: MIT
#pragma once

#include <nlohmann/json.hpp>
#include <string>

#include "qnsmedia/ImporterTypes.h"
#include "qnsmedia/Types.h"

/** One line for people: who tells, what, and the details. */
std::string eventText(const qnsmedia::PlayerStatus& status);
std::string eventText(const qnsmedia::PlayerNotification& notification);
std::string eventText(const qnsmedia::ImportNotification& notification);

/** All fields that mean something; times in nanoseconds. */
nlohmann::ordered_json eventJson(const qnsmedia::PlayerStatus& status);
nlohmann::ordered_json eventJson(const qnsmedia::PlayerNotification& notification);
nlohmann::ordered_json eventJson(const qnsmedia::ImportNotification& notification);
