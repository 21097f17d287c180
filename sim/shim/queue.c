#include "shim.h"

#include <errno.h>
#include <fcntl.h>
#include <string.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

static int open_queue(const struct shim_queue *queue) {
    const int fd = shim_real_open(queue->path, O_RDWR | O_CREAT | O_CLOEXEC, 0666);
    if (fd >= 0 && flock(fd, LOCK_EX) != 0) {
        shim_real_close(fd);
        return -1;
    }
    return fd;
}

static long records_in(int fd, size_t record_size) {
    struct stat info;
    if (fstat(fd, &info) != 0)
        return -1;
    return (long)((size_t)info.st_size / record_size);
}

/* Closes the queue and keeps the error that is the answer. */
static int finish(int fd, int error) {
    if (fd >= 0)
        shim_real_close(fd);
    if (error == 0)
        return 0;
    errno = error;
    return -1;
}

static int append(int fd, const struct shim_queue *queue, const void *record) {
    const long count = records_in(fd, queue->record_size);
    if (count < 0)
        return errno;
    if (count >= shim_queue_depth)
        return ENOMEM;
    const off_t end = (off_t)((size_t)count * queue->record_size);
    return pwrite(fd, record, queue->record_size, end) == (ssize_t)queue->record_size ? 0 : EIO;
}

int shim_queue_put(const struct shim_queue *queue, const void *record) {
    const int fd = open_queue(queue);
    return finish(fd, fd < 0 ? errno : append(fd, queue, record));
}

/* Moves the records behind the first one forward, one by one: a queue is short. */
static int drop_first(int fd, size_t record_size, long count) {
    char record[1024];
    for (long i = 1; i < count; ++i) {
        const off_t from = (off_t)((size_t)i * record_size);
        if (pread(fd, record, record_size, from) != (ssize_t)record_size ||
            pwrite(fd, record, record_size, from - (off_t)record_size) != (ssize_t)record_size)
            return EIO;
    }
    return ftruncate(fd, (off_t)((size_t)(count - 1) * record_size)) == 0 ? 0 : errno;
}

static int take_first(int fd, const struct shim_queue *queue, void *record) {
    const long count = records_in(fd, queue->record_size);
    if (count < 0)
        return errno;
    if (count == 0)
        return EAGAIN;
    if (pread(fd, record, queue->record_size, 0) != (ssize_t)queue->record_size)
        return EIO;
    return drop_first(fd, queue->record_size, count);
}

int shim_queue_take(const struct shim_queue *queue, void *record) {
    const int fd = open_queue(queue);
    return finish(fd, fd < 0 ? errno : take_first(fd, queue, record));
}

int shim_queue_count(const struct shim_queue *queue) {
    const int fd = open_queue(queue);
    if (fd < 0)
        return -1;
    const long count = records_in(fd, queue->record_size);
    finish(fd, 0);
    return (int)count;
}
