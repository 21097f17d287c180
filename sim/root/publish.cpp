#include "root/publish.hpp"

#include "launcher/sandbox.hpp"
#include "model/devices.hpp"
#include "model/load.hpp"
#include "model/network.hpp"
#include "model/texts.hpp"
#include "model/texts_volumes.hpp"
#include "root/files.hpp"
#include "root/optical_files.hpp"
#include "root/report.hpp"
#include "root/ups_files.hpp"
#include "tools/tools.hpp"

#include <filesystem>
#include <fmt/format.h>
#include <map>
#include <nlohmann/json.hpp>
#include <set>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

// A detached disk keeps its content in its bay until it is attached again.
const fs::path bays = "/dev/.bays";

const std::set<std::string> kept_directories = {"/dev", "/dev/sata", "/dev/swraid", "/dev/md",
                                                "/dev/mapper"};

using Names = std::set<std::string>;

// Links that another turn made and that are wanted no more. A volume's stand in a directory of
// their group, which goes with the last.
void remove_stale_links(const Names &wanted) {
    const fs::path links_file = place::run + "/links";
    const auto text = read_text(links_file);
    const Names present = text ? nlohmann::json::parse(*text).get<Names>() : Names{};
    if (present == wanted)
        return;
    for (const std::string &link : present) {
        std::error_code in_use;
        if (wanted.count(link) != 0)
            continue;
        fs::remove(link, in_use);
        if (kept_directories.count(fs::path(link).parent_path()) == 0)
            fs::remove(fs::path(link).parent_path(), in_use);
    }
    write_text(links_file, nlohmann::json(wanted).dump());
}

// Nodes go by their path below /dev.
std::string name_of(const Node &node) {
    return node.path.substr(5);
}

fs::path bay_of(const std::string &name, int serial) {
    // Named by disk and partition, for the kernel name may be another one the next time.
    const std::size_t digits = name.find_first_of("0123456789");
    return bays / (std::to_string(serial) +
                   (digits == std::string::npos ? "" : "p" + name.substr(digits)));
}

using Owners = std::map<std::string, int>;
const fs::path owners_file = place::run + "/owners";

Owners read_owners() {
    const auto text = read_text(owners_file);
    return text ? nlohmann::json::parse(*text).get<Owners>() : Owners{};
}

// Nodes that are gone, or whose name another disk has now, go to their bays.
void remove_stale_nodes(const Owners &wanted, const Owners &present) {
    for (const auto &[name, serial] : present) {
        const auto found = wanted.find(name);
        if (found != wanted.end() && found->second == serial)
            continue;
        const fs::path node = fs::path("/dev") / name;
        std::error_code error;
        if (serial == 0)
            fs::remove(node, error);
        else
            fs::rename(node, bay_of(name, serial), error);
    }
}

void make_node(const Node &node) {
    std::error_code error;
    fs::create_directories(fs::path(node.path).parent_path());
    if (node.serial != 0 && !fs::exists(node.path))
        fs::rename(bay_of(name_of(node), node.serial), node.path, error);
    if (!fs::exists(node.path))
        make_sparse(node.path, node.bytes);
}

// Programs read the label from the node. Only a change of the model's is written, so that a
// program's own bytes stay.
void publish_labels(const State &state) {
    using Labels = std::map<std::string, std::uint32_t>; // by serial number
    const fs::path labels_file = place::run + "/labels";
    const auto text = read_text(labels_file);
    Labels labels = text ? nlohmann::json::parse(*text).get<Labels>() : Labels{};
    for (const Disk &disk : state.disks) {
        std::uint32_t &published = labels[std::to_string(disk.serial)];
        if (!disk.attached || published == disk.label_id)
            continue;
        write_label_id("/dev/sd" + disk.letter, disk.label_id);
        published = disk.label_id;
    }
    write_text(labels_file, nlohmann::json(labels).dump());
}

void publish_devices(const State &state) {
    const std::vector<Node> nodes = device_nodes(state);
    Names links;
    Owners owners;
    for (const Node &node : nodes)
        if (node.target.empty())
            owners[name_of(node)] = node.serial;
        else
            links.insert(node.path);
    fs::create_directories(bays);
    remove_stale_links(links);
    const Owners present = read_owners();
    if (present != owners) {
        remove_stale_nodes(owners, present);
        write_text(owners_file, nlohmann::json(owners).dump());
    }
    for (const Node &node : nodes)
        if (node.target.empty())
            make_node(node);
        else
            point_link(node.path, node.target);
}

// The controller has six ports, with a disk or without. Newer kernels have a directory for each.
void publish_ports(const State &state) {
    for (int host = 0; host < 6; ++host)
        fs::create_directories(
            fmt::format("/sys/devices/pci0000:00/0000:00:1f.2/{}host{}",
                        state.hosts_below_ata ? fmt::format("ata{}/", host + 1) : "", host));
}

// A program may write its own mtab; it is replaced when a mount changes.
void publish_mounts(const State &state) {
    for (const std::string &path : own_file_systems())
        fs::create_directories(path);
    for (const Group &group : state.groups)
        for (const Volume &volume : group.volumes)
            if (!volume.mount_point.empty())
                fs::create_directories(volume.mount_point);
    const fs::path shown = place::run + "/mtab";
    const std::string mtab = mtab_text(state);
    if (read_text(shown) != mtab) {
        write_text(shown, mtab);
        write_text("/etc/mtab", mtab);
    }
    write_text(place::run + "/file-systems", file_systems_text(state));
}

void publish_load(const State &state) {
    write_text("/proc/stat", stat_text(state));
    write_text("/proc/meminfo", meminfo_text(state));
}

void publish_network(const State &state) {
    const std::string text = bonding_text(state.network);
    if (!text.empty())
        write_text("/proc/net/bonding/bond0", text);
}

bool is_missing(const State &state, const std::string &tool) {
    for (const ToolFault &fault : state.faults)
        if (fault.tool == tool)
            return fault.missing;
    return false;
}

// The expanders' script comes with the RAID controller.
bool belongs_to_model(const State &state, const std::string &tool) {
    return tool != "query_sas.sh" || state.controller;
}

void publish_tools(const State &state) {
    for (const Tool &tool : simulated_tools()) {
        if (is_missing(state, tool.name) || !belongs_to_model(state, tool.name))
            fs::remove(tool.path);
        else
            point_link(tool.path, place::program);
    }
}

constexpr const char *scsi_file = "/proc/scsi/scsi";

// Whether a writer has the file: a command that nobody took yet, or emptied for one to come.
bool belongs_to_writer(const std::string &text, const std::string &taken_command) {
    return text.empty() ? is_fresh(scsi_file)
                        : text.rfind("scsi ", 0) == 0 && text != taken_command;
}

// One look decides: a writer may come between two.
void publish_scsi(const std::string &list, const std::string &taken_command) {
    const auto present = read_text(scsi_file);
    if (!present || (*present != list && !belongs_to_writer(*present, taken_command)))
        overwrite_text(scsi_file, list);
}

} // namespace

bool publish(const State &state, const Taken &taken) {
    write_text("/proc/mdstat", mdstat_text(state));
    publish_devices(state);
    publish_labels(state);
    publish_ports(state);
    publish_mounts(state);
    publish_tools(state);
    publish_driver_files(state, taken.driver_files);
    publish_load(state);
    publish_ups(state);
    publish_network(state);
    publish_drive(state);
    const bool shown = publish_report(state);
    // The last: who waits for a command to be done looks for the list in its place.
    publish_scsi(scsi_text(state), taken.scsi_command);
    return shown;
}

} // namespace zavsim
