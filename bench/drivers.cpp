// Stands for the appliance's drivers, whose devices are plain files in the private root.
#include <cstdarg>
#include <linux/cdrom.h>
#include <sys/ioctl.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

enum EventRequest : unsigned long { kTake = 2, kTakePrivate = 0x10, kCountPrivate = 0x20 };

constexpr unsigned char kAppendable = 1;

} // namespace

// No event is pending, and an appendable disc is in the drive.
extern "C" int ioctl(int fd, unsigned long request, ...) noexcept {
    va_list arguments;
    va_start(arguments, request);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);
    switch (request) {
    case kTake:
    case kTakePrivate:
        return -1;
    case kCountPrivate:
        return 0;
    case CDROM_SEND_PACKET:
        static_cast<cdrom_generic_command *>(argument)->buffer[2] = kAppendable;
        return 0;
    default:
        return static_cast<int>(syscall(SYS_ioctl, fd, request, argument));
    }
}
