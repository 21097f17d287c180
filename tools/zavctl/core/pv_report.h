// What the library says about one physical volume, judged and shown.
#pragma once

#include "answer.h"
#include "volume_report.h"

namespace zavctl {

struct PvReport {
    VolumeId id;            // group and number, as for a logical volume
    Address address;        // has no path: physical volumes are named by what they lie on
    int state = 0;          // ZAV_LVM_* bits
    std::uint64_t size = 0; // as the library gives it, see shown_size(); 0 if not told
    Address device;         // the disk or array under it; disk 0 if that has no address
    std::string doubt;      // why the answer cannot be trusted, "" if it can
    std::optional<zavSystemEvent> record{}; // as the library answered it
    std::optional<Failure> failure;
};

// "normal", "failed", "not_exist", "unknown".
std::string pv_state_word(const PvReport &pv);

Severity severity(const PvReport &pv);
std::string shown_state(const PvReport &pv);
std::string pv_note(const PvReport &pv);

Json pv_json(const PvReport &pv);

// `more` physical volumes exist that the library does not name.
Section pv_list_section(const std::vector<PvReport> &pvs, int more);
Section pv_show_section(const std::vector<PvReport> &pvs);

} // namespace zavctl
