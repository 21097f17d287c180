/* A fresh process that loads a library, asks it one thing, and tells what that took.
   usage: zav_bench_probe [LIBRARY [QUERY]]
   Prints the microseconds of dlopen, and the kilobytes that were resident at most. It is not linked
   with the library, and knows its records alone. */
#include "zav_api.h"

#include <dlfcn.h>
#include <stdio.h>
#include <string.h>
#include <time.h>

static double now(void) {
    struct timespec time;
    clock_gettime(CLOCK_MONOTONIC, &time);
    return (double)time.tv_sec * 1e6 + (double)time.tv_nsec / 1e3;
}

/* ISO C knows no conversion of an object's address to a function's. */
static void find(void *library, const char *name, void *function) {
    void *const address = dlsym(library, name);
    memcpy(function, &address, sizeof address);
}

static int ask_model(void *library) {
    int (*get)(void);
    find(library, "zavGetModel", &get);
    return get() != ZAV_MODEL_SOLVANE_NONE;
}

static int ask_disk(void *library) {
    int (*get)(zavDevice *, zavHddState *);
    zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0};
    zavHddState state;
    find(library, "zavGetStateDisk", &get);
    return get(&disk, &state) == ZAV_RC_OK;
}

static int ask_report(void *library) {
    int (*get)(zavDevice *, sRaidSetInfo *);
    zavDevice unit = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 0x101, 0};
    sRaidSetInfo report;
    find(library, "updateData", &get);
    return get(&unit, &report) == ZAV_RC_OK;
}

static int ask_group(void *library) {
    int (*get)(zavDevice *, zavLVMState *);
    zavDevice group = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0};
    zavLVMState state;
    find(library, "zavgetStateLVMVG", &get);
    return get(&group, &state) == ZAV_RC_OK;
}

static int ask(void *library, const char *query) {
    if (strcmp(query, "zavGetModel") == 0)
        return ask_model(library);
    if (strcmp(query, "zavGetStateDisk") == 0)
        return ask_disk(library);
    if (strcmp(query, "updateData") == 0)
        return ask_report(library);
    return strcmp(query, "zavgetStateLVMVG") == 0 && ask_group(library);
}

/* The peak of this program alone: getrusage begins with what its starter had resident. */
static long peak(void) {
    long kilobytes = 0;
    char line[128];
    FILE *status = fopen("/proc/self/status", "r");
    while (status != NULL && fgets(line, sizeof line, status) != NULL)
        if (sscanf(line, "VmHWM: %ld", &kilobytes) == 1)
            break;
    if (status != NULL)
        fclose(status);
    return kilobytes;
}

int main(int argc, char **argv) {
    const double before = now();
    void *const library = argc > 1 ? dlopen(argv[1], RTLD_NOW) : NULL;
    const double loading = now() - before;
    if (argc > 1 && library == NULL) {
        fprintf(stderr, "%s\n", dlerror());
        return 1;
    }
    if (argc > 2 && !ask(library, argv[2]))
        return 1;
    printf("%.1f %ld\n", argc > 1 ? loading : 0.0, peak());
    return 0;
}
