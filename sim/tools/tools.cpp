#include "tools/tools.hpp"

#include "model/json.hpp"
#include "root/clock.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <set>

namespace zavsim {

namespace {

// What the library runs on the appliance; a host's own program by that name would act on the
// host's hardware or answer from it.
const std::set<std::string> appliance_tools = {
    "mdadm",       "mdmon",    "smartctl",  "sfdisk",    "udevinfo",    "udevadm",
    "ethtool",     "cdrecord", "wodim",     "growisofs", "mkisofs",     "genisoimage",
    "pktsetup",    "mkudffs",  "cdrwtool",  "mknod",     "syncConf.sh", "query_sas.sh",
    "hbqSetup.sh", "apcupsd",  "apcaccess", "lvm",       "eject",       "zavsim",
    "sh",          "fsadm",    "lvmconfig", "lvmdump",   "lvmdiskscan", "lvmpolld"};

bool starts_with(const std::string &name, const char *beginning) {
    return name.rfind(beginning, 0) == 0;
}

bool is_volume_tool(const std::string &name) {
    static const std::set<std::string> verbs = {
        "s",      "change",  "create", "display", "remove", "extend", "scan",  "resize", "rename",
        "reduce", "convert", "move",   "ck",      "export", "import", "merge", "split",  "mknodes"};
    const bool noun = starts_with(name, "vg") || starts_with(name, "lv") || starts_with(name, "pv");
    return noun && (verbs.count(name.substr(2)) != 0 || starts_with(name, "vgcfg") ||
                    starts_with(name, "vgimport"));
}

struct Present {
    ToolFault fault;
    double time_scale;
};

Present present_fault(const std::string &tool) {
    Turn turn;
    for (const ToolFault &fault : turn.state().faults)
        if (fault.tool == tool)
            return {fault, turn.state().time_scale};
    return {{}, turn.state().time_scale};
}

} // namespace

const std::vector<Tool> &simulated_tools() {
    static const std::vector<Tool> tools = {
        {"mdadm", "/usr/sbin/mdadm", run_mdadm},
        {"smartctl", "/usr/sbin/smartctl", run_smartctl},
        {"mknod", "/usr/bin/mknod", run_mknod},
        {"vgs", "/usr/sbin/vgs", run_vgs},
        {"lvs", "/usr/sbin/lvs", run_lvs},
        {"pvs", "/usr/sbin/pvs", run_pvs},
        {"vgdisplay", "/usr/sbin/vgdisplay", run_vgdisplay},
        {"lvdisplay", "/usr/sbin/lvdisplay", run_lvdisplay},
        {"pvdisplay", "/usr/sbin/pvdisplay", run_pvdisplay},
        {"vgcfgbackup", "/usr/sbin/vgcfgbackup", run_vgcfgbackup},
        {"pvcreate", "/usr/sbin/pvcreate", run_pvcreate},
        {"pvremove", "/usr/sbin/pvremove", run_pvremove},
        {"vgcreate", "/usr/sbin/vgcreate", run_vgcreate},
        {"vgextend", "/usr/sbin/vgextend", run_vgextend},
        {"vgremove", "/usr/sbin/vgremove", run_vgremove},
        {"vgchange", "/usr/sbin/vgchange", run_vgchange},
        {"lvcreate", "/usr/sbin/lvcreate", run_lvcreate},
        {"lvremove", "/usr/sbin/lvremove", run_lvremove},
        {"lvchange", "/usr/sbin/lvchange", run_lvchange},
        {"udevinfo", "/usr/bin/udevinfo", run_udevinfo},
        {"sfdisk", "/usr/sbin/sfdisk", run_sfdisk},
        {"dd", "/usr/bin/dd", run_dd},
        {"df", "/usr/bin/df", run_df},
        {"mount", "/usr/bin/mount", run_mount},
        {"umount", "/usr/bin/umount", run_umount},
        {"mkfs.ext4", "/usr/sbin/mkfs.ext4", run_mkfs},
        {"hbqSetup.sh", "/usr/bin/hbqSetup.sh", run_setup_script},
        {"query_sas.sh", "/usr/bin/query_sas.sh", run_query_sas},
        {"ethtool", "/usr/sbin/ethtool", run_ethtool},
        {"dvd+rw-mediainfo", "/usr/bin/dvd+rw-mediainfo", run_mediainfo},
        {"cdrecord", "/usr/bin/cdrecord", run_cdrecord},
        {"mkisofs", "/usr/bin/mkisofs", run_mkisofs},
        {"growisofs", "/usr/bin/growisofs", run_growisofs},
        {"dvd+rw-format", "/usr/bin/dvd+rw-format", run_dvd_format},
        {"pktsetup", "/usr/sbin/pktsetup", run_pktsetup},
        {"mkudffs", "/usr/sbin/mkudffs", run_mkudffs},
        {"cdrwtool", "/usr/bin/cdrwtool", run_cdrwtool},
        {"killall", "/usr/bin/killall", run_killall},
        {"du", "/usr/bin/du", run_du}};
    return tools;
}

const Tool *find_tool(const std::string &name) {
    for (const Tool &tool : simulated_tools())
        if (name == tool.name)
            return &tool;
    return nullptr;
}

int run_tool(const Tool &tool, int argc, char **argv) {
    const auto [fault, time_scale] = present_fault(tool.name);
    if (fault.hangs > 0)
        sleep_unscaled(fault.hangs / time_scale);
    if (fault.prints)
        fmt::print("{}", *fault.prints);
    if (fault.prints || fault.exits)
        return fault.exits.value_or(0);
    return tool.run(std::vector<std::string>(argv + 1, argv + argc));
}

bool hidden_from_host(const std::string &name) {
    return appliance_tools.count(name) != 0 || is_volume_tool(name) ||
           starts_with(name, "dvd+rw-") || starts_with(name, "dvd-r");
}

bool is_inner_command(const std::string &word) {
    return word == "act" || word == "state";
}

int run_inner_command(int argc, char **argv) {
    const std::vector<std::string> words(argv + 2, argv + argc);
    return std::string(argv[1]) == "act" ? run_act(words) : run_state(words);
}

} // namespace zavsim
