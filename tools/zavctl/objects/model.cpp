#include "objects.h"

#include "../core/doctor.h"
#include "../system/library.h"
#include "../system/run.h"

namespace zavctl {

namespace {

constexpr std::chrono::seconds shell_limit{10};

constexpr VerbHelp help = {
    "The model of this appliance, its serial number and disk counts",
    "Shown: the model and its code, product name and serial number as the BIOS gives them,\n"
    "the number of disk slots, the number of disks that the arrays are built from, and the\n"
    "RAID type of the data array from /etc/Kiru/raidtype.\n"
    "Warning: no serial number. Could not tell: no known model.",
    "  zavctl model\n"
    "  zavctl model --json | jq -r .model.serial",
};

std::string missing_volume_tool() {
    for (const char *name : {"vgs", "lvs", "pvs", "vgdisplay", "lvdisplay", "pvdisplay"}) {
        std::string path = std::string("/usr/sbin/") + name;
        if (find_tool(path).empty())
            return path;
    }
    return "";
}

} // namespace

ModelReport read_model() {
    ModelReport model;
    const library::ModelConfig config = library::model_config();
    model.code = config.model;
    model.failure = library::failure_of(config.result);
    if (model.known()) {
        model.disk_slots = config.disk_slots;
        model.disk_count = config.disk_count;
    }
    model.data_raid_type = library::data_raid_type();
    model.product_name = library::product_name();
    model.serial = library::serial_number();
    return model;
}

Machine read_machine() {
    Machine machine;
    machine.model = read_model();
    const RunResult shell = run({"/bin/sh", "-c", "false &>/dev/null"}, shell_limit);
    const std::string doubt = shell_doubt(shell);
    machine.volume_doubt =
        doubt.empty() ? "" : "a shell that is not bash: every group reads as there";
    machine.volume_tool_missing = missing_volume_tool();
    if (machine.model.hardware_raid())
        return machine;
    machine.disk_doubt = doubt;
    if (machine.disk_doubt.empty())
        machine.disk_doubt = smartctl_doubt(find_tool("smartctl"));
    if (find_tool("/sbin/mdadm").empty())
        machine.array_doubt = "/sbin/mdadm is missing";
    return machine;
}

void add_model(Command root, Session &session) {
    const Command model = add_verb(root, session, "model", help);
    model.callback([&session] {
        session.action = [] { return Answer{"model", "", {model_section(read_model())}}; };
    });
}

} // namespace zavctl
