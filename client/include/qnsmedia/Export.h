// SPDX-License-Identifier: MIT
#pragma once

#if defined(__GNUC__)
#define QNSMEDIA_API __attribute__((visibility("default")))
#else
#define QNSMEDIA_API
#endif
