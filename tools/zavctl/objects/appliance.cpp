#include "appliance.h"

#include "asking.h"
#include "health_surveys.h"
#include "surveys.h"
#include "volume_surveys.h"

#include "../core/unit_tree.h"

namespace zavctl {

namespace {

struct Asked {
    Processor processor = Processor::left_out;
    SharedCascade cascade{};
    Shared<DiskReport> disks = no_reports<DiskReport>();
    Shared<ArrayReport> arrays = no_reports<ArrayReport>();
    Shared<GroupReport> groups = no_reports<GroupReport>();
    Shared<VolumeReport> volumes = no_reports<VolumeReport>();
    Shared<PvReport> pvs = no_reports<PvReport>();
    Shared<SensorReport> sensors = no_reports<SensorReport>();
    Shared<NicReport> nics = no_reports<NicReport>();
    Shared<UpsReport> ups = no_reports<UpsReport>();
    Shared<LoadReport> load = no_reports<LoadReport>();
};

// A survey of disks or arrays. Behind a RAID controller it is not known what to ask before the
// cascade has answered.
Survey survey_of(const Machine &machine, std::function<std::vector<Question>()> ask,
                 std::function<Section()> report) {
    if (machine.model.hardware_raid())
        return {{}, std::move(report), std::move(ask)};
    return {ask(), std::move(report)};
}

Survey disks_survey(const Machine &machine, const Session &session, const Asked &asked) {
    const auto ask = [&machine, &session, asked] {
        return ask_disks(machine, listed_disks(machine, *asked.cascade, false), session,
                         asked.disks);
    };
    return survey_of(machine, ask, [asked] {
        Section section = disk_list_section(*asked.disks);
        section.title = "Disks";
        return section;
    });
}

Survey arrays_survey(const Machine &machine, const Session &session, const Asked &asked) {
    const auto ask = [&machine, &session, asked] {
        return ask_arrays(machine, listed_arrays(machine, *asked.cascade, false), session,
                          asked.arrays);
    };
    return survey_of(machine, ask, [asked] {
        Section section = array_list_section(*asked.arrays, *asked.disks);
        section.title = "Arrays";
        return section;
    });
}

// A table without rows is no section of the screen; its records are.
Section titled(Section section, const char *title) {
    if (section.records.empty()) {
        section.table = Table();
        section.well.clear();
    } else {
        section.title = title;
    }
    return section;
}

Survey units_survey(const Machine &machine, const Session &session, const Asked &asked) {
    if (!machine.model.hardware_raid())
        return {{}, [] { return Section(); }};
    return {ask_cascade(machine, asked.cascade),
            [asked] { return titled(unit_list_section(*asked.cascade), "Expansion units"); },
            [&session, asked] { return ask_sensors(session, asked.cascade); }};
}

Survey groups_survey(const Machine &machine, const Session &session, const Asked &asked) {
    return {ask_groups(machine, listed_groups(machine), session, asked.groups),
            [asked] { return titled(group_list_section(*asked.groups), "Volume groups"); }};
}

Survey volumes_survey(const Machine &machine, const Session &session, const Asked &asked) {
    return {{},
            [asked] {
                return titled(volume_list_section(*asked.volumes, volumes_of(*asked.groups).more),
                              "Logical volumes");
            },
            [&machine, &session, asked] {
                return ask_volumes(machine, volumes_of(*asked.groups).ids, session, asked.volumes);
            }};
}

Survey pvs_survey(const Machine &machine, const Session &session, const Asked &asked) {
    return {{},
            [asked] {
                return titled(pv_list_section(*asked.pvs, pvs_of(*asked.groups).more),
                              "Physical volumes");
            },
            [&machine, &session, asked] {
                return ask_pvs(machine, pvs_of(*asked.groups).ids, session, asked.pvs);
            }};
}

Survey sensors_survey(const Machine &machine, const Session &session, const Asked &asked) {
    return {ask_sensors(listed_sensors(machine), session, asked.sensors),
            [asked] { return titled(sensor_overview_section(*asked.sensors), "Sensors"); }};
}

Survey nics_survey(const Machine & /*all have some*/, const Session &session, const Asked &asked) {
    return {ask_nics(all_nics(), session, asked.nics),
            [asked] { return titled(nic_list_section(existing(*asked.nics)), "Network"); }};
}

Survey ups_survey(const Machine & /*any may have one*/, const Session &session,
                  const Asked &asked) {
    return {ask_ups(session, asked.ups), [asked] {
                Section section = ups_overview_section(asked.ups->front());
                section.title = section.table.empty() ? "" : "UPS";
                return section;
            }};
}

Survey load_survey(const Machine & /*every one*/, const Session &session, const Asked &asked) {
    return {ask_load(asked.processor == Processor::measured, session, asked.load),
            [asked] { return titled(load_overview_section(*asked.load), "Load"); }};
}

// The sections below the heading, from top to bottom. What else the appliance has to say is a row
// here: `status`, `watch`, `metrics` and `check` then have it, too.
using MakeSurvey = Survey (*)(const Machine &, const Session &, const Asked &);
constexpr MakeSurvey parts[] = {units_survey, disks_survey,   arrays_survey,  groups_survey,
                                pvs_survey,   volumes_survey, sensors_survey, nics_survey,
                                ups_survey,   load_survey};

// The model stands in the heading; its section adds its record and its findings.
Section model_part(const Machine &machine) {
    Section section = model_section(machine.model);
    section.details.clear();
    section.well.clear();
    return section;
}

std::vector<Survey> surveys_of(const Machine &machine, const Session &session,
                               Processor processor) {
    const Asked asked{processor, begin_cascade(machine, session)};
    std::vector<Survey> surveys;
    if (machine.model.known())
        for (const MakeSurvey part : parts)
            surveys.push_back(part(machine, session, asked));
    return surveys;
}

void append(std::vector<Question> &all, const std::vector<Question> &more) {
    all.insert(all.end(), more.begin(), more.end());
}

// Everything that can be asked at once, then what only the answers made known.
void ask(Session &session, const std::vector<Survey> &surveys) {
    std::vector<Question> questions;
    for (const Survey &survey : surveys)
        append(questions, survey.questions);
    session.ask(questions);
    questions.clear();
    for (const Survey &survey : surveys)
        if (survey.further)
            append(questions, survey.further());
    session.ask(questions);
}

} // namespace

Answer ask_appliance(Session &session, const std::string &command, Processor processor) {
    const Machine machine = read_machine();
    const std::vector<Survey> surveys = surveys_of(machine, session, processor);
    ask(session, surveys);
    Answer answer{command, model_heading(machine.model), {model_part(machine)}};
    for (const Survey &survey : surveys)
        answer.sections.push_back(survey.report());
    return answer;
}

} // namespace zavctl
