#include "objects.h"

#include "../core/name_report.h"
#include "../system/library.h"

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "Turns a device's path into its address, and an address into the path",
    "Arguments: any number of paths and addresses. An address is TYPE MINOR NUMBER [PART]:\n"
    "  hdd  sata | hwsata | iufd | eufd    NUMBER: slot           PART: partition\n"
    "  hdd  sas      raid sas              NUMBER: UNIT:NUMBER    PART: partition\n"
    "  raid sw | hw | iscsi                NUMBER: array          PART: partition\n"
    "  lvm  vg                             NUMBER: group, 0 is PrimaryOSVG\n"
    "  lvm  lv                             NUMBER: volume         PART: its group\n"
    "  nic  eth | bond                     NUMBER: from 1, 1 is eth0 or bond0\n"
    "Without PART it is 0, the whole device. Physical volumes (lvm pv) have no path.\n"
    "Shown: path, address and what they mean. Names are converted, no device is looked for.\n"
    "Could not tell: the library refuses a path or an address.",
    "  zavctl name /dev/sata/disk3p2\n"
    "  zavctl name hdd sata 3 2\n"
    "  zavctl name lvm lv 3 2 /dev/sas/r1disk2 eth0 --json",
};

NameReport converted(const std::string &path) {
    const library::NamedDevice named = library::device_of(path);
    NameReport report{path, {named.device, ""}, library::failure_of(named.result)};
    if (report.failure) {
        report.address.device = {}; // what a refusal leaves in the record means nothing
        report.failure->meaning = "not a name of a device";
    } else {
        report.address.path = path;
    }
    return report;
}

NameReport converted(const zavDevice &device) {
    NameReport report{as_words(device), library::address_of(device),
                      library::failure_of(library::name_result(device))};
    if (report.failure)
        report.failure->meaning = "this address has no path";
    return report;
}

Answer name_answer(const std::vector<NameQuery> &queries) {
    std::vector<NameReport> reports;
    reports.reserve(queries.size());
    for (const NameQuery &query : queries)
        reports.push_back(std::visit([](const auto &value) { return converted(value); }, query));
    return {"name", "", {name_section(reports)}};
}

} // namespace

void add_name(Command root, Session &session) {
    const Command name = add_verb(root, session, "name", help);
    const auto words = std::make_shared<std::vector<std::string>>();
    name.add_option("WORD", *words, "Paths, and addresses TYPE MINOR NUMBER [PART]").required();
    name.callback([&session, words] {
        session.action = [words] {
            try {
                return name_answer(name_queries(*words));
            } catch (const BadWords &bad) {
                throw UsageError(bad.what());
            }
        };
    });
}

} // namespace zavctl
