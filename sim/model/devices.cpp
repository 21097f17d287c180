#include "model/devices.hpp"

#include "model/arrays.hpp"
#include "model/disks.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

void add_disk(std::vector<Node> &nodes, const Disk &disk) {
    const std::string kernel_name = "sd" + disk.letter;
    const std::string own_name = fmt::format("/dev/sata/disk{}", disk.slot);
    nodes.push_back({"/dev/" + kernel_name, {}, disk.kib * 1024, disk.serial});
    nodes.push_back({own_name, "../" + kernel_name, 0, 0});
    for (const Partition &partition : disk.partitions) {
        nodes.push_back({fmt::format("/dev/{}{}", kernel_name, partition.number),
                         {},
                         partition.kib * 1024,
                         disk.serial});
        nodes.push_back({fmt::format("{}p{}", own_name, partition.number),
                         fmt::format("../{}{}", kernel_name, partition.number), 0, 0});
    }
}

void add_array(std::vector<Node> &nodes, const Array &array) {
    const std::string kernel_name = fmt::format("md{}", array.minor);
    nodes.push_back({"/dev/" + kernel_name, {}, array_kib(array) * 1024, 0});
    nodes.push_back(
        {fmt::format("/dev/swraid/disk{}p1", array.minor + 1), "../" + kernel_name, 0, 0});
    nodes.push_back({"/dev/md/" + array.name, "../" + kernel_name, 0, 0});
}

bool digits_follow(const std::string &name, std::size_t at) {
    return at < name.size() && name.find_first_not_of("0123456789", at) == std::string::npos;
}

} // namespace

std::vector<Node> device_nodes(const State &state) {
    std::vector<Node> nodes;
    for (const Disk &disk : state.disks)
        if (disk.attached)
            add_disk(nodes, disk);
    for (const Array &array : state.arrays)
        add_array(nodes, array);
    return nodes;
}

bool belongs_to_model(const std::string &directory, const std::string &name) {
    if (directory == "/dev")
        return parse_kernel_name(name).has_value() ||
               (name.rfind("md", 0) == 0 && digits_follow(name, 2));
    if (directory == "/dev/md")
        return name.rfind("MD", 0) == 0 && digits_follow(name, 2);
    return name.rfind("disk", 0) == 0 &&
           name.find_first_not_of("0123456789p", 4) == std::string::npos;
}

} // namespace zavsim
