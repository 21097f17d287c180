// What the appliance's files hold and its tools print, as functions of the state. Each comes in
// the form of the appliance's own kernel and tools and in that of a current Linux system; the
// state says which.
#pragma once

#include "model/state.hpp"

#include <cstdint>
#include <string>

namespace zavsim {

// The whole of /proc/mdstat.
std::string mdstat_text(const State &state);

// mdadm --detail; `shown_name` is the name the array was asked for by.
std::string detail_text(const State &state, const Array &array, const std::string &shown_name);

// mdadm --query --examine --scan of one partition; empty when it was never a member.
std::string examine_scan_text(const State &state, const Partition &partition);

// mdadm --misc --query of one partition, under the name it was asked for by.
std::string query_text(const State &state, const Disk &disk, const Partition *partition,
                       const std::string &shown_name);

// smartctl -H: the screen for a disk that answers, or for one that cannot be opened.
std::string smartctl_text(const State &state, bool failing);
std::string smartctl_no_device_text(const State &state, const std::string &path);

// The whole of /proc/scsi/scsi.
std::string scsi_text(const State &state);

// " (95.00 MiB 99.61 MB)"; empty for small sizes.
std::string human_size(std::uint64_t kib);

// The appliance starts on Monday 14 March 2011, 08:00 UTC.
constexpr double start_of_time = 1300089600;

// As ctime prints it, without the line feed; the appliance's clock is a fixed one, so that the
// same run prints the same text.
std::string date_text(double appliance_time);

// Percentage with which mdadm shows a sync, and whole KiB done as the kernel counts them.
int sync_percent(const Array &array);
std::uint64_t sync_done_kib(const Array &array);

} // namespace zavsim
