// SPDX-License-Identifier: MIT
#include "main/StandardDescriptors.h"

#include <fcntl.h>
#include <initializer_list>
#include <unistd.h>

void openStandardDescriptors() {
    // In this order: what is opened gets the lowest number that is free.
    for (const int standard : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO})
        if (::fcntl(standard, F_GETFD) < 0)
            ::open("/dev/null", O_RDWR);
}
