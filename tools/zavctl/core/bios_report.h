// BIOS settings: what an image is worth, and what is said about saving and loading one.
#pragma once

#include "answer.h"
#include "model_report.h"

#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

constexpr std::size_t bios_image_size = 114;

// What the device gave: errno of the failure or the bytes.
struct NvramFact {
    int error = 0;
    std::string bytes;

    bool complete() const { return error == 0 && bytes.size() == bios_image_size; }
};

// "/dev/nvram: Input/output error", "/dev/nvram gives 20 of 114 bytes"; "" if it gives all.
std::string nvram_trouble(const NvramFact &nvram);

// Why a file is no image to load, "" if it is one.
std::string image_refusal(std::string_view image);

// Offsets of the bytes that differ, where both have 114.
std::vector<std::size_t> differing_bytes(std::string_view a, std::string_view b);

// What came of saving or loading.
struct BiosOutcome {
    std::string action; // "save" or "load"
    std::string file;
    std::string outcome; // stable word: "saved", "loaded", "not_confirmed", ...
    Severity severity = Severity::ok;
    std::string text; // in words
};

// The verdict on a load, from what the device holds afterwards.
BiosOutcome load_verdict(const std::string &file, std::string_view image, const NvramFact &after);

Section bios_section(const ModelReport &model, const NvramFact &nvram);
Section outcome_section(const BiosOutcome &outcome);

} // namespace zavctl
