// The model that the library runs on, as its units ask for it.
#pragma once

#include "zav_api.h"

namespace zav {

constexpr int kKnownModel = 0x300; // every family's code has one of these bits

struct ModelConfig {
    int model = 0;
    int diskmax = 0;   // slots
    int raidcount = 0; // disks that the arrays are built from

    // As zavGetModelConfig returns it.
    int read() { return zavGetModelConfig(&model, &diskmax, &raidcount); }

    bool is_known() const { return (model & kKnownModel) != 0; }
};

} // namespace zav
