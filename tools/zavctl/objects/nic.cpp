#include "../system/files.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "../system/run.h"
#include "asking.h"
#include "health_objects.h"
#include "health_surveys.h"

#include <fmt/format.h>

#include <net/if.h>

#include <unistd.h>

#include <cstdlib>

namespace zavctl {

namespace {

constexpr const char *kernel_list = "/sys/class/net";

constexpr VerbHelp list_help = {
    "Ethernet ports and bonds: link and speed",
    "Shown: one line per port or bond that exists, of eth0 to eth3, bond0 and bond1; a bond is "
    "told\n"
    "as its active port is:\n"
    "  up            there is a link                                     ok\n"
    "  down          there is none, but the interface is switched on     warning\n"
    "  down          the interface is switched off: nobody expects a link   ok\n"
    "  not existing  as told, but the kernel has the port                could not tell\n"
    "  unknown       no answer to trust: a speed that the library does not know, such as 2500 or\n"
    "                10000 Mbit/s; a bond whose mode has no active port  could not tell\n"
    "Others that do not exist are left out. All are asked at the same time.",
    "  zavctl nic list\n"
    "  zavctl nic list --json | jq -r '.nics[] | \"\\(.nic) \\(.speed_mbit)\"'",
};

constexpr VerbHelp show_help = {
    "One port or bond, or several, in detail",
    "Shown: link and speed. One that does not exist is critical; states and exit status else are\n"
    "those of 'zavctl nic list'.",
    "  zavctl nic show eth0\n"
    "  zavctl nic show eth0 bond0 --json",
};

bool is_there(const std::string &path) {
    return access(path.c_str(), F_OK) == 0;
}

std::optional<bool> kernel_has(const NicId &id) {
    if (id.bond)
        return is_there("/proc/net/bonding/" + name_of(id));
    if (!is_there(kernel_list))
        return std::nullopt;
    return is_there(fmt::format("{}/{}", kernel_list, name_of(id)));
}

// The flags stand there in hexadecimal.
bool is_switched_off(const NicId &id) {
    const FileFact flags = read_file(fmt::format("{}/{}/flags", kernel_list, name_of(id)));
    return flags.error == 0 && (std::strtoul(flags.text.c_str(), nullptr, 16) & IFF_UP) == 0;
}

Failure nic_failure(const NicId &id, int result) {
    Failure failure = *library::failure_of(result);
    if (result == ZAV_RC_ERR_NIC && id.bond)
        failure.meaning = "its active port is none of eth0 to eth3, or has a speed that the "
                          "library does not know";
    else if (result == ZAV_RC_ERR_NIC)
        failure.meaning = "ethtool tells a speed other than 10, 100 and 1000 Mbit/s, or a link "
                          "that is neither yes nor no";
    else if (result == ZAV_RC_ERR_ENODEV)
        failure.meaning = "the mode of this bond has no active port";
    return failure;
}

NicReport asked(NicReport report) {
    const library::NicAnswer answer = library::nic_state(report.id);
    report.failure.reset();
    if (answer.result != ZAV_RC_OK)
        report.failure = nic_failure(report.id, answer.result);
    report.state = answer.state.state;
    report.speed = answer.state.value;
    report.in_kernel = kernel_has(report.id);
    report.switched_off = is_switched_off(report.id);
    doubt_nic(report, find_tool("/sbin/ethtool").empty());
    return report;
}

Answer list(Session &session) {
    const auto reports = no_reports<NicReport>();
    session.ask(ask_nics(all_nics(), session, reports));
    return {"nic list", "", {nic_list_section(existing(*reports))}};
}

Answer show(Session &session, const std::vector<std::string> &words) {
    const auto ids = ids_of<NicId>(words, nic_id,
                                   "no network port. There are eth0 to eth3, bond0 and bond1; "
                                   "number 1 is eth0");
    const auto reports = no_reports<NicReport>();
    session.ask(ask_nics(ids, session, reports));
    for (NicReport &report : *reports)
        report.asked_for = true;
    return {"nic show", "", {nic_show_section(*reports)}};
}

} // namespace

std::vector<Question> ask_nics(const std::vector<NicId> &nics, const Session &session,
                               const Shared<NicReport> &reports) {
    return questions_of(nics, [&session, &reports](const NicId &id) {
        NicReport begin;
        begin.id = id;
        begin.failure = no_answer(session);
        return question(name_of(id), begin, reports, asked);
    });
}

void add_nic(Command root, Session &session) {
    const Command nic = add_object(root, "nic", "Ethernet ports and bonds: list, show");
    add_list(nic, session, list_help, list);
    add_show<std::string>(nic, session, show_help,
                          {"NAME", "eth0 to eth3, bond0, bond1; or 1 to 4, which are eth0 to eth3"},
                          show);
}

} // namespace zavctl
