/* What the library's own sources share with the kernel and the firmware. Not installed. */
#ifndef ZAV_PRIVATE_H
#define ZAV_PRIVATE_H

#include <stdint.h>
#include <sys/sem.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Control argument of semctl(2), which the caller has to declare. */
union semun {
    int val;
    struct semid_ds *buf;
    unsigned short *array;
    struct seminfo *__buf;
};

/* Header of an SMBIOS structure. */
struct smbios_header {
    uint8_t type;
    uint8_t length; /* of the formatted area, this header included */
    uint16_t handle;
};

#ifdef __cplusplus
}
#endif

#endif
