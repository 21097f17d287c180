// What is seen of a change while it runs.
#pragma once

#include <chrono>
#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

// Something that is looked at again and again.
struct Sight {
    std::string what;  // by which it is found again
    std::string state; // what is said of it while it is there
    std::string gone;  // and when it is not any more
};

// What the kernel's names of partitions are called here: "sdc2" is "disk3p2".
using NodeNames = std::map<std::string, std::string>;

// The sights of /proc/mdstat: every array, and every member in it.
std::vector<Sight> sights_in_mdstat(std::string_view mdstat, const NodeNames &names);

// What is different: "disk3p2 is faulty in md1", "disk3p2 is out of md1".
std::vector<std::string> differences(const std::vector<Sight> &before,
                                     const std::vector<Sight> &after);

// "    12 s  disk3p2 is faulty in md1\n".
std::string seen_line(std::chrono::seconds elapsed, const std::string &text);

// What a tool printed, made safe and marked as such.
std::string tool_lines(std::string_view output);

} // namespace zavctl
