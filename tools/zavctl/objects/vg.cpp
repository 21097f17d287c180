#include "asking.h"
#include "group_verbs.h"
#include "volume_surveys.h"

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "The volume groups: state, size, what they lie on",
    "Shown: one line per group with its state, size, number of logical volumes, and the disks or\n"
    "arrays that it lies on:\n"
    "  normal    answers, all its volumes are active                     ok\n"
    "  inactive  answers, but a volume is not active                     warning\n"
    "  missing   there is no such group, where the machine should have one   warning\n"
    "  failed    it is known, but does not answer                        critical\n"
    "  unknown   the library or its tools give no answer to trust        could not tell\n"
    "Group 0 is PrimaryOSVG, group N is DataVGN. Listed are groups 0 and 1 of a machine that has\n"
    "arrays, and every other group of these names. A size '<4 GB' is below 4 GB of 2^30 bytes and\n"
    "not below 3. A volume without a device is looked for 20 seconds.",
    "  zavctl vg list\n"
    "  zavctl vg list --jsonl | jq -r 'select(.severity != \"ok\") | .name'",
};

constexpr VerbHelp show_help = {
    "One volume group, or several, in detail",
    "Shown: state, size, physical volumes with what they lie on, logical volumes. States and exit\n"
    "status are those of 'zavctl vg list'.",
    "  zavctl vg show 1\n"
    "  zavctl vg show 0 1 --json",
};

Answer group_answer(Session &session, const Machine &machine, const std::vector<int> &numbers,
                    const char *command) {
    const auto reports = no_reports<GroupReport>();
    session.ask(ask_groups(machine, numbers, session, reports));
    const bool list = std::string(command) == "vg list";
    return {command, "", {list ? group_list_section(*reports) : group_show_section(*reports)}};
}

} // namespace

void add_vg(Command root, Session &session) {
    const Command vg = add_object(root, "vg", "The volume groups: list, show, add, remove");
    add_list(vg, session, list_help, [](Session &asking) {
        const Machine machine = read_machine();
        return group_answer(asking, machine, listed_groups(machine), "vg list");
    });
    add_show<int>(vg, session, show_help, {"N", "Number of the group, 0 is PrimaryOSVG"},
                  [](Session &asking, const std::vector<int> &numbers) {
                      return group_answer(asking, read_machine(), numbers, "vg show");
                  })
        .not_negative();
    add_vg_add(vg, session);
    add_vg_remove(vg, session);
}

} // namespace zavctl
