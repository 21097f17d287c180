#include "model/disks.hpp"
#include "model/texts.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

std::string smartctl_banner(const State &state) {
    if (state.current_tools)
        return "smartctl 7.3 2022-02-28 r5338 [x86_64-linux-6.1.0-56-amd64] (local build)\n"
               "Copyright (C) 2002-22, Bruce Allen, Christian Franke, www.smartmontools.org\n\n";
    return "smartctl version 5.38 [i686-pc-linux-gnu] Copyright (C) 2002-8 Bruce Allen\n"
           "Home page is http://smartmontools.sourceforge.net/\n\n";
}

std::string scsi_entry(int host, const char *vendor, const char *model, const char *revision,
                       const char *type) {
    return fmt::format("Host: scsi{} Channel: 00 Id: 00 Lun: 00\n"
                       "  Vendor: {:8} Model: {:16} Rev: {:4}\n"
                       "  Type:   {:17}                ANSI  SCSI revision: 05\n",
                       host, vendor, model, revision, type);
}

} // namespace

std::string smartctl_text(const State &state, bool failing) {
    const std::string head = smartctl_banner(state) +
                             "=== START OF READ SMART DATA SECTION ===\n"
                             "SMART overall-health self-assessment test result: ";
    if (!failing)
        return head + "PASSED\n\n";
    return head + "FAILED!\nDrive failure expected in less than 24 hours. SAVE ALL DATA.\n"
                  "No failed Attributes found.\n\n";
}

std::string smartctl_no_device_text(const State &state, const std::string &path) {
    return smartctl_banner(state) +
           fmt::format("Smartctl open device: {} failed: {}\n", path,
                       state.current_tools ? "No such device" : "No such file or directory");
}

std::string scsi_text(const State &state) {
    std::string text = "Attached devices:\n";
    for (int host : state.scsi_hosts)
        text += host == optical_host
                    ? scsi_entry(host, "QEMU", "QEMU DVD-ROM", "2.5+", "CD-ROM")
                    : scsi_entry(host, "ATA", "QEMU HARDDISK", "2.5+", "Direct-Access");
    return text;
}

} // namespace zavsim
