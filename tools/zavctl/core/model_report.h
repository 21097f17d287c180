// What the machine is.
#pragma once

#include "answer.h"

#include <optional>
#include <string>

namespace zavctl {

struct ModelReport {
    int code = 0;                            // ZAV_MODEL_*; 0: no known model
    int disk_slots = 0;                      // 0 if not known
    int disk_count = 0;                      // disks that the model's arrays are built from
    int data_raid_type = -1;                 // -1 if not known
    std::optional<std::string> product_name; // as the BIOS gives it
    std::optional<std::string> serial;
    std::optional<Failure> failure;

    bool known() const { return !failure; }
    bool hardware_raid() const { return code == 0x300; }
};

// "Solvane 2860, 4 disks"; "unknown model".
std::string model_name(const ModelReport &model);

// The stable word of a model code: "2860_4hdd"; "none" for 0, "unknown" for others.
std::string model_word(int code);

// Heading of a screen: name, product and serial number.
std::string model_heading(const ModelReport &model);

// What is wrong with it: no known model, no raidtype file.
std::vector<Finding> model_findings(const ModelReport &model);

Json model_json(const ModelReport &model);
Section model_section(const ModelReport &model);

} // namespace zavctl
