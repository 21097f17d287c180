#include "model_report.h"

#include "zav_api.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

struct KnownModel {
    int code;
    const char *word;
    const char *constant;
    const char *family;
    const char *disks;
};

constexpr KnownModel known_models[] = {
    {ZAV_MODEL_SOLVANE_NONE, "none", "ZAV_MODEL_SOLVANE_NONE", "unknown model", ""},
    {ZAV_MODEL_SOLVANE_2740, "2740", "ZAV_MODEL_SOLVANE_2740", "Solvane 2740", "1 disk"},
    {ZAV_MODEL_SOLVANE_2740_2HDD, "2740_2hdd", "ZAV_MODEL_SOLVANE_2740_2HDD", "Solvane 2740",
     "2 disks"},
    {ZAV_MODEL_SOLVANE_2740_4HDD, "2740_4hdd", "ZAV_MODEL_SOLVANE_2740_4HDD", "Solvane 2740",
     "4 disks"},
    {ZAV_MODEL_SOLVANE_2860, "2860", "ZAV_MODEL_SOLVANE_2860", "Solvane 2860", "2 disks"},
    {ZAV_MODEL_SOLVANE_2860_4HDD, "2860_4hdd", "ZAV_MODEL_SOLVANE_2860_4HDD", "Solvane 2860",
     "4 disks"},
    {ZAV_MODEL_SOLVANE_2980, "2980", "ZAV_MODEL_SOLVANE_2980", "Solvane 2980", "hardware RAID"},
};

const KnownModel *find_model(int code) {
    for (const KnownModel &model : known_models)
        if (model.code == code)
            return &model;
    return nullptr;
}

std::string shown(const std::optional<std::string> &text) {
    return text ? printable(trimmed(*text)) : "not readable";
}

Json text_or_null(const std::optional<std::string> &text) {
    return text ? Json(trimmed(*text)) : Json(nullptr);
}

Details model_details(const ModelReport &model) {
    Details details;
    const KnownModel *known = find_model(model.code);
    details.add("Model", model_name(model), model.known() ? Severity::ok : Severity::unknown);
    details.add("Code", fmt::format("0x{:x} {}", model.code, known ? known->constant : ""));
    details.add("Product name", shown(model.product_name),
                model.product_name ? Severity::ok : Severity::unknown);
    details.add("Serial number", shown(model.serial),
                model.serial ? Severity::ok : Severity::warning);
    if (model.known()) {
        details.add("Disk slots", fmt::format("{}", model.disk_slots));
        details.add("Disks in arrays", fmt::format("{}", model.disk_count));
    }
    details.add("Data RAID type", model.data_raid_type < 0
                                      ? "not configured"
                                      : fmt::format("{}", model.data_raid_type));
    return details;
}

} // namespace

std::string model_word(int code) {
    const KnownModel *known = find_model(code);
    return known ? known->word : "unknown";
}

std::string model_name(const ModelReport &model) {
    const KnownModel *known = find_model(model.code);
    if (known == nullptr)
        return fmt::format("unknown model 0x{:x}", model.code);
    if (known->disks[0] == '\0')
        return known->family;
    return fmt::format("{}, {}", known->family, known->disks);
}

std::string model_heading(const ModelReport &model) {
    return fmt::format("{} (product {}, serial {})", model_name(model), shown(model.product_name),
                       shown(model.serial));
}

std::vector<Finding> model_findings(const ModelReport &model) {
    if (!model.known())
        return {{Severity::unknown, "the model cannot be told: " + in_words(*model.failure)}};
    if (!model.serial)
        return {{Severity::warning, "the serial number cannot be read"}};
    return {};
}

Json model_json(const ModelReport &model) {
    Json json;
    json["kind"] = "model";
    json["model"] = model_word(model.code);
    json["model_code"] = model.code;
    json["name"] = model_name(model);
    json["product_name"] = text_or_null(model.product_name);
    json["serial"] = text_or_null(model.serial);
    json["disk_slots"] = model.known() ? Json(model.disk_slots) : Json(nullptr);
    json["disk_count"] = model.known() ? Json(model.disk_count) : Json(nullptr);
    json["data_raid_type"] = model.data_raid_type < 0 ? Json(nullptr) : Json(model.data_raid_type);
    json["error"] = to_json(model.failure);
    return json;
}

Section model_section(const ModelReport &model) {
    Section section;
    section.key = "model";
    section.details = {model_details(model)};
    section.records = model_json(model);
    section.findings = model_findings(model);
    section.well = model_name(model);
    return section;
}

} // namespace zavctl
