// SPDX-License-Identifier: MIT
#pragma once

#if defined(__GNUC__)
#define LIBMEDIAPLAYER_API __attribute__((visibility("default")))
#else
#define LIBMEDIAPLAYER_API
#endif
