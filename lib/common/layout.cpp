// The records' layout is an interface: the event driver and every caller share it, and it is that
// of the 32-bit x86 target on every build.
#include "zav_api.h"

#include <cstddef>

#define ZAV_SIZE(record, size) static_assert(sizeof(record) == (size), #record)
#define ZAV_AT(record, field, at) static_assert(offsetof(record, field) == (at), #record "." #field)

ZAV_SIZE(zavDevice, 16);
ZAV_AT(zavDevice, type, 0);
ZAV_AT(zavDevice, minor_type, 4);
ZAV_AT(zavDevice, disk, 8);
ZAV_AT(zavDevice, part, 12);

ZAV_SIZE(zavInitState, 8);
ZAV_AT(zavInitState, type, 0);
ZAV_AT(zavInitState, state, 4);

ZAV_SIZE(zavFanState, 16);
ZAV_SIZE(zavThermalState, 16);
ZAV_SIZE(zavVoltageState, 16);
ZAV_AT(zavFanState, type, 0);
ZAV_AT(zavFanState, id, 4);
ZAV_AT(zavFanState, value, 8);
ZAV_AT(zavFanState, state, 12);

ZAV_SIZE(zavSysinfoState, 16);
ZAV_AT(zavSysinfoState, type, 0);
ZAV_AT(zavSysinfoState, id, 4);
ZAV_AT(zavSysinfoState, value, 8);
ZAV_AT(zavSysinfoState, state, 12);

ZAV_SIZE(zavUpsState, 12);
ZAV_AT(zavUpsState, type, 0);
ZAV_AT(zavUpsState, charge, 4);
ZAV_AT(zavUpsState, state, 8);

ZAV_SIZE(zavHddState, 24);
ZAV_AT(zavHddState, type, 0);
ZAV_AT(zavHddState, dev, 4);
ZAV_AT(zavHddState, state, 20);

ZAV_SIZE(zavRaidState, 100);
ZAV_AT(zavRaidState, type, 0);
ZAV_AT(zavRaidState, dev, 4);
ZAV_AT(zavRaidState, state, 20);
ZAV_AT(zavRaidState, raidlevel, 24);
ZAV_AT(zavRaidState, raidcount, 28);
ZAV_AT(zavRaidState, hdddev, 32);
ZAV_AT(zavRaidState, resync, 96);

ZAV_SIZE(lvmPV, 60);
ZAV_AT(lvmPV, lvmtype, 0);
ZAV_AT(lvmPV, lvmdev, 4);
ZAV_AT(lvmPV, size, 20);
ZAV_AT(lvmPV, vgdev, 28);
ZAV_AT(lvmPV, dev, 44);

ZAV_SIZE(lvmLV, 48);
ZAV_AT(lvmLV, lvmtype, 0);
ZAV_AT(lvmLV, lvmdev, 4);
ZAV_AT(lvmLV, size, 20);
ZAV_AT(lvmLV, usage, 28);
ZAV_AT(lvmLV, vgdev, 32);

ZAV_SIZE(lvmVG, 864);
ZAV_AT(lvmVG, lvmtype, 0);
ZAV_AT(lvmVG, lvmdev, 4);
ZAV_AT(lvmVG, size, 20);
ZAV_AT(lvmVG, pvcount, 28);
ZAV_AT(lvmVG, pvdev, 32);
ZAV_AT(lvmVG, lvcount, 572);
ZAV_AT(lvmVG, lvdev, 576);

ZAV_SIZE(lvmDevice, 864);
ZAV_AT(lvmDevice, lvmtype, 0);
ZAV_AT(lvmDevice, lvmvgdev, 0);
ZAV_AT(lvmDevice, lvmpvdev, 0);
ZAV_AT(lvmDevice, lvmlvdev, 0);

ZAV_SIZE(zavLVMState, 872);
ZAV_AT(zavLVMState, type, 0);
ZAV_AT(zavLVMState, dev, 4);
ZAV_AT(zavLVMState, state, 868);

