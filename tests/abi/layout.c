/* Prints the records' layout, so that two builds can be compared. */
#include "zav_api.h"

#include <stddef.h>
#include <stdio.h>

#define SIZE(record) printf("%s %u\n", #record, (unsigned)sizeof(record))
#define AT(record, field) printf("%s.%s %u\n", #record, #field, (unsigned)offsetof(record, field))

int main(void) {
    SIZE(zavDevice);
    AT(zavDevice, part);
    SIZE(zavInitState);
    SIZE(zavFanState);
    SIZE(zavThermalState);
    SIZE(zavVoltageState);
    AT(zavFanState, value);
    SIZE(zavSysinfoState);
    SIZE(zavUpsState);
    SIZE(zavHddState);
    AT(zavHddState, dev);
    AT(zavHddState, state);
    SIZE(zavRaidState);
    AT(zavRaidState, raidlevel);
    AT(zavRaidState, hdddev);
    AT(zavRaidState, resync);
    SIZE(lvmPV);
    AT(lvmPV, size);
    AT(lvmPV, vgdev);
    AT(lvmPV, dev);
    SIZE(lvmLV);
    AT(lvmLV, size);
    AT(lvmLV, usage);
    AT(lvmLV, vgdev);
    SIZE(lvmVG);
    AT(lvmVG, size);
    AT(lvmVG, pvcount);
    AT(lvmVG, pvdev);
    AT(lvmVG, lvcount);
    AT(lvmVG, lvdev);
    SIZE(lvmDevice);
    SIZE(zavLVMState);
    AT(zavLVMState, dev);
    AT(zavLVMState, state);
    SIZE(zavNetState);
    SIZE(zavMediaInfo);
    SIZE(zavRBODState);
    AT(zavRBODState, rbod);
    AT(zavRBODState, id);
    AT(zavRBODState, priority);
    SIZE(zavSystemEvent);
    AT(zavSystemEventList, next);
    SIZE(zavLEDEvent);
    SIZE(sRBODMap);
    AT(sRBODMap, model);
    SIZE(sExpander);
    AT(sExpander, lowerchild);
    SIZE(sRBOD);
    AT(sRBOD, parentid);
    SIZE(sRBODSet);
    SIZE(sPhyDiskInfo);
    SIZE(sVolSetInfo);
    AT(sVolSetInfo, raidlevel);
    SIZE(sRaidSetInfo);
    AT(sRaidSetInfo, raidsize);
    AT(sRaidSetInfo, status);
    AT(sRaidSetInfo, sVolInfo);
    AT(sRaidSetInfo, sDiskInfo);
    return 0;
}
