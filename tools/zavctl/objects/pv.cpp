#include "asking.h"
#include "volume_surveys.h"

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "The physical volumes: state, size, the disk or array under each",
    "Shown: one line per physical volume with its state, size, group, and what it lies on:\n"
    "  normal   what it lies on works, and LVM finds it there           ok\n"
    "  failed   the disk or array under it has failed, or LVM does not find it   critical\n"
    "  missing  the array under it does not exist                       critical\n"
    "  unknown  the library or its tools give no answer to trust        could not tell\n"
    "Physical volume 1-2 is the second of DataVG1. An array that is degraded or rebuilding serves\n"
    "its physical volume well.",
    "  zavctl pv list\n"
    "  zavctl pv list --jsonl | jq -r '.device.path'",
};

constexpr VerbHelp show_help = {
    "One physical volume, or several, in detail",
    "Shown: state, group, size, what it lies on. States and exit status are those of\n"
    "'zavctl pv list'.",
    "  zavctl pv show 1-1\n"
    "  zavctl pv show 0-1 1-1 --json",
};

// Physical volumes have no paths.
std::optional<VolumeId> pv_id(const std::string &word) {
    return word.starts_with("/") ? std::nullopt : volume_id(word);
}

Answer list(Session &session) {
    const Machine machine = read_machine();
    const auto groups = no_reports<GroupReport>();
    session.ask(ask_groups(machine, listed_groups(machine), session, groups));
    const auto pvs = no_reports<PvReport>();
    const Named named = pvs_of(*groups);
    session.ask(ask_pvs(machine, named.ids, session, pvs));
    Section section = pv_list_section(*pvs, named.more);
    add_findings_of_silent(*groups, section);
    return {"pv list", "", {std::move(section)}};
}

Answer show(Session &session, const std::vector<std::string> &words) {
    const auto ids = ids_of<VolumeId>(
        words, pv_id, "no physical volume. They are named like 1-1: group, and number from 1");
    const auto pvs = no_reports<PvReport>();
    session.ask(ask_pvs(read_machine(), ids, session, pvs));
    return {"pv show", "", {pv_show_section(*pvs)}};
}

} // namespace

void add_pv(Command root, Session &session) {
    const Command pv = add_object(root, "pv", "The physical volumes: list, show");
    add_list(pv, session, list_help, list);
    add_show<std::string>(pv, session, show_help, {"VOLUME", "GROUP-NUMBER"}, show);
}

} // namespace zavctl