ZAV_SIZE(zavNetState, 28);
ZAV_AT(zavNetState, type, 0);
ZAV_AT(zavNetState, dev, 4);
ZAV_AT(zavNetState, value, 20);
ZAV_AT(zavNetState, state, 24);

ZAV_SIZE(zavMediaInfo, 20);
ZAV_AT(zavMediaInfo, type, 0);
ZAV_AT(zavMediaInfo, discType, 4);
ZAV_AT(zavMediaInfo, discState, 8);
ZAV_AT(zavMediaInfo, discTotalSize, 12);
ZAV_AT(zavMediaInfo, discAvailableSize, 16);

ZAV_SIZE(zavRBODState, 124);
ZAV_AT(zavRBODState, type, 0);
ZAV_AT(zavRBODState, rbod, 4);
ZAV_AT(zavRBODState, id, 108);
ZAV_AT(zavRBODState, value, 112);
ZAV_AT(zavRBODState, state, 116);
ZAV_AT(zavRBODState, priority, 120);

ZAV_SIZE(zavSystemEvent, 872);
ZAV_AT(zavSystemEvent, type, 0);
ZAV_AT(zavSystemEvent, lvm, 0);
ZAV_AT(zavSystemEvent, rbod, 0);

ZAV_AT(zavSystemEventList, event, 0);
ZAV_AT(zavSystemEventList, next, 872);

ZAV_SIZE(zavLEDEvent, 12);
ZAV_AT(zavLEDEvent, priority, 0);
ZAV_AT(zavLEDEvent, ledcode, 4);
ZAV_AT(zavLEDEvent, state, 8);

ZAV_SIZE(sRBODMap, 84);
ZAV_AT(sRBODMap, rbodid, 0);
ZAV_AT(sRBODMap, sasaddr, 4);
ZAV_AT(sRBODMap, sn, 24);
ZAV_AT(sRBODMap, model, 44);

ZAV_SIZE(sExpander, 88);
ZAV_AT(sExpander, iExist, 0);
ZAV_AT(sExpander, id, 4);
ZAV_AT(sExpander, sasaddr, 8);
ZAV_AT(sExpander, parent, 28);
ZAV_AT(sExpander, upperchild, 48);
ZAV_AT(sExpander, lowerchild, 68);

ZAV_SIZE(sRBOD, 104);
ZAV_AT(sRBOD, iExist, 0);
ZAV_AT(sRBOD, id, 4);
ZAV_AT(sRBOD, sasaddr, 8);
ZAV_AT(sRBOD, sn, 28);
ZAV_AT(sRBOD, model, 48);
ZAV_AT(sRBOD, parentid, 92);
ZAV_AT(sRBOD, upperchildid, 96);
ZAV_AT(sRBOD, lowerchildid, 100);

ZAV_SIZE(sRBODSet, 728);

ZAV_SIZE(sPhyDiskInfo, 12);
ZAV_AT(sPhyDiskInfo, disknum, 0);
ZAV_AT(sPhyDiskInfo, disksize, 4);
ZAV_AT(sPhyDiskInfo, status, 8);

ZAV_SIZE(sVolSetInfo, 44);
ZAV_AT(sVolSetInfo, volnum, 0);
ZAV_AT(sVolSetInfo, volname, 4);
ZAV_AT(sVolSetInfo, raidlevel, 24);
ZAV_AT(sVolSetInfo, volsize, 28);
ZAV_AT(sVolSetInfo, scsiId, 32);
ZAV_AT(sVolSetInfo, progress, 36);
ZAV_AT(sVolSetInfo, status, 40);

ZAV_SIZE(sRaidSetInfo, 796);
ZAV_AT(sRaidSetInfo, raidnum, 0);
ZAV_AT(sRaidSetInfo, raidname, 4);
ZAV_AT(sRaidSetInfo, raidsize, 24);
ZAV_AT(sRaidSetInfo, diskcount, 28);
ZAV_AT(sRaidSetInfo, diskmember, 32);
ZAV_AT(sRaidSetInfo, status, 40);
ZAV_AT(sRaidSetInfo, sVolInfo, 44);
ZAV_AT(sRaidSetInfo, sDiskInfo, 748);
