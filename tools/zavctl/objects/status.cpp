#include "appliance.h"

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "The whole appliance on one screen",
    "Shown: the model; on the hardware-RAID model the expansion units; the disks; the arrays with "
    "level, members and state, a progress bar\n"
    "while one rebuilds; the volume groups with what they lie on; the logical volumes with usage\n"
    "and mount point; the sensors, a line for each kind; the network ports; the UPS if there is "
    "one;\n"
    "memory, swap and file systems, without the processor, whose load 'zavctl load' measures over\n"
    "10 seconds; and one line that sums it up. The words for the states are explained by\n"
    "'zavctl disk list --help' and so on. Rows begin with a mark: ! warning, ? could not tell,\n"
    "X critical.\n"
    "All but the volumes is asked at the same time, then the volumes; an empty slot takes\n"
    "about 20 seconds, an inactive volume about 40.",
    "  zavctl status\n"
    "  zavctl status --json | jq -r .summary\n"
    "  zavctl status >/dev/null || echo 'look at this appliance'",
};

} // namespace

void add_status(Command root, Session &session) {
    const Command verb = add_verb(root, session, "status", help);
    verb.callback(
        [&session] { session.action = [&session] { return ask_appliance(session, "status"); }; });
}

} // namespace zavctl
