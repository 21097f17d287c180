#include "exchange.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *no_array = "no array";

const PartitionFact *partition_with(const std::vector<PartitionFact> &partitions, int number) {
    for (const PartitionFact &partition : partitions)
        if (partition.number == number)
            return &partition;
    return nullptr;
}

const PlanStep *step_for(const Plan &plan, const PartitionFact &partition) {
    for (const PlanStep &step : plan.steps)
        if (step.array != 0 && step.array == partition.array.number)
            return &step;
    return nullptr;
}

void add(Outcome &outcome, Severity severity, const std::string &text) {
    outcome.findings.push_back({severity, text});
}

// Gathers what is not as it was meant to be, and closes with the word for all of it.
class Judge {
  public:
    Judge(const Plan &plan, const ExchangeFacts &before, const Aftermath &after)
        : plan_(plan), before_(before), after_(after) {}

    void removal() {
        for (const PartitionFact &partition : before_.partitions)
            if (const PlanStep *step = step_for(plan_, partition))
                step->does == "destroy" ? destroyed(partition) : taken_out(partition);
        if (after_.node_present)
            add(outcome_, Severity::critical,
                before_.target.address.path + " is still there: the disk was not detached");
        const std::string destroyed = told_arrays("destroy", "");
        outcome_.well = fmt::format("disk {} is out of {}{}; it can be pulled out",
                                    before_.target.slot, told_arrays("take_out", ""),
                                    destroyed == no_array ? "" : ", destroyed: " + destroyed);
    }

    void addition() {
        if (!after_.node_present)
            add(outcome_, Severity::critical, before_.target.address.path + " is not there");
        else
            prepared();
        for (const PartitionFact &partition : before_.partitions)
            if (const PlanStep *step = step_for(plan_, partition))
                if (step->does == "join" || step->does == "recreate")
                    joined(partition, *step);
        advise_addition();
        outcome_.well =
            fmt::format("disk {} is in {}. 'zavctl array list' tells how far the rebuild is",
                        before_.target.slot, told_arrays("join", "recreate"));
    }

    Outcome close(const std::optional<Failure> &failure) {
        outcome_.failure = failure;
        const bool complete = outcome_.findings.empty();
        if (failure)
            add(outcome_, complete ? Severity::warning : Severity::critical,
                (complete ? "all is as planned, but the library reports: " : "the library: ") +
                    in_words(*failure));
        outcome_.word = complete ? "done" : failure ? "failed" : "incomplete";
        return outcome_;
    }

  private:
    void taken_out(const PartitionFact &before) {
        const PartitionFact *after = partition_with(after_.partitions, before.number);
        if (after == nullptr)
            return;
        for (const ArrayMember &member : before.table.members)
            if (member.slot == before_.target.slot || member.slot == 0)
                still_member(before, *after, member);
    }

    // The node's name tells, as the link that named the slot has gone with the disk.
    void still_member(const PartitionFact &before, const PartitionFact &after,
                      const ArrayMember &member) {
        for (const ArrayMember &left : after.table.members) {
            if (left.node != member.node || (member.node.empty() && left.slot != 0))
                continue;
            const std::string name = left.node.empty() ? "its member" : printable(left.node);
            add(outcome_, Severity::critical,
                fmt::format("{} is still {} in {}", name,
                            left.hold == ArrayMember::Hold::faulty ? "a faulty member" : "a member",
                            array_words(before)));
            outcome_.advice.push_back(
                fmt::format("mdadm /dev/{} --remove {}", before.holder,
                            left.hold == ArrayMember::Hold::faulty ? "faulty" : "detached"));
        }
    }

    void destroyed(const PartitionFact &before) {
        const PartitionFact *after = partition_with(after_.partitions, before.number);
        if (after != nullptr && after->holder == before.holder)
            add(outcome_, Severity::critical, array_words(before) + " is still running");
        if (before.group && std::find(after_.groups.begin(), after_.groups.end(),
                                      before.group->number) != after_.groups.end())
            add(outcome_, Severity::critical, before.group->name + " is still there");
    }

    void prepared() {
        if (after_.content.partitions.size() < before_.partitions.size())
            add(outcome_, Severity::critical,
                fmt::format("the disk has {} partitions, disk {} has {}: its table was not copied",
                            after_.content.partitions.size(), before_.source,
                            before_.partitions.size()));
        if (!after_.content.marked)
            add(outcome_, Severity::warning, "the disk does not carry the appliance's mark");
    }

    void joined(const PartitionFact &before, const PlanStep &step) {
        const PartitionFact *after = partition_with(after_.partitions, before.number);
        const ArrayMember *member =
            after == nullptr ? nullptr : member_of_slot(after->table, before_.target.slot);
        const bool made = member != nullptr && member->hold != ArrayMember::Hold::faulty;
        joined_ += made ? 1 : 0;
        if (made)
            return;
        missed_.push_back(&before);
        const std::string name = fmt::format("disk{}p{}", before_.target.slot, before.number);
        if (step.does == "recreate")
            add(outcome_, Severity::critical,
                fmt::format("array {} was not created anew", before.array.number));
        else
            add(outcome_, Severity::critical,
                fmt::format("{} did not join {}", name, array_words(before)));
    }

    // Once more from the start, unless that would take the disk out of what it has joined.
    void advise_addition() {
        if (missed_.empty())
            return;
        if (joined_ == 0) {
            outcome_.advice.push_back(
                fmt::format("The disk joined nothing. Look at /var/log/messages, then run 'zavctl "
                            "disk add {}' again.",
                            before_.target.slot));
            return;
        }
        for (const PartitionFact *partition : missed_)
            if (!partition->holder.empty())
                outcome_.advice.push_back(fmt::format("mdadm /dev/{} --add /dev/sata/disk{}p{}",
                                                      partition->holder, before_.target.slot,
                                                      partition->number));
    }

    std::string told_arrays(const std::string &word, const std::string &other) const {
        std::vector<std::string> names;
        for (const PartitionFact &partition : before_.partitions)
            if (const PlanStep *step = step_for(plan_, partition))
                if (step->does == word || step->does == other)
                    names.push_back(fmt::format("{}", partition.array.number));
        if (names.empty())
            return no_array;
        return (names.size() == 1 ? "array " : "arrays ") + listed(names);
    }

    const Plan &plan_;
    const ExchangeFacts &before_;
    const Aftermath &after_;
    Outcome outcome_;
    int joined_ = 0;
    std::vector<const PartitionFact *> missed_;
};

} // namespace

Outcome removal_outcome(const Plan &plan, const ExchangeFacts &before, const Aftermath &after,
                        const std::optional<Failure> &failure) {
    Judge judge(plan, before, after);
    judge.removal();
    return judge.close(failure);
}

Outcome addition_outcome(const Plan &plan, const ExchangeFacts &before, const Aftermath &after,
                         const std::optional<Failure> &failure) {
    Judge judge(plan, before, after);
    judge.addition();
    return judge.close(failure);
}

} // namespace zavctl
