// Machines in the states in which the captured texts were taken.
#pragma once

#include "model/state.hpp"

#include <cstdint>
#include <string>
#include <vector>

zavsim::State appliance(const std::string &model, const std::string &level = "");
zavsim::State with_units(int units); // a 2980
zavsim::State four_disks(const std::string &level = "");
zavsim::State after(zavsim::State state, const std::vector<std::string> &sentences);
zavsim::Array &array(zavsim::State &state, int minor);
zavsim::State healthy();
zavsim::State member_failed();
zavsim::State members_removed();
zavsim::State resyncing(double kib, double seconds);
zavsim::State rebuilt();
zavsim::State resyncing_data(double kib, double seconds);
zavsim::State scrubbing(zavsim::SyncKind kind);
zavsim::State with_bitmap();
zavsim::State two_disks_degraded();
zavsim::State two_disks_pending();
zavsim::State two_disks_resyncing();
zavsim::State inactive();
zavsim::State alone(const std::string &level, std::uint64_t component_kib, int chunk_kib);
zavsim::State mirror_alone();
zavsim::State with_metadata(const std::string &metadata, std::uint64_t component_kib);
zavsim::State raid5_two_lost();
