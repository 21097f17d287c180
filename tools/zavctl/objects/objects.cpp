#include "objects.h"

namespace zavctl {

const std::vector<AddObject> &object_table() {
    static const std::vector<AddObject> table = {
        add_status, add_model, add_unit, add_disk,   add_array, add_vg,     add_lv,
        add_pv,     add_bios,  add_name, add_report, add_event, add_doctor,
    };
    return table;
}

} // namespace zavctl
