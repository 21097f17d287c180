// What groups and volumes are asked, and how their answers are gathered.
#pragma once

#include "../core/group_report.h"
#include "../core/pv_report.h"
#include "objects.h"

namespace zavctl {

// Groups 0 and 1 if the machine has arrays to put them on, and every group that vgs names or that
// has a directory in /dev.
std::vector<int> listed_groups(const Machine &machine);

// Adds a question per group or volume; the reports begin as "no answer in time".
std::vector<Question> ask_groups(const Machine &machine, const std::vector<int> &numbers,
                                 const Session &session, const Shared<GroupReport> &reports);
std::vector<Question> ask_volumes(const Machine &machine, const std::vector<VolumeId> &ids,
                                  const Session &session, const Shared<VolumeReport> &reports);
std::vector<Question> ask_pvs(const Machine &machine, const std::vector<VolumeId> &ids,
                              const Session &session, const Shared<PvReport> &reports);

// What the groups consist of, as far as the library names it, and how many more there are.
struct Named {
    std::vector<VolumeId> ids;
    int more = 0;
};
Named volumes_of(const std::vector<GroupReport> &groups);
Named pvs_of(const std::vector<GroupReport> &groups);

// Adds what keeps a group from naming its volumes: a short list alone would look well.
void add_findings_of_silent(const std::vector<GroupReport> &groups, Section &section);

} // namespace zavctl
