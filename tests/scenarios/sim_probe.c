/* Calls what the preloaded shim stands in for and prints what came of it, one fact a line. */
#include <errno.h>
#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/ioctl.h>
#include <sys/sem.h>
#include <sys/vfs.h>
#include <time.h>
#include <unistd.h>

static int open_device(const char *path) {
    return open(path, O_RDWR | O_EXCL | O_NOCTTY);
}

static const char *verdict(int result) {
    return result >= 0 ? "ok" : strerror(errno);
}

static void print_seconds(double from) {
    struct timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    printf("%.3f\n", (double)now.tv_sec + (double)now.tv_nsec * 1e-9 - from);
}

static double seconds_now(void) {
    struct timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return (double)now.tv_sec + (double)now.tv_nsec * 1e-9;
}

static void probe_sleep(void) {
    const struct timespec one = {1, 0};
    const double start = seconds_now();
    sleep(1);
    usleep(999999);
    nanosleep(&one, NULL);
    clock_nanosleep(CLOCK_MONOTONIC, 0, &one, NULL);
    print_seconds(start);
}

static void probe_exclusive(const char *path) {
    const int first = open_device(path);
    printf("first %s\n", verdict(first));
    printf("second %s\n", verdict(open_device(path)));
    close(first);
    printf("after closing %s\n", verdict(open_device(path)));
}

static void probe_queue(const char *path, size_t size) {
    static unsigned char record[872];
    const int device = open_device(path);
    int put = 0;
    int same = 0;
    printf("empty %s\n", verdict(ioctl(device, 2, record)));
    for (; put < 100; ++put) {
        memset(record, put, size);
        if (ioctl(device, 1, record) != 0)
            break;
    }
    printf("put %d, then %s\n", put, verdict(-1));
    for (int i = 0; i < put; ++i) {
        memset(record, 0xEE, sizeof record);
        same += ioctl(device, 2, record) == 0 && record[0] == i && record[size - 1] == i;
    }
    printf("taken in order %d\n", same);
    printf("then %s\n", verdict(ioctl(device, 2, record)));
}

static void probe_private(void) {
    static unsigned char record[872];
    int count = -1;
    const int device = open_device("/dev/zavevent0");
    const int counted = ioctl(device, 0x20, &count);
    printf("count %s %d\n", verdict(counted), count);
    const int taken = ioctl(device, 0x10, record);
    printf("take %s %d\n", verdict(taken), record[871]);
}

static void print_blocks(int result, unsigned long long blocks, unsigned long long free,
                         unsigned long long available) {
    printf("%s %llu %llu %llu\n", verdict(result), blocks, free, available);
}

static void probe_statfs(const char *path) {
    struct statfs record = {0};
    struct statfs64 record64 = {0};
    int result = statfs(path, &record);
    print_blocks(result, record.f_blocks, record.f_bfree, record.f_bavail);
    result = statfs64(path, &record64);
    print_blocks(result, record64.f_blocks, record64.f_bfree, record64.f_bavail);
    const int fd = open(path, O_RDONLY | O_DIRECTORY);
    result = fstatfs(fd, &record);
    print_blocks(result, record.f_blocks, record.f_bfree, record.f_bavail);
    result = fstatfs64(fd, &record64);
    print_blocks(result, record64.f_blocks, record64.f_bfree, record64.f_bavail);
}

/* The semaphore of the RAID controller's report. */
static int step_semaphore(short direction) {
    struct sembuf operation = {0, direction, SEM_UNDO};
    return semop(semget(0x6912, 1, 0), &operation, 1);
}

/* Holds it from the moment at which the file exists until standard input ends. */
static void probe_hold(const char *file) {
    printf("took %s\n", verdict(step_semaphore(-1)));
    close(open(file, O_WRONLY | O_CREAT, 0600));
    while (getchar() != EOF)
        ;
    printf("gave back %s\n", verdict(step_semaphore(1)));
}

/* Reads a file as the report's readers do. */
static void probe_read(const char *file) {
    char text[8192];
    step_semaphore(-1);
    FILE *in = fopen(file, "r");
    const size_t size = in == NULL ? 0 : fread(text, 1, sizeof text, in);
    fwrite(text, 1, size, stdout);
    step_semaphore(1);
}

int main(int argc, char **argv) {
    const char *what = argc > 1 ? argv[1] : "";
    if (strcmp(what, "sleep") == 0)
        probe_sleep();
    else if (strcmp(what, "exclusive") == 0 && argc == 3)
        probe_exclusive(argv[2]);
    else if (strcmp(what, "queue") == 0 && argc == 4)
        probe_queue(argv[2], (size_t)atoi(argv[3]));
    else if (strcmp(what, "statfs") == 0 && argc == 3)
        probe_statfs(argv[2]);
    else if (strcmp(what, "hold") == 0 && argc == 3)
        probe_hold(argv[2]);
    else if (strcmp(what, "read") == 0 && argc == 3)
        probe_read(argv[2]);
    else if (strcmp(what, "private") == 0)
        probe_private();
    else
        return 2;
    return 0;
}
