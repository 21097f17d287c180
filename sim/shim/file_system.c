/* statfs on the appliance's mounted volumes. No user may mount in the private root: the volumes
 * are plain directories, whose numbers the model writes to a list, one mount point a line. */
#include "shim.h"

#include <dlfcn.h>
#include <limits.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/vfs.h>
#include <unistd.h>

struct numbers {
    unsigned long block_size;
    unsigned long long blocks;
    unsigned long long free;
    unsigned long long available;
};

enum { list_size = 16384, file_system_type = 0xEF53 };

static int (*real_statfs)(const char *, struct statfs *);
static int (*real_statfs64)(const char *, struct statfs64 *);
static int (*real_fstatfs)(int, struct statfs *);
static int (*real_fstatfs64)(int, struct statfs64 *);

/* C has no cast from an object's address to a function's, POSIX promises that they fit. */
static void find(const char *name, void *function, size_t size) {
    void *symbol = dlsym(RTLD_NEXT, name);
    memcpy(function, &symbol, size);
}

__attribute__((constructor)) static void prepare_file_systems(void) {
    find("statfs", &real_statfs, sizeof real_statfs);
    find("statfs64", &real_statfs64, sizeof real_statfs64);
    find("fstatfs", &real_fstatfs, sizeof real_fstatfs);
    find("fstatfs64", &real_fstatfs64, sizeof real_fstatfs64);
}

static int lies_below(const char *path, const char *directory) {
    const size_t length = strlen(directory);
    return strncmp(path, directory, length) == 0 && (path[length] == '\0' || path[length] == '/');
}

/* Reads the whole list at once: it is replaced, never changed. */
static int read_list(char *text) {
    const int fd = shim_real_open("/run/zavsim/file-systems", 0, 0);
    if (fd < 0)
        return 0;
    const ssize_t length = read(fd, text, list_size - 1);
    shim_real_close(fd);
    text[length > 0 ? length : 0] = '\0';
    return length > 0;
}

static int find_numbers(const char *path, struct numbers *numbers) {
    char text[list_size];
    char *rest = NULL;
    if (!read_list(text))
        return 0;
    for (char *line = strtok_r(text, "\n", &rest); line != NULL;
         line = strtok_r(NULL, "\n", &rest)) {
        char *values = strchr(line, ' ');
        if (values == NULL)
            continue;
        *values = '\0';
        if (lies_below(path, line))
            return sscanf(values + 1, "%lu %llu %llu %llu", &numbers->block_size, &numbers->blocks,
                          &numbers->free, &numbers->available) == 4;
    }
    return 0;
}

static int numbers_of_path(const char *path, struct numbers *numbers) {
    char whole[PATH_MAX];
    return realpath(path, whole) != NULL && find_numbers(whole, numbers);
}

static int numbers_of_fd(int fd, struct numbers *numbers) {
    char link[64];
    char whole[PATH_MAX];
    snprintf(link, sizeof link, "/run/zavsim/proc/self/fd/%d", fd);
    const ssize_t length = readlink(link, whole, sizeof whole - 1);
    if (length <= 0)
        return 0;
    whole[length] = '\0';
    return find_numbers(whole, numbers);
}

/* The same fields in records of two sizes. */
#define FILL(record, numbers)                                                                      \
    do {                                                                                           \
        (record)->f_type = file_system_type;                                                       \
        (record)->f_bsize = (__typeof__((record)->f_bsize))(numbers).block_size;                   \
        (record)->f_frsize = (__typeof__((record)->f_frsize))(numbers).block_size;                 \
        (record)->f_blocks = (__typeof__((record)->f_blocks))(numbers).blocks;                     \
        (record)->f_bfree = (__typeof__((record)->f_bfree))(numbers).free;                         \
        (record)->f_bavail = (__typeof__((record)->f_bavail))(numbers).available;                  \
    } while (0)

SHIM_EXPORT int statfs(const char *path, struct statfs *record) {
    struct numbers numbers;
    if (real_statfs == NULL)
        prepare_file_systems();
    const int result = real_statfs(path, record);
    if (result == 0 && numbers_of_path(path, &numbers))
        FILL(record, numbers);
    return result;
}

SHIM_EXPORT int statfs64(const char *path, struct statfs64 *record) {
    struct numbers numbers;
    if (real_statfs64 == NULL)
        prepare_file_systems();
    const int result = real_statfs64(path, record);
    if (result == 0 && numbers_of_path(path, &numbers))
        FILL(record, numbers);
    return result;
}

SHIM_EXPORT int fstatfs(int fd, struct statfs *record) {
    struct numbers numbers;
    if (real_fstatfs == NULL)
        prepare_file_systems();
    const int result = real_fstatfs(fd, record);
    if (result == 0 && numbers_of_fd(fd, &numbers))
        FILL(record, numbers);
    return result;
}

SHIM_EXPORT int fstatfs64(int fd, struct statfs64 *record) {
    struct numbers numbers;
    if (real_fstatfs64 == NULL)
        prepare_file_systems();
    const int result = real_fstatfs64(fd, record);
    if (result == 0 && numbers_of_fd(fd, &numbers))
        FILL(record, numbers);
    return result;
}
