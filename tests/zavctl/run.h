// Runs zavctl on a simulated appliance.
#pragma once

#include "sim_runner.hpp"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <gtest/gtest.h>

// A shell script on an appliance, in which "zavctl" is the program under test. The clock runs fast,
// so that an empty slot costs a fraction of a second; zavctl's own limit is real time.
inline Outcome on_zav(const std::string &script, std::vector<std::string> options = {}) {
    const std::string program = ZAVCTL;
    const std::string path = program.substr(0, program.rfind('/'));
    if (std::find(options.begin(), options.end(), "--time-scale") == options.end())
        options.insert(options.begin(), {"--time-scale", "100"});
    return on_appliance("PATH=" + path + ":$PATH; unset NO_COLOR; mkdir /tmp/here; cd /tmp/here; " +
                            script,
                        options);
}

inline nlohmann::json parsed(const std::string &text) {
    const nlohmann::json json = nlohmann::json::parse(text, nullptr, false);
    EXPECT_FALSE(json.is_discarded()) << text;
    return json;
}

inline bool holds(const std::string &text, const std::string &part) {
    return text.find(part) != std::string::npos;
}
