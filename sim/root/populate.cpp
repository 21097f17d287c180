#include "root/populate.hpp"

#include "launcher/sandbox.hpp"
#include "model/factory.hpp"
#include "root/files.hpp"
#include "tools/tools.hpp"

#include <algorithm>
#include <filesystem>
#include <set>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

using Names = std::set<std::string>;

// Links every entry of one directory into another, but those that the appliance has of its own.
template <typename Except>
void link_entries(const fs::path &from, const fs::path &to, const Except &except) {
    std::error_code error;
    fs::create_directories(to);
    for (const auto &entry : fs::directory_iterator(from, error)) {
        const std::string name = entry.path().filename();
        if (except(name))
            continue;
        std::error_code exists;
        fs::create_symlink(entry.path(), to / name, exists);
    }
}

auto any_of(Names names) {
    return [names = std::move(names)](const std::string &name) { return names.count(name) != 0; };
}

void link_programs(const Options &options) {
    for (const std::string farm : {"bin", "sbin", "local/bin", "local/sbin"})
        link_entries(fs::path(place::host_usr) / farm, fs::path("/usr") / farm, hidden_from_host);
    for (const std::string farm : {"bin", "sbin"})
        link_entries(fs::path("/run/host") / farm, fs::path("/usr") / farm, hidden_from_host);
    point_link("/usr/bin/sh", place::host_usr + "/bin/" + options.shell);
    point_link("/usr/bin/zavsim", place::program);
}

void link_etc() {
    link_entries(place::host_etc, "/etc",
                 any_of({"Kiru", "sysconfig", "mtab", "fstab", "arecaTimeZone.list", "hostname",
                         "lvm", "mdadm", "mdadm.conf"}));
    write_text("/etc/hostname", "appliance\n");
    for (const char *directory : {"/etc/Kiru/zav", "/etc/sysconfig"})
        fs::create_directories(directory);
}

bool is_number(const std::string &name) {
    return std::all_of(name.begin(), name.end(), [](char c) { return c >= '0' && c <= '9'; });
}

// The appliance's files go where the real /proc has none, or others.
void link_proc() {
    link_entries(place::real_proc, "/proc", [](const std::string &name) {
        static const Names own = {"mdstat", "scsi", "net", "sys", "zav"};
        return is_number(name) || own.count(name) != 0;
    });
    const fs::path real = place::real_proc;
    link_entries(real / "self/net", "/proc/net", any_of({"bonding"}));
    link_entries(real / "sys", "/proc/sys", any_of({"dev"}));
    link_entries(real / "sys/dev", "/proc/sys/dev", any_of({"cdrom"}));
    for (const char *directory :
         {"/proc/scsi", "/proc/net/bonding", "/proc/sys/dev/cdrom", "/proc/zav/sys"})
        fs::create_directories(directory);
}

void link_sys() {
    const fs::path real = place::host_sys;
    link_entries(real, "/sys", any_of({"block", "class", "devices"}));
    link_entries(real / "devices", "/sys/devices",
                 [](const std::string &name) { return name.rfind("pci", 0) == 0; });
    for (const char *directory :
         {"/sys/block", "/sys/class/dmi/id", "/sys/devices/pci0000:00/0000:00:1f.2"})
        fs::create_directories(directory);
}

void make_directories() {
    for (const char *directory :
         {"/dev/sata", "/dev/swraid", "/dev/md", "/dev/mapper", "/var/log", "/var/run", "/var/lock",
          "/var/tmp", "/var/lib", "/mnt", "/media", "/boot"})
        fs::create_directories(directory);
}

} // namespace

void populate_root(const Options &options) {
    link_programs(options);
    link_etc();
    link_proc();
    link_sys();
    make_directories();
}

// 114 bytes, as the kernel's nvram driver presents the CMOS memory. What they mean is the BIOS's
// business; zeros would look like a device that cannot be read.
std::string bios_settings() {
    std::string settings;
    for (int i = 0; i < 114; ++i)
        settings += static_cast<char>(1 + i * 37 % 251);
    return settings;
}

void populate_appliance(const Options &options) {
    const Identity identity = identity_of(options.model);
    const auto chosen = [](const std::string &wish, const std::string &usual) {
        return (wish.empty() ? usual : wish) + "\n";
    };
    const fs::path dmi = "/sys/class/dmi/id";
    write_text(dmi / "product_name", chosen(options.product, identity.product));
    write_text(dmi / "board_name", chosen(options.product, identity.product));
    write_text(dmi / "product_serial", chosen(options.serial, "AB1234"));
    write_text(dmi / "sys_vendor", "Kiru\n");
    write_text(dmi / "product_version", "1.0\n");
    write_text(dmi / "bios_version", "1.16\n");
    write_text("/etc/Kiru/raidtype",
               chosen(options.raidtype, raidtype_line(options.model, options.level)));
    write_text("/etc/sysconfig/clock", "ZONE=\"Asia/Tokyo\"\nUTC=true\n");
    write_text("/etc/fstab", "");
    write_text("/dev/nvram", bios_settings());
    for (const char *queue : {"/dev/zavevent0", "/dev/zavledevent"})
        make_sparse(queue, 0);
    fs::create_directories(place::run + "/queues");
}

} // namespace zavsim
