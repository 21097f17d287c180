// The objects of zavctl. A new one is a file with its add_ function and a line in objects.cpp;
// what it has to say of the whole appliance is a line in the table of appliance.cpp.
#pragma once

#include "../core/model_report.h"
#include "command.h"
#include "session.h"

#include <memory>

#include <vector>

namespace zavctl {

// What is known of the machine before anything is asked about its devices.
struct Machine {
    ModelReport model;
    std::string disk_doubt;          // why answers about disks cannot be trusted, "" if they can
    std::string array_doubt;         // why arrays give no answer, "" if nothing is known of it
    std::string volume_doubt;        // why answers about volumes cannot be trusted, "" if they can
    std::string volume_tool_missing; // the first LVM tool that is not there, "" if all are
};

ModelReport read_model();
Machine read_machine();

// Questions, and the section that shows their answers: called once all are asked.
struct Survey {
    std::vector<Question> questions;
    std::function<Section()> report;
    std::function<std::vector<Question>()> further = nullptr; // asked once those are answered
};

// Reports that a survey fills and others may look at.
template <class Report>
using Shared = std::shared_ptr<std::vector<Report>>;

using AddObject = void (*)(Command root, Session &session);
const std::vector<AddObject> &object_table();

void add_status(Command root, Session &session);
void add_model(Command root, Session &session);
void add_disk(Command root, Session &session);
void add_array(Command root, Session &session);
void add_unit(Command root, Session &session);
void add_report(Command root, Session &session);
void add_vg(Command root, Session &session);
void add_pv(Command root, Session &session);
void add_lv(Command root, Session &session);
void add_bios(Command root, Session &session);
void add_name(Command root, Session &session);
void add_event(Command root, Session &session);
void add_watch(Command root, Session &session);
void add_metrics(Command root, Session &session);
void add_check(Command root, Session &session);
void add_doctor(Command root, Session &session);

} // namespace zavctl
