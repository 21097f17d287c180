#include "event_queue.h"

#include "library.h"

#include "zav_api.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <fmt/format.h>
#include <unistd.h>

namespace zavctl::library {

namespace {

constexpr const char *device = "/dev/zavevent0";

EventAnswer asked(int (*poll)(zavSystemEvent *)) {
    EventAnswer answer;
    answer.result = poll(&answer.event);
    return answer;
}

} // namespace

EventAnswer poll_event() {
    return asked(zavPollEvent);
}

EventAnswer poll_private_event() {
    return asked(zavPollPrivateEvent);
}

int push_event(const zavSystemEvent &event) {
    zavSystemEvent copy = event;
    return zavPushEvent(&copy);
}

std::string event_device_trouble() {
    const int opened = open(device, O_RDWR | O_EXCL | O_NOCTTY | O_CLOEXEC);
    if (opened >= 0) {
        close(opened);
        return ""; // it is free again
    }
    switch (errno) {
    case EBUSY:
        return "";
    case ENOENT:
    case ENODEV:
    case ENXIO:
        return fmt::format("there is no event driver: {} is missing", device);
    case EACCES:
    case EPERM:
        return fmt::format("{} may not be opened by this user", device);
    default:
        return fmt::format("{} cannot be opened: {}", device, std::strerror(errno));
    }
}

std::string event_failure(int result) {
    switch (result) {
    case ZAV_RC_ERR_EACCES: {
        const std::string trouble = event_device_trouble();
        return trouble.empty() ? "another program has the event device open" : trouble;
    }
    case ZAV_RC_ERR_ENOMEM:
        return "the driver's queue is full";
    case ZAV_RC_ERR:
        return "the driver refuses; its queue may be full";
    default:
        return in_words(failure_of(result).value_or(Failure{}));
    }
}

} // namespace zavctl::library
