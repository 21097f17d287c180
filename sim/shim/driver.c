/* The appliance's driver devices: exclusive opening, and requests on their queues. */
#include "shim.h"

#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <stdarg.h>
#include <string.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

enum request {
    request_put = 1,
    request_take = 2,
    request_take_private = 0x10,
    request_count = 0x20
};

enum { cdrom_requests = 0x53 }; /* the kernel's, which share their upper byte */

struct device {
    const char *path;
    struct shim_queue queue;
    struct shim_queue private_queue; /* no path: the device has none */
};

static const struct device devices[] = {
    {"/dev/zavevent0",
     {"/run/zavsim/queues/events", 872},
     {"/run/zavsim/queues/private-events", 872}},
    {"/dev/zavledevent", {"/run/zavsim/queues/led-events", 12}, {NULL, 0}},
};

int shim_real_open(const char *path, int flags, int mode) {
    return (int)syscall(SYS_openat, AT_FDCWD, path, flags | O_LARGEFILE, mode);
}

int shim_real_close(int fd) {
    return (int)syscall(SYS_close, fd);
}

static const struct device *device_at(const char *path) {
    for (size_t i = 0; i < sizeof devices / sizeof *devices; ++i)
        if (path != NULL && strcmp(path, devices[i].path) == 0)
            return &devices[i];
    return NULL;
}

/* A descriptor is a device's when it refers to the device's file: that holds for duplicates too,
 * and needs no table that threads would have to share. */
static const struct device *device_of(int fd) {
    struct stat own;
    struct stat node;
    if (fstat(fd, &own) != 0 || !S_ISREG(own.st_mode))
        return NULL;
    for (size_t i = 0; i < sizeof devices / sizeof *devices; ++i)
        if (stat(devices[i].path, &node) == 0 && own.st_dev == node.st_dev &&
            own.st_ino == node.st_ino)
            return &devices[i];
    return NULL;
}

/* The lock goes with the open file, however the process ends. */
static int open_device(const char *path, int flags) {
    const int fd = shim_real_open(path, flags & ~O_EXCL, 0);
    if (fd < 0 || (flags & O_EXCL) == 0 || flock(fd, LOCK_EX | LOCK_NB) == 0)
        return fd;
    shim_real_close(fd);
    errno = EBUSY;
    return -1;
}

static int open_any(const char *path, int flags, int mode) {
    return device_at(path) != NULL ? open_device(path, flags) : shim_real_open(path, flags, mode);
}

/* The mode is there only when the file may have to be made. */
#define MODE_ARGUMENT(flags, mode)                                                                 \
    int mode = 0;                                                                                  \
    if (((flags)&O_CREAT) != 0 || ((flags)&O_TMPFILE) == O_TMPFILE) {                              \
        va_list arguments;                                                                         \
        va_start(arguments, flags);                                                                \
        mode = va_arg(arguments, int);                                                             \
        va_end(arguments);                                                                         \
    }

SHIM_EXPORT int open(const char *path, int flags, ...) {
    MODE_ARGUMENT(flags, mode)
    return open_any(path, flags, mode);
}

SHIM_EXPORT int open64(const char *path, int flags, ...) {
    MODE_ARGUMENT(flags, mode)
    return open_any(path, flags, mode);
}

/* What fortified programs call instead when no file can be made. */
SHIM_EXPORT int __open_2(const char *path, int flags) {
    return open_any(path, flags, 0);
}
SHIM_EXPORT int __open64_2(const char *path, int flags) {
    return open_any(path, flags, 0);
}

static int refuse(int error) {
    errno = error;
    return -1;
}

static int count_private(const struct device *device, int *count) {
    *count = shim_queue_count(&device->private_queue);
    return *count < 0 ? -1 : 0;
}

static int serve(const struct device *device, unsigned long request, void *argument) {
    if (argument == NULL)
        return refuse(EFAULT);
    if (request == request_put)
        return shim_queue_put(&device->queue, argument);
    if (request == request_take)
        return shim_queue_take(&device->queue, argument);
    if (device->private_queue.path == NULL)
        return refuse(ENOTTY);
    if (request == request_count)
        return count_private(device, argument);
    if (request == request_take_private)
        return shim_queue_take(&device->private_queue, argument);
    return refuse(ENOTTY);
}

SHIM_EXPORT int ioctl(int fd, unsigned long request, ...) {
    va_list arguments;
    va_start(arguments, request);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);
    const struct device *device = request <= request_count ? device_of(fd) : NULL;
    if (device != NULL)
        return serve(device, request, argument);
    if (request >> 8 == cdrom_requests && shim_is_drive(fd))
        return shim_serve_drive(request, argument);
    return (int)syscall(SYS_ioctl, fd, request, argument);
}
