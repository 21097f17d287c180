// A volume group's metadata.
#include "backup_source.h"
#include "growth.h"
#include "require.h"
#include "texts.h"

namespace bench {

namespace {

Action reading(int physical, int logical, int segments) {
    return [=, text = backup_text(physical, logical, segments)] {
        lvmVG group = {};
        group.pvcount = physical;
        group.lvcount = logical;
        BackupText source(text);
        require(zav::read_backup(source, group) == ZAV_RC_OK && group.lvdev[0].lvmdev.disk == 1 &&
                    group.pvdev[physical - 1].dev.disk == 2,
                "read_backup");
    };
}

} // namespace

std::vector<Growth> growth_of_groups() {
    return {
        {"read_backup: physical volumes",
         "physical volume",
         {1, 2, 3, 4, 5, 6, 7, 8, 9},
         [](int size) { return reading(size, 1, 1); }},
        {"read_backup: segments of one logical volume",
         "segment",
         {1, 10, 100, 1000},
         [](int size) { return reading(1, 1, size); }},
        {"read_backup: logical volumes; six are taken, the rest is read and left out",
         "logical volume",
         {1, 10, 100, 1000},
         [](int size) { return reading(1, size, 1); }},
    };
}

} // namespace bench
