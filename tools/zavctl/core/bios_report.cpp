#include "bios_report.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstring>

namespace zavctl {

namespace {

// The kernel writes the checksum itself, over what an image holds there.
constexpr std::size_t checksum_begin = 32;
constexpr std::size_t checksum_end = 34;

bool is_checksum(std::size_t offset) {
    return offset >= checksum_begin && offset < checksum_end;
}

std::string offsets_text(const std::vector<std::size_t> &offsets) {
    constexpr std::size_t shown = 8;
    std::vector<std::string> words;
    for (std::size_t i = 0; i < std::min(shown, offsets.size()); ++i)
        words.push_back(fmt::format("{}", offsets[i]));
    if (offsets.size() > shown)
        words.push_back(fmt::format("{} more", offsets.size() - shown));
    return listed(words);
}

} // namespace

std::string nvram_trouble(const NvramFact &nvram) {
    if (nvram.error == EIO)
        return "/dev/nvram cannot be read: Input/output error (the CMOS checksum is not set)";
    if (nvram.error != 0)
        return fmt::format("/dev/nvram cannot be read: {}", std::strerror(nvram.error));
    if (nvram.bytes.size() != bios_image_size)
        return fmt::format("/dev/nvram gives {} of {} bytes", nvram.bytes.size(), bios_image_size);
    return "";
}

std::string image_refusal(std::string_view image) {
    if (image.size() != bios_image_size)
        return fmt::format("it has {} bytes, saved BIOS settings have exactly {}", image.size(),
                           bios_image_size);
    if (std::all_of(image.begin(), image.end(), [](char c) { return c == '\0'; }))
        return "it is all zeros, which is what a device that cannot be read leaves";
    return "";
}

std::vector<std::size_t> differing_bytes(std::string_view a, std::string_view b) {
    std::vector<std::size_t> offsets;
    for (std::size_t i = 0; i < std::min(a.size(), b.size()); ++i)
        if (a[i] != b[i])
            offsets.push_back(i);
    return offsets;
}

BiosOutcome load_verdict(const std::string &file, std::string_view image, const NvramFact &after) {
    if (!after.complete())
        return {"load", file, "not_verified", Severity::unknown,
                "the settings were handed to the device, but cannot be read back: " +
                    nvram_trouble(after)};
    const std::vector<std::size_t> differing = differing_bytes(image, after.bytes);
    if (differing.empty())
        return {"load", file, "loaded", Severity::ok,
                fmt::format("{} bytes of {} loaded into /dev/nvram and read back equal",
                            bios_image_size, file)};
    const bool only_checksum = std::all_of(differing.begin(), differing.end(), is_checksum);
    if (only_checksum)
        return {"load", file, "loaded", Severity::warning,
                "loaded, but the checksum in the file is not that of its settings: the kernel has "
                "stored its own"};
    return {"load", file, "not_loaded", Severity::critical,
            fmt::format("/dev/nvram does not hold what the file says: {} bytes differ (at {})",
                        differing.size(), offsets_text(differing))};
}

Section bios_section(const ModelReport &model, const NvramFact &nvram) {
    const std::string trouble = nvram_trouble(nvram);
    Section section;
    section.key = "bios";
    Details details;
    const auto shown = [](const std::optional<std::string> &text) {
        return text ? printable(trimmed(*text)) : std::string("not readable");
    };
    details.add("Product name", shown(model.product_name),
                model.product_name ? Severity::ok : Severity::unknown);
    details.add("Serial number", shown(model.serial),
                model.serial ? Severity::ok : Severity::warning);
    details.add("Model", fmt::format("{} (code 0x{:x})", model_name(model), model.code),
                model.known() ? Severity::ok : Severity::unknown);
    details.add("Settings", trouble.empty() ? "/dev/nvram is readable" : trouble,
                trouble.empty() ? Severity::ok : Severity::warning);
    section.details = {details};
    section.records = {{"kind", "bios"},
                       {"product_name", model_json(model)["product_name"]},
                       {"serial", model_json(model)["serial"]},
                       {"model", model_word(model.code)},
                       {"model_code", model.code},
                       {"settings_readable", trouble.empty()},
                       {"note", trouble}};
    section.findings = model_findings(model);
    if (!trouble.empty())
        section.findings.push_back({Severity::warning, trouble});
    section.well = "identity and settings are readable";
    return section;
}

Section outcome_section(const BiosOutcome &outcome) {
    Section section;
    section.key = "bios";
    section.records = {{"kind", "bios_" + outcome.action},
                       {"file", outcome.file},
                       {"outcome", outcome.outcome},
                       {"severity", word(outcome.severity)},
                       {"note", outcome.text}};
    if (outcome.severity != Severity::ok)
        section.findings.push_back({outcome.severity, outcome.text});
    section.well = outcome.text;
    return section;
}

} // namespace zavctl
