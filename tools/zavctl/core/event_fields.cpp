#include "event_fields.h"

#include <fmt/format.h>

#include <cmath>
#include <limits>

namespace zavctl {

const Json *field_of(const Json &json, const std::string &field) {
    const auto found = json.find(field);
    return found == json.end() || found->is_null() ? nullptr : &*found;
}

int integer(const Json &json, const std::string &field) {
    const Json *value = field_of(json, field);
    return value == nullptr ? 0 : integer_of(*value, field);
}

zavSize size_in(const Json &json, const std::string &field) {
    const Json *value = field_of(json, field);
    if (value == nullptr)
        return 0;
    if (!value->is_number_unsigned())
        throw NoEvent(fmt::format("'{}' is a number from 0", field));
    return value->get<std::uint64_t>();
}

Json number(float value) {
    return std::isfinite(value) ? Json(static_cast<double>(value)) : Json(nullptr);
}

float real(const Json &json, const std::string &field) {
    if (json.contains(field) && json[field].is_null())
        return std::numeric_limits<float>::quiet_NaN();
    const Json *value = field_of(json, field);
    if (value == nullptr)
        return 0;
    if (!value->is_number())
        throw NoEvent(fmt::format("'{}' is a number", field));
    return static_cast<float>(value->get<double>());
}

void add_coded(Json &json, const std::string &field, const States &states, int code) {
    json[field] = word_of(states, code);
    json[field + "_code"] = code;
}

Json device_json(const zavDevice &device, const PathOf &path_of) {
    Json json = to_json(Address{device, path_of(device)});
    json["type_code"] = device.type;
    json["minor_type_code"] = device.minor_type;
    return json;
}

zavDevice device_of(const Json &json) {
    if (!json.is_object())
        throw NoEvent("an address is an object with type, minor_type, disk and part");
    const Json *type = field_of(json, "type");
    const Json *minor = field_of(json, "minor_type");
    zavDevice device{integer(json, "type_code"), integer(json, "minor_type_code"),
                     integer(json, "disk"), integer(json, "part")};
    if (type == nullptr || minor == nullptr || !type->is_string() || !minor->is_string())
        return device;
    const MinorType *known = find_minor_type(*type, *minor);
    if (known == nullptr)
        throw NoEvent(fmt::format("no device is of type {} {}", type->dump(), minor->dump()));
    if (device.type == 0 && device.minor_type == 0) {
        device.type = known->type;
        device.minor_type = known->code;
    }
    return device;
}

zavDevice device_of(const Json &json, const std::string &field) {
    const Json *value = field_of(json, field);
    return value == nullptr ? zavDevice{} : device_of(*value);
}

const Json &list_in(const Json &json, const std::string &field, std::size_t most) {
    static const Json none = Json::array();
    const Json *list = field_of(json, field);
    if (list == nullptr)
        return none;
    if (!list->is_array() || list->size() > most)
        throw NoEvent(fmt::format("'{}' is a list of at most {}", field, most));
    return *list;
}

int integer_of(const Json &value, const std::string &field) {
    const bool fits = value.is_number_integer() &&
                      (!value.is_number_unsigned() ||
                       value.get<std::uint64_t>() <= std::numeric_limits<int>::max()) &&
                      value.get<std::int64_t>() >= std::numeric_limits<int>::min() &&
                      value.get<std::int64_t>() <= std::numeric_limits<int>::max();
    if (!fits)
        throw NoEvent(fmt::format("'{}' is a whole number", field));
    return value.get<int>();
}

int coded(const Json &json, const std::string &field, const States &states) {
    const Json *said = field_of(json, field);
    const Json *code = field_of(json, field + "_code");
    if (said != nullptr && !said->is_string())
        throw NoEvent(fmt::format("'{}' is a word", field));
    if (code != nullptr) {
        const int given = integer_of(*code, field + "_code");
        if (said != nullptr && code_of(states, said->get<std::string>()) != given &&
            word_of(states, given) != said->get<std::string>())
            throw NoEvent(fmt::format("'{}' {} and '{}_code' {} contradict each other", field,
                                      said->dump(), field, given));
        return given;
    }
    if (said == nullptr)
        throw NoEvent(fmt::format("'{}' is missing", field));
    const std::optional<int> known = code_of(states, said->get<std::string>());
    if (!known)
        throw NoEvent(
            fmt::format("'{}' has no {}: there are {}", field, said->dump(), known_words(states)));
    return *known;
}

} // namespace zavctl
