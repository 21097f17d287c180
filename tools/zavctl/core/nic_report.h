// What the library says about Ethernet ports and bonds, judged and shown.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

struct NicId {
    bool bond = false;
    int number = 1; // as the library counts: 1 is eth0 or bond0
};

// "eth0", "bond1", or "1" to "4", which are eth0 to eth3.
std::optional<NicId> nic_id(std::string_view word);
std::string name_of(const NicId &id);

// All that the library knows, ports first.
const std::vector<NicId> &all_nics();

struct NicReport {
    NicId id;
    int state = 0;                 // ZAV_NET_*
    int speed = 0;                 // Mbit/s, 0 if not told
    std::optional<bool> in_kernel; // the kernel has it; none: the kernel's list is not to be had
    bool switched_off = false;     // ifconfig down: nobody expects a link
    bool asked_for = false;        // by its name
    std::optional<Failure> failure;
    std::string doubt; // why the answer cannot be trusted, "" if it can
};

// What "not existing" is worth where the kernel says otherwise. To be called with every answer.
// `tool_missing`: there is no ethtool.
void doubt_nic(NicReport &nic, bool tool_missing);

// "up", "down", "not existing", "unknown".
std::string link_word(const NicReport &nic);
Severity severity(const NicReport &nic);
std::string speed_text(const NicReport &nic); // "1000 Mbit/s", "-"
std::string nic_note(const NicReport &nic);

Json nic_json(const NicReport &nic);

// Without those that do not exist.
std::vector<NicReport> existing(const std::vector<NicReport> &nics);

Section nic_list_section(const std::vector<NicReport> &nics);
Section nic_show_section(const std::vector<NicReport> &nics);

} // namespace zavctl
