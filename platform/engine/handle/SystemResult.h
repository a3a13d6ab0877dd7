// SPDX-License-Identifier: MIT
#pragma once

namespace handle {

/** What a system call's errno means to who asked for it: a LibMediaPlayer::Result, never 0. */
int resultOfErrno(int error);

} // namespace handle
