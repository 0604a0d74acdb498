// A launch request, sent or received, or a reply.
#pragma once

#include "app_control.h"
#include "launch/Bundle.h"

#include <Mutex.h>

#include <atomic>
#include <cstdint>
#include <memory>

namespace platform {

// The method call that a received request came with. Clones share it: the first reply wins. When the last clone
// goes without a reply, the caller is told that none will come. Any thread; the bus is touched on the main loop.
class PendingReply {
public:
    explicit PendingReply(sd_bus_message* call); // takes a reference
    ~PendingReply();
    PendingReply(const PendingReply&) = delete;
    PendingReply& operator=(const PendingReply&) = delete;

    int answer(app_control_result_e result, const bundle_s& extras);
    [[nodiscard]] bool isAnswered() const;

private:
    mutable Mutex _mutex;
    sd_bus_message* _call GUARDED_BY(_mutex);
};

}

struct app_control_s {
    bundle_s fields; // operation, uri, mime, launch-mode
    bundle_s extras;
    std::string appId;
    bool wantsStarted = false;
    std::shared_ptr<platform::PendingReply> pending;
    // The launch this request was sent with, shared with its copies; 0 is none.
    std::shared_ptr<std::atomic<uint64_t>> launch = std::make_shared<std::atomic<uint64_t>>(0);

    [[nodiscard]] bool isGroup() const { return fields.text("launch-mode") == "group"; }
    // Fields and extras together, as they travel.
    [[nodiscard]] bundle_s toWire() const;
    void fromWire(const bundle_s& wire);
};
