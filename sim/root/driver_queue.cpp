#include "root/driver_queue.hpp"

#include "launcher/sandbox.hpp"
#include "model/driver_events.hpp"

extern "C" {
#include "shim/shim.h"
}

#include <fcntl.h>
#include <fmt/format.h>
#include <unistd.h>

// What the shim's part that keeps the queues is built upon.
extern "C" int shim_real_open(const char *path, int flags, int mode) {
    return open(path, flags, mode);
}
extern "C" int shim_real_close(int fd) {
    return close(fd);
}

namespace zavsim {

void hand_over_events(State &state) {
    const std::string path = place::run + "/queues/events";
    for (const DriverEvent &event : state.driver_events) {
        const std::string record = event_record(event);
        const shim_queue queue = {path.c_str(), record.size()};
        if (shim_queue_put(&queue, record.data()) != 0)
            state.notes.push_back(fmt::format("an event about {} {} is lost: the queue is full",
                                              event.kind, event.number));
    }
    state.driver_events.clear();
}

} // namespace zavsim
