// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "client/src/ServiceClient.h"

namespace qnsmedia {

/** Asks the discoverer. Any thread. */
class DiscovererClient {
public:
    explicit DiscovererClient(std::shared_ptr<Link> link);

    [[nodiscard]] const ServiceClient& service() const { return mService; }

    void open(const std::string& path, Completion completion) const;
    void close(const Completion& completion) const;
    void metadata(Completion completion) const;
    void makeImage(std::int64_t position, int width, int height, const std::string& path,
                   Completion completion) const;
    void extensions(Completion completion) const;

private:
    const ServiceClient mService;
};

} // namespace qnsmedia
