// What the machine is asked about itself besides its storage, and how the answers are gathered.
#pragma once

#include "../core/load_report.h"
#include "../core/nic_report.h"
#include "../core/sensor_report.h"
#include "../core/ups_report.h"
#include "objects.h"

#include <vector>

namespace zavctl {

// Every sensor of the machine; the RAID controller's on its model alone.
std::vector<const Sensor *> listed_sensors(const Machine &machine);

// Adds a question per sensor; the reports begin as "no answer in time".
std::vector<Question> ask_sensors(const std::vector<const Sensor *> &sensors,
                                  const Session &session, const Shared<SensorReport> &reports);

// Adds a question per port or bond; the reports begin as "no answer in time".
std::vector<Question> ask_nics(const std::vector<NicId> &nics, const Session &session,
                               const Shared<NicReport> &reports);

// The question about the UPS: one report.
std::vector<Question> ask_ups(const Session &session, const Shared<UpsReport> &reports);

// A question for each thing that can run out; the processor's takes 10 seconds. The reports begin
// as "no answer in time".
std::vector<Question> ask_load(bool processor, const Session &session,
                               const Shared<LoadReport> &reports);

} // namespace zavctl
