// SPDX-License-Identifier: MIT
#include "client/src/DiscovererClient.h"

#include <utility>

#include "client/src/Requests.h"
#include "define/DiscovererMethods.h"
#include "define/ObjectIds.h"
#include "pack/CPack_Simplebuffer.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

constexpr long number(DiscovererMethod method) {
    return static_cast<long>(method);
}

constexpr Service kDiscoverer{kDiscovererAdapterId, number(DiscovererMethod::registerCallBack),
                              number(DiscovererMethod::unregisterCallBack),
                              static_cast<long>(DiscovererCallBack::setDiscovererClientID)};

/** A file may take five seconds, and wait for those of nine other clients. */
constexpr std::chrono::seconds kWork{50};

constexpr Operation kInitialize{DiscovererMethod::initializeDiscoverer,
                                DiscovererCallBack::initializeDiscoverer, "initialize"};
constexpr Operation kOpen{DiscovererMethod::openDiscoverer, DiscovererCallBack::openDiscoverer,
                          "open", Answers::inOrder, kWork};
constexpr Operation kClose{DiscovererMethod::closeDiscoverer, DiscovererCallBack::closeDiscoverer,
                           "close"};
constexpr Operation kMetadata{DiscovererMethod::getMetadata, DiscovererCallBack::getMetadata,
                              "metadata", Answers::inOrder, kWork};
constexpr Operation kImage{DiscovererMethod::getImage, DiscovererCallBack::getImage, "image",
                           Answers::inOrder, kWork};
constexpr Operation kExtensions{DiscovererMethod::getSupportedExtensions,
                                DiscovererCallBack::getSupportedExtensions, "extensions",
                                Answers::inOrder, kWork};

} // namespace

DiscovererClient::DiscovererClient(std::shared_ptr<Link> link)
    : mService(std::move(link), kDiscoverer) {
    // The one who had this place before may have left a file open in it.
    const auto ignored = [](std::exception_ptr, ArgumentReader*) {};
    PackedArguments arguments = mService.ownId();
    mService.send(kInitialize, arguments, {ignored});
}

void DiscovererClient::open(const std::string& path, Completion completion) const {
    if (path.find('\0') != std::string::npos)
        return mService.fail(std::move(completion),
                             std::make_exception_ptr(Error("open: a path has no zero byte")));
    PackedArguments arguments = mService.ownId();
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), path);
    mService.send(kOpen, arguments, std::move(completion));
}

/**
 * The daemon says that it will close before it has, and would refuse the next file until then.
 * What is answered behind the closing tells that it is done.
 */
void DiscovererClient::close(const Completion& completion) const {
    const auto accepted = [this, completion](std::exception_ptr error, ArgumentReader* answer) {
        try {
            if (error)
                std::rethrow_exception(error);
            readAccepted(kClose.name, *answer);
            extensions(completion);
        } catch (...) {
            completion.tell(std::current_exception(), nullptr);
        }
    };
    PackedArguments arguments = mService.ownId();
    mService.send(kClose, arguments, {accepted, completion.callsUser});
}

void DiscovererClient::metadata(Completion completion) const {
    PackedArguments arguments = mService.ownId();
    mService.send(kMetadata, arguments, std::move(completion));
}

void DiscovererClient::makeImage(std::int64_t position, int width, int height,
                                 const std::string& path, Completion completion) const {
    if (path.find('\0') != std::string::npos)
        return mService.fail(std::move(completion),
                             std::make_exception_ptr(Error("image: a path has no zero byte")));
    PackedArguments arguments = mService.ownId();
    arguments.int32(width).int32(height).int64(position);
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), path);
    CPack_Simplebuffer().pack_simplebuffer_string(arguments.get(), ""); // no notice file
    mService.send(kImage, arguments, std::move(completion));
}

void DiscovererClient::extensions(Completion completion) const {
    PackedArguments arguments = mService.ownId();
    mService.send(kExtensions, arguments, std::move(completion));
}

} // namespace qnsmedia
