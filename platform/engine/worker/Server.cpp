// SPDX-License-Identifier: MIT
#include "worker/Server.h"

#include <sys/socket.h>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/Barrier.h"
#include "worker/Message.h"

namespace worker {

namespace {

constexpr char kReady[] = "ready";

/** Who asked kills a worker that hangs, but may be gone itself. */
constexpr unsigned int kLongestSeconds = 20;

std::string refusal(int result) {
    MessageWriter message;
    message(result);
    return message.bytes();
}

std::string answerTo(Parcel& parcel, const Answerer& answer) {
    Request request;
    MessageReader message(parcel.bytes);
    message(request);
    if (!message.isGood())
        return refusal(LibMediaPlayer::kInternal);
    return handle::guarded(refusal(LibMediaPlayer::kInternal),
                           [&] { return answer(request, std::move(parcel.files)); });
}

} // namespace

bool isStartedByEngine() {
    int kind = 0;
    socklen_t size = sizeof kind;
    return ::getsockopt(kServerSocket, SOL_SOCKET, SO_TYPE, &kind, &size) == 0 &&
           kind == SOCK_SEQPACKET;
}

void serve(int socket, const Answerer& answer) {
    bool isHeard = send(socket, kReady);
    while (isHeard) {
        auto parcel = receive(socket);
        if (!parcel)
            return;
        ::alarm(kLongestSeconds);
        isHeard = send(socket, answerTo(*parcel, answer));
        ::alarm(0);
    }
}

} // namespace worker
