#include "model/devices.hpp"

#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/enclosures.hpp"
#include "model/volumes.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

void add_disk(std::vector<Node> &nodes, const Disk &disk, double now) {
    const std::string kernel_name = "sd" + disk.letter;
    const std::string own_name = fmt::format("/dev/sata/disk{}", disk.slot);
    nodes.push_back({"/dev/" + kernel_name, {}, disk.kib * 1024, disk.serial});
    nodes.push_back({own_name, "../" + kernel_name, 0, 0});
    if (disk.settles > now)
        return;
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
    if (const std::string link = array_link(array.minor); !link.empty())
        nodes.push_back({"/dev/" + link, "../" + kernel_name, 0, 0});
    nodes.push_back({"/dev/md/" + array.name, "../" + kernel_name, 0, 0});
}

void add_volume(std::vector<Node> &nodes, const Group &group, const Volume &volume) {
    const std::string kernel_name = fmt::format("dm-{}", volume.minor);
    const auto extents = static_cast<std::uint64_t>(extents_of(volume));
    nodes.push_back({"/dev/" + kernel_name, {}, extents * extent_kib * 1024, 0});
    nodes.push_back(
        {fmt::format("/dev/{}/{}", group.name, volume.name), "../" + kernel_name, 0, 0});
    nodes.push_back({mapper_path(group, volume), "../" + kernel_name, 0, 0});
}

// Disks and volumes behind the RAID controller have nodes of their own in place of links.
constexpr std::uint64_t enclosure_node_bytes = 512ULL << 20;

void add_enclosure(std::vector<Node> &nodes, const Enclosure &enclosure) {
    const bool unit = enclosure.number != 0;
    const std::string disks =
        unit ? fmt::format("/dev/sas/r{}disk", enclosure.number) : "/dev/hwsata/disk";
    const std::string volumes =
        unit ? fmt::format("/dev/sasraid/r{}disk", enclosure.number) : "/dev/hwraid/disk";
    for (const Bay &bay : enclosure.bays)
        if (bay.state != BayState::absent)
            nodes.push_back(
                {fmt::format("{}{}", disks, bay.number), {}, enclosure_node_bytes, bay.serial});
    for (const RaidVolume &volume : enclosure.volumes)
        nodes.push_back(
            {fmt::format("{}{}", volumes, volume.number), {}, enclosure_node_bytes, volume.serial});
}

// The node itself is empty: what a disc holds cannot be read from it.
void add_drive(std::vector<Node> &nodes, const OpticalDrive &drive) {
    nodes.push_back({"/dev/sr0", {}, 0, 0});
    for (const char *link : {"/dev/scd0", "/dev/cdrom"})
        nodes.push_back({link, "sr0", 0, 0});
    if (drive.packet_device)
        nodes.push_back({"/dev/pktcdvd/pktcdvd0", {}, 0, 0});
}

// Where a name of its own has a hyphen device-mapper writes two.
std::string doubled_hyphens(const std::string &name) {
    std::string text;
    for (const char c : name)
        text += c == '-' ? std::string("--") : std::string(1, c);
    return text;
}

} // namespace

std::vector<Node> device_nodes(const State &state) {
    std::vector<Node> nodes;
    for (const Disk &disk : state.disks)
        if (disk.attached)
            add_disk(nodes, disk, state.now);
    for (const Array &array : state.arrays)
        add_array(nodes, array);
    for (const Group &group : state.groups)
        for (const Volume &volume : group.volumes)
            if (volume.active)
                add_volume(nodes, group, volume);
    for (const Enclosure *enclosure : reached_enclosures(state))
        add_enclosure(nodes, *enclosure);
    if (drive_answers(state.drive))
        add_drive(nodes, state.drive);
    return nodes;
}

std::string array_link(int minor) {
    return minor < 100 ? fmt::format("swraid/disk{}p1", minor + 1) : "";
}

std::string mapper_path(const Group &group, const Volume &volume) {
    return fmt::format("/dev/mapper/{}-{}", doubled_hyphens(group.name),
                       doubled_hyphens(volume.name));
}

} // namespace zavsim
