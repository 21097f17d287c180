#include "asking.h"
#include "volume_surveys.h"

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "The logical volumes: state, size, usage, mount point",
    "Shown: one line per volume with its state, size, and how full its file system is:\n"
    "  normal    there, and not above 90 % full                          ok\n"
    "  full      above 90 % full                                         warning\n"
    "  inactive  LVM knows it, but it is not active                      warning\n"
    "  failed    its device is there, but LVM does not answer for it     critical\n"
    "  missing   the group names it, but there is no such volume         critical\n"
    "  unknown   the library or its tools give no answer to trust        could not tell\n"
    "A volume is named by its group and number: 1-2 is LogVol2 of DataVG1. The usage of one that\n"
    "is not mounted is not known. A size '<4 GB' is below 4 GB of 2^30 bytes and not below 3. A\n"
    "volume without a device is looked for 20 seconds, once for its group and once for itself.",
    "  zavctl lv list\n"
    "  zavctl lv list --jsonl | jq -r 'select(.usage_percent > 80) | .mount_point'",
};

constexpr VerbHelp show_help = {
    "One logical volume, or several, in detail",
    "Shown: state, size, usage, device, mount point. The volume is asked whatever its group says;\n"
    "states and exit status are those of 'zavctl lv list'.",
    "  zavctl lv show 1-2\n"
    "  zavctl lv show 0-1 /dev/DataVG1/LogVol2 --json",
};

Answer list(Session &session) {
    const Machine machine = read_machine();
    const auto groups = no_reports<GroupReport>();
    session.ask(ask_groups(machine, listed_groups(machine), session, groups));
    const auto volumes = no_reports<VolumeReport>();
    const Named named = volumes_of(*groups);
    session.ask(ask_volumes(machine, named.ids, session, volumes));
    Section section = volume_list_section(*volumes, named.more);
    add_findings_of_silent(*groups, section);
    return {"lv list", "", {std::move(section)}};
}

Answer show(Session &session, const std::vector<std::string> &words) {
    const auto ids = ids_of<VolumeId>(
        words, volume_id, "no logical volume. Volumes are named like 1-2 or /dev/DataVG1/LogVol2");
    const auto volumes = no_reports<VolumeReport>();
    session.ask(ask_volumes(read_machine(), ids, session, volumes));
    return {"lv show", "", {volume_show_section(*volumes)}};
}

} // namespace

void add_lv(Command root, Session &session) {
    const Command lv = add_object(root, "lv", "The logical volumes: list, show");
    add_list(lv, session, list_help, list);
    add_show<std::string>(lv, session, show_help,
                          {"VOLUME", "GROUP-NUMBER, or the path of its device"}, show);
}

} // namespace zavctl
