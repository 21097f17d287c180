#include "volume_surveys.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "The physical volumes: state, size, the disk or array under each",
    "Shown: one line per physical volume with its state, size, group, and what it lies on:\n"
    "  normal   what it lies on works, and LVM finds it there           ok\n"
    "  failed   the disk or array under it has failed, or LVM does not find it   critical\n"
    "  missing  the array under it does not exist                       critical\n"
    "  unknown  the library or its tools give no answer to trust        could not tell\n"
    "Physical volume 1-2 is the second of DataVG1. An array that is degraded or rebuilding serves\n"
    "its physical volume well.",
    "  zavctl pv list\n"
    "  zavctl pv list --jsonl | jq -r '.device.path'",
};

constexpr VerbHelp show_help = {
    "One physical volume, or several, in detail",
    "Shown: state, group, size, what it lies on. States and exit status are those of\n"
    "'zavctl pv list'.",
    "  zavctl pv show 1-1\n"
    "  zavctl pv show 0-1 1-1 --json",
};

std::vector<VolumeId> ids_of(const std::vector<std::string> &words) {
    std::vector<VolumeId> ids;
    for (const std::string &word : words) {
        const std::optional<VolumeId> id = volume_id(word);
        if (!id || word.starts_with("/"))
            throw UsageError(fmt::format("'{}' is no physical volume. They are named like 1-1: "
                                         "group, and number from 1",
                                         printable(word)));
        ids.push_back(*id);
    }
    return ids;
}

Answer list(Session &session) {
    const Machine machine = read_machine();
    const auto groups = std::make_shared<std::vector<GroupReport>>();
    session.ask(ask_groups(machine, listed_groups(machine), session, groups));
    const auto pvs = std::make_shared<std::vector<PvReport>>();
    const Named named = pvs_of(*groups);
    session.ask(ask_pvs(machine, named.ids, session, pvs));
    Section section = pv_list_section(*pvs, named.more);
    add_findings_of_silent(*groups, section);
    return {"pv list", "", {std::move(section)}};
}

Answer show(Session &session, const std::vector<VolumeId> &ids) {
    const auto pvs = std::make_shared<std::vector<PvReport>>();
    session.ask(ask_pvs(read_machine(), ids, session, pvs));
    return {"pv show", "", {pv_show_section(*pvs)}};
}

} // namespace

void add_pv(CLI::App &root, Session &session) {
    CLI::App *pv = add_object(root, "pv", "The physical volumes: list, show");
    add_verb(*pv, session, "list", list_help)->callback([&session] {
        session.action = [&session] { return list(session); };
    });
    const auto words = std::make_shared<std::vector<std::string>>();
    CLI::App *verb = add_verb(*pv, session, "show", show_help);
    verb->add_option("VOLUME", *words, "GROUP-NUMBER")->required();
    verb->callback([&session, words] {
        session.action = [&session, words] { return show(session, ids_of(*words)); };
    });
}

} // namespace zavctl
