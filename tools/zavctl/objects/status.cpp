#include "surveys.h"

#include <iterator>

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "The whole appliance on one screen",
    "Shown: the model, the disks and the arrays with level, members and state, a progress bar\n"
    "while one rebuilds, and one line that sums it up. The words for the states are explained\n"
    "by 'zavctl disk list --help' and 'zavctl array list --help'. Rows begin with a mark:\n"
    "! warning, ? could not tell, X critical.\n"
    "Everything is asked at the same time; an empty slot takes about 20 seconds.",
    "  zavctl status\n"
    "  zavctl status --json | jq -r .summary\n"
    "  zavctl status >/dev/null || echo 'look at this appliance'",
};

struct Asked {
    Shared<DiskReport> disks = std::make_shared<std::vector<DiskReport>>();
    Shared<ArrayReport> arrays = std::make_shared<std::vector<ArrayReport>>();
};

Survey disks_survey(const Machine &machine, const Session &session, const Asked &asked) {
    return {ask_disks(machine, listed_slots(machine, false), session, asked.disks), [asked] {
                Section section = disk_list_section(*asked.disks);
                section.title = "Disks";
                return section;
            }};
}

Survey arrays_survey(const Machine &machine, const Session &session, const Asked &asked) {
    return {ask_arrays(machine, listed_arrays(machine, false), session, asked.arrays), [asked] {
                Section section = array_list_section(*asked.arrays, *asked.disks);
                section.title = "Arrays";
                return section;
            }};
}

// The sections below the heading, from top to bottom.
using MakeSurvey = Survey (*)(const Machine &, const Session &, const Asked &);
constexpr MakeSurvey parts[] = {disks_survey, arrays_survey};

// The model stands in the heading; its section adds its record and its findings.
Section model_part(const Machine &machine) {
    Section section = model_section(machine.model);
    section.details.clear();
    section.well.clear();
    return section;
}

Answer status(Session &session) {
    const Machine machine = read_machine();
    const Asked asked;
    std::vector<Survey> surveys;
    std::vector<Question> questions;
    if (machine.model.known()) {
        for (const MakeSurvey part : parts) {
            surveys.push_back(part(machine, session, asked));
            questions.insert(questions.end(), surveys.back().questions.begin(),
                             surveys.back().questions.end());
        }
    }
    session.ask(questions);
    Answer answer{"status", model_heading(machine.model), {model_part(machine)}};
    for (const Survey &survey : surveys)
        answer.sections.push_back(survey.report());
    return answer;
}

} // namespace

void add_status(CLI::App &root, Session &session) {
    CLI::App *verb = add_verb(root, session, "status", help);
    verb->callback([&session] { session.action = [&session] { return status(session); }; });
}

} // namespace zavctl
