#include "change.h"
#include "disk_verbs.h"
#include "exchange_facts.h"

#include "../system/library.h"
#include "../system/members.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr VerbHelp remove_help = {
    "Takes a disk out of its arrays and out of the machine's sight, to be pulled out",
    "First said: which arrays lose a member, whether they stay redundant, what is torn down, and\n"
    "how long it takes. Then zavctl asks, or, without a terminal, refuses unless --yes is given.\n"
    "While it runs, what is seen of arrays and device is told. In the end arrays and device are\n"
    "looked at: a disk that is still a member, or still there, is critical, whatever the library\n"
    "returned.\n"
    "Refused, with nothing changed (critical): an array would lose data; it is being rebuilt onto\n"
    "another disk; no other disk is healthy; the machine lacks what the commands need. An array\n"
    "without redundancy (RAID0, linear) is destroyed with all volumes on it if --destroy-data\n"
    "is given.\n"
    "Ctrl-C does not stop a change that has begun.",
    "  zavctl disk remove 3 --dry-run\n"
    "  zavctl disk remove 3\n"
    "  zavctl disk remove 3 --yes --json",
};

constexpr VerbHelp add_help = {
    "Brings a new disk into service: IT IS WIPED and joins the arrays",
    "First said: what the disk holds, which arrays it joins, what is created anew, and how long "
    "it\n"
    "takes. Then zavctl asks, or, without a terminal, refuses unless --yes is given. While it "
    "runs,\n"
    "what is seen of arrays and device is told. In the end the arrays are looked at: a disk that\n"
    "did not join an array is critical, whatever the library returned; what to do is said. The\n"
    "rebuild goes on afterwards: 'zavctl array list'.\n"
    "Refused, with nothing changed (critical): the disk is in service, or not healthy; no array\n"
    "lacks a member; the machine lacks what the commands need. A data array that has failed or\n"
    "does not exist is created anew, its volumes erased, if --recreate is given.\n"
    "Ctrl-C does not stop a change that has begun.",
    "  zavctl disk add 3 --dry-run\n"
    "  zavctl disk add 3\n"
    "  zavctl disk add 3 --yes --json",
};

zavDevice device_of_slot(int slot) {
    return {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
}

void refuse_slot(int slot) {
    const ModelReport model = read_model();
    if (model.known() && !model.hardware_raid() && (slot < 1 || slot > model.disk_slots))
        throw UsageError(fmt::format("there is no slot {}; this model has slots 1 to {}", slot,
                                     model.disk_slots));
}

std::function<std::vector<Sight>()> sights_around(int slot) {
    return [slot, names = std::make_shared<NodeNames>()] {
        add_node_names(slot, *names);
        return sights_of(disk_path(slot), *names);
    };
}

Outcome run_removal(const Session &session, const Plan &plan, const ExchangeFacts &facts) {
    const int slot = facts.target.slot;
    const int result = run_change(
        session.streams,
        [slot] {
            const int code = library::remove_disk(device_of_slot(slot));
            if (code == ZAV_RC_OK)
                wait_until_gone(slot); // the library does not
            return code;
        },
        sights_around(slot));
    return removal_outcome(plan, facts, read_aftermath(facts), library::failure_of(result));
}

Answer remove(Session &session, int slot, const ChangeOptions &options, const Consent &consent) {
    refuse_slot(slot);
    const ExchangeFacts facts = removal_facts(session, slot);
    const Plan plan = removal_plan(facts, consent);
    return carry_out(session, plan, options, fmt::format("Remove disk {}?", slot),
                     [&] { return run_removal(session, plan, facts); });
}

// Without a device the library's commands would write into a plain file of its name.
bool attached(const Session &session, const ExchangeFacts &facts) {
    const int slot = facts.target.slot;
    if (facts.target.node_present)
        return true;
    run_change(
        session.streams,
        [slot] {
            const int result = library::attach_disk(device_of_slot(slot));
            wait_for_device(slot);
            return result;
        },
        sights_around(slot));
    return wait_for_device(slot);
}

Outcome nothing_attached(int slot) {
    Outcome outcome;
    outcome.word = "failed";
    outcome.findings = {
        {Severity::critical,
         fmt::format("no disk appeared in slot {}; nothing else was changed", slot)}};
    return outcome;
}

Outcome run_prepared_addition(const Session &session, const Plan &plan,
                              const ExchangeFacts &facts) {
    const int slot = facts.target.slot;
    const int result = run_change(
        session.streams, [slot] { return library::add_disk(device_of_slot(slot)); },
        sights_around(slot));
    return addition_outcome(plan, facts, read_aftermath(facts), library::failure_of(result));
}

// A disk that had to be attached first is looked at once more: it may be in service or failed.
Outcome run_addition(Session &session, const Plan &plan, const ExchangeFacts &facts,
                     const Consent &consent) {
    if (!attached(session, facts))
        return nothing_attached(facts.target.slot);
    if (facts.target.node_present)
        return run_prepared_addition(session, plan, facts);
    const ExchangeFacts now = addition_facts(session, facts.target.slot);
    const Plan plan_now = addition_plan(now, consent);
    if (!plan_now.refused())
        return run_prepared_addition(session, plan_now, now);
    Outcome outcome = refused(plan_now);
    for (const Refusal &refusal : plan_now.refusals)
        outcome.advice.push_back(refusal.text);
    return outcome;
}

Answer add(Session &session, int slot, const ChangeOptions &options, const Consent &consent) {
    refuse_slot(slot);
    const ExchangeFacts facts = addition_facts(session, slot);
    const Plan plan = addition_plan(facts, consent);
    return carry_out(session, plan, options, fmt::format("Wipe disk {} and add it?", slot),
                     [&] { return run_addition(session, plan, facts, consent); });
}

} // namespace

void add_disk_remove(Command disk, Session &session) {
    const auto slot = std::make_shared<int>(0);
    const auto consent = std::make_shared<Consent>();
    const Command verb = add_verb(disk, session, "remove", remove_help);
    verb.add_option("N", *slot, "Number of the slot, from 1").required();
    verb.add_flag("--destroy-data", consent->destroy,
                  "Destroy arrays without redundancy on the disk, with the volumes on them");
    const auto options = add_change_options(verb);
    verb.callback([&session, slot, options, consent] {
        session.action = [&session, slot, options, consent] {
            return remove(session, *slot, *options, *consent);
        };
    });
}

void add_disk_add(Command disk, Session &session) {
    const auto slot = std::make_shared<int>(0);
    const auto consent = std::make_shared<Consent>();
    const Command verb = add_verb(disk, session, "add", add_help);
    verb.add_option("N", *slot, "Number of the slot, from 1").required();
    verb.add_flag("--recreate", consent->recreate,
                  "Create a lost data array anew; what it held is erased");
    const auto options = add_change_options(verb);
    verb.callback([&session, slot, options, consent] {
        session.action = [&session, slot, options, consent] {
            return add(session, *slot, *options, *consent);
        };
    });
}

} // namespace zavctl
