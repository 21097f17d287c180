/* The preloaded part of the simulated appliance: time that runs faster, driver
 * devices, and the numbers of mounted volumes. */
#ifndef ZAVSIM_SHIM_H
#define ZAVSIM_SHIM_H

#include <stddef.h>

#define SHIM_EXPORT __attribute__((visibility("default")))

/* Driver records, oldest first, in a file; all processes of the appliance share it. */
struct shim_queue {
    const char *path;
    size_t record_size;
};

enum { shim_queue_depth = 64 };

/* 0, or -1 with errno ENOMEM (full), EAGAIN (empty) or what the system says. */
int shim_queue_put(const struct shim_queue *queue, const void *record);
int shim_queue_take(const struct shim_queue *queue, void *record);
int shim_queue_count(const struct shim_queue *queue);

/* Requests of the optical drive; 0, or -1 with errno. */
int shim_is_drive(int fd);
int shim_serve_drive(unsigned long request, void *argument);

/* Calls that do not pass through the functions that this library stands in for. */
int shim_real_open(const char *path, int flags, int mode);
int shim_real_close(int fd);

#endif
