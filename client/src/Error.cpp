// SPDX-License-Identifier: MIT
#include "qnsmedia/Error.h"

namespace qnsmedia {

std::string resultText(int result) {
    switch (result) {
    case 1:
        return "not found";
    case 2:
        return "access denied";
    case 3:
        return "not media, or no decoder for it";
    case 4:
        return "damaged";
    case 5:
        return "not available";
    case 6:
        return "cancelled";
    case 7:
        return "took too long";
    case 8:
        return "no space left";
    case -1:
        return "not possible";
    default:
        return "internal error";
    }
}

} // namespace qnsmedia
