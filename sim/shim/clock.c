/* Sleeps last 1/N of their time on an appliance whose clock runs N times as fast. */
#include "shim.h"

#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <stdlib.h>
#include <string.h>
#include <time.h>
#include <unistd.h>

static double time_scale = 1.0;
static int (*real_clock_nanosleep)(clockid_t, int, const struct timespec *, struct timespec *);

__attribute__((constructor)) static void prepare_clock(void) {
    /* C has no cast from an object's address to a function's, POSIX promises that they fit. */
    void *symbol = dlsym(RTLD_NEXT, "clock_nanosleep");
    memcpy(&real_clock_nanosleep, &symbol, sizeof symbol);
    const char *text = getenv("ZAVSIM_TIME_SCALE");
    const double scale = text == NULL ? 1.0 : strtod(text, NULL);
    time_scale = scale > 0.0 ? scale : 1.0;
}

static double seconds_of(const struct timespec *time) {
    return (double)time->tv_sec + (double)time->tv_nsec * 1e-9;
}

static struct timespec timespec_of(double seconds) {
    struct timespec time;
    time.tv_sec = (time_t)seconds;
    time.tv_nsec = (long)((seconds - (double)time.tv_sec) * 1e9);
    return time;
}

static int real_sleep(clockid_t clock, int flags, const struct timespec *asked,
                      struct timespec *left) {
    if (real_clock_nanosleep == NULL) /* another library sleeps while it is loaded */
        prepare_clock();
    return real_clock_nanosleep(clock, flags, asked, left);
}

static int is_valid(const struct timespec *time) {
    return time != NULL && time->tv_sec >= 0 && time->tv_nsec >= 0 && time->tv_nsec < 1000000000L;
}

static int a_command_waits(void) {
    char text[5] = "";
    const int file = shim_real_open("/proc/scsi/scsi", O_RDONLY | O_CLOEXEC, 0);
    if (file < 0)
        return 0;
    const ssize_t length = read(file, text, sizeof text);
    shim_real_close(file);
    return length == (ssize_t)sizeof text && memcmp(text, "scsi ", sizeof text) == 0;
}

/* A kernel carries a command out while it is being written, the simulated one some moments later.
 * When time runs faster, whoever sleeps until the disk has come would be too early. */
static void wait_for_kernel(void) {
    const struct timespec moment = {0, 2000000L};
    for (int patience = 5000; patience > 0 && a_command_waits(); --patience)
        real_sleep(CLOCK_REALTIME, 0, &moment, NULL);
}

SHIM_EXPORT int clock_nanosleep(clockid_t clock, int flags, const struct timespec *asked,
                                struct timespec *left) {
    if ((flags & TIMER_ABSTIME) != 0 || !is_valid(asked))
        return real_sleep(clock, flags, asked, left);
    const struct timespec shortened = timespec_of(seconds_of(asked) / time_scale);
    struct timespec rest = {0, 0};
    const int error = real_sleep(clock, flags, &shortened, &rest);
    if (error == EINTR && left != NULL)
        *left = timespec_of(seconds_of(&rest) * time_scale);
    if (error == 0)
        wait_for_kernel();
    return error;
}

SHIM_EXPORT int nanosleep(const struct timespec *asked, struct timespec *left) {
    const int error = clock_nanosleep(CLOCK_REALTIME, 0, asked, left);
    if (error == 0)
        return 0;
    errno = error;
    return -1;
}

SHIM_EXPORT unsigned int sleep(unsigned int seconds) {
    const struct timespec asked = {(time_t)seconds, 0};
    struct timespec left = {0, 0};
    if (nanosleep(&asked, &left) == 0)
        return 0;
    return (unsigned int)left.tv_sec + (left.tv_nsec > 0 ? 1U : 0U);
}

SHIM_EXPORT int usleep(useconds_t microseconds) {
    const struct timespec asked = {(time_t)(microseconds / 1000000U),
                                   (long)(microseconds % 1000000U) * 1000L};
    return nanosleep(&asked, NULL);
}
