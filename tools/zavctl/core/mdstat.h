// What in /proc/mdstat the library does not take: the reasons behind an answer it refuses.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

// The lines of one array: its own and the indented ones below it. "" if it is not listed.
std::string mdstat_block(std::string_view mdstat, std::string_view kernel_name);

// Why the library cannot tell the state of the array, "" if it can: a third line that the
// appliance's kernel does not write, a status line too long for its 80-character lines, another
// array whose name holds this one's and stands first.
std::string mdstat_refusal(std::string_view mdstat, std::string_view kernel_name);

// The case of those where the library does answer, but for another array; "" if it does not.
std::string mdstat_mixup(std::string_view mdstat, std::string_view kernel_name);

// What the kernel says about a partition in the array's lines: "active", "faulty", "spare", "out"
// (not listed), or "unknown" if there are no lines. `node` is the kernel's name of it: "sdc2".
std::string member_state(std::string_view block, std::string_view node);

// The kernel's name of the array whose line lists the partition; "" if none does.
std::string array_of_member(std::string_view mdstat, std::string_view node);

struct MdstatProblem {
    std::string kernel_name;
    std::string reason;
};

// The refusals of the arrays md0 to md3.
std::vector<MdstatProblem> mdstat_problems(std::string_view mdstat);

} // namespace zavctl
