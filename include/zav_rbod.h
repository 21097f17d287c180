/* Expansion units of the hardware-RAID model and their place in the SAS cascade. */
#ifndef ZAV_RBOD_H
#define ZAV_RBOD_H

#ifdef __cplusplus
extern "C" {
#endif

/* Expansion-unit states (zavRBODState.state). */
#define ZAV_RBOD_NORMAL 0x1101
#define ZAV_RBOD_WARN 0x1102
#define ZAV_RBOD_ALARM 0x1103
#define ZAV_RBOD_FAIL 0x1104
#define ZAV_RBOD_NOTEXIST 0x1105
#define ZAV_RBOD_EXIST 0x1106

/* Expansion-unit sensor ids (zavRBODState.id). */
#define ZAV_RBOD_EXPANDER 0x1000
#define ZAV_RBOD_TEMP_CPU 0x1001
#define ZAV_RBOD_VOLT_CPU 0x1002

/* Does the mark on a unit's first volume name this chassis? (zavGetiRBOD) */
#define ZAV_IRBOD_SAME 4608
#define ZAV_IRBOD_UNMARKED 4609 /* the same number as 0x1201 */
#define ZAV_IRBOD_OTHER 4610

/* All strings below are NUL-terminated inside their arrays. */

typedef struct sRBODMap {
    int rbodid;
    char sasaddr[20]; /* SAS address */
    char sn[20];      /* serial number */
    char model[40];
} sRBODMap;

typedef struct sExpander {
    int iExist; /* 1 when present */
    int id;
    char sasaddr[20];
    char parent[20];     /* SAS address of the upstream expander */
    char upperchild[20]; /* SAS addresses of the two downstream expanders */
    char lowerchild[20];
} sExpander;

typedef struct sRBOD {
    int iExist; /* 1 when present */
    int id;     /* unit number */
    char sasaddr[20];
    char sn[20];
    char model[41];
    int parentid; /* unit numbers of the neighbours in the cascade */
    int upperchildid;
    int lowerchildid;
} sRBOD;

typedef struct sRBODSet {
    sRBOD RBOD[7];
} sRBODSet;

#ifdef __cplusplus
}
#endif

#endif
