#include "pushing.h"

#include "../system/event_queue.h"
#include "../system/interrupt.h"

namespace zavctl {

int push_patiently(const zavSystemEvent &event) {
    constexpr int tries = 30;
    constexpr std::chrono::milliseconds pause{100};
    int result = library::push_event(event);
    for (int i = 1; i < tries && result == ZAV_RC_ERR_EACCES; ++i) {
        if (!library::event_device_trouble().empty() || stop_within(pause))
            return result;
        result = library::push_event(event);
    }
    return result;
}

} // namespace zavctl
