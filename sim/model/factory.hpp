// Appliances as they leave the factory.
#pragma once

#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

struct Identity {
    std::string product;
    int disks;
};

struct Wishes {
    std::string model = "2860-4";
    std::string level; // of the data array; empty for the model's usual one
    bool current_tools = false;
    double time_scale = 1;
    bool hosts_below_ata = false;
    int units = 2;             // expansion units of the model that has them
    std::string nics = "bond"; // ports: none, two, or a bond of two
};

std::vector<std::string> model_names();
std::vector<std::string> level_names();
Identity identity_of(const std::string &model);
std::string usual_level(const std::string &model);

// Why that model cannot have that level; empty when it can.
std::string level_problem(const std::string &model, const std::string &level);

bool has_controller(const std::string &model);

// The line of /etc/Kiru/raidtype without its line feed.
std::string raidtype_line(const std::string &model, const std::string &level);

State new_appliance(const Wishes &wishes);

} // namespace zavsim
