// The RAID controller and its expansion units: asked before the disks and arrays in them can be.
#pragma once

#include "../core/unit_report.h"
#include "objects.h"

#include <memory>
#include <string>
#include <vector>

namespace zavctl {

// The report that the controller's agent writes, and the script that tells the cascade.
constexpr const char *controller_report = "/etc/Kiru/zav/.raidinfo";
constexpr const char *cascade_script = "/usr/bin/query_sas.sh";

using SharedCascade = std::shared_ptr<CascadeReport>;

// Which units there are and what the report says of every enclosure. Nothing is asked of a model
// without a RAID controller.
SharedCascade begin_cascade(const Machine &machine, const Session &session);
std::vector<Question> ask_cascade(const Machine &machine, const SharedCascade &cascade);

// Temperature, voltage and raw readings of the units present. The cascade must have been asked.
std::vector<Question> ask_sensors(const Session &session, const SharedCascade &cascade);

// Both for an object that shows disks or arrays of the units.
SharedCascade asked_cascade(Session &session, const Machine &machine);

// Refuses what only one kind of model has, such as unit 2 of a machine without a RAID controller.
void refuse_foreign(const Machine &machine, const std::string &word, const zavDevice &device);

} // namespace zavctl
