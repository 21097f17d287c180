#include "objects.h"

#include "health_objects.h"

namespace zavctl {

const std::vector<AddObject> &object_table() {
    static const std::vector<AddObject> table = {
        add_status,  add_model, add_unit, add_disk,   add_array,  add_vg,    add_lv,
        add_pv,      add_bios,  add_name, add_report, add_sensor, add_event, add_watch,
        add_metrics, add_check, add_nic,  add_ups,    add_load,   add_port,  add_led,
        add_uart,    add_sync,  add_disc, add_doctor,
    };
    return table;
}

} // namespace zavctl
