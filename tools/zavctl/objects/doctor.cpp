#include "objects.h"

#include "../core/disc_checks.h"
#include "../core/driver_checks.h"
#include "../system/disc.h"
#include "../system/drivers.h"
#include "../system/platform.h"

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "Checks everything that the library needs of this system",
    "Shown: one line per precondition with what was found and, where something is missing, what\n"
    "that means for the answers: the shell, the model and its configuration, the tools and what\n"
    "they answer, /proc/mdstat, device names, hot plug, the BIOS device, locks, the log, locale,\n"
    "and what volumes, the exchange of a disk, sensors, LEDs, events, network and, where there is\n"
    "a drive, discs need besides.\n"
    "Warning: some functions or some arrays are affected.\n"
    "Critical: states of disks and arrays cannot be trusted or told.\n"
    "Nothing is changed (a file is made in /etc/Kiru/zav and removed); a tool that does not answer "
    "is given 10 seconds.",
    "  zavctl doctor\n"
    "  zavctl doctor --jsonl | jq -r 'select(.severity != \"ok\") | .check'",
};

} // namespace

void add_doctor(Command root, Session &session) {
    const Command doctor = add_verb(root, session, "doctor", help);
    doctor.callback([&session] {
        session.action = [] {
            std::vector<Check> checks = platform_checks(read_platform(read_model()));
            for (const Check &check : driver_checks(read_drivers()))
                checks.push_back(check);
            for (const Check &check : burner_checks(read_burner_platform()))
                checks.push_back(check);
            return Answer{"doctor", "", {doctor_section(checks)}};
        };
    });
}

} // namespace zavctl
