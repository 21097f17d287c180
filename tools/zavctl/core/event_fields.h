// The fields that event records are made of, as JSON, both ways. What is read throws NoEvent with
// the field's name when it is not what it should be; a field that is missing is 0.
#pragma once

#include "event_json.h"

#include <algorithm>
#include <cstddef>
#include <fmt/format.h>
#include <string>

namespace zavctl {

// Null if there is no such field, or it is null.
const Json *field_of(const Json &json, const std::string &field);

int integer_of(const Json &value, const std::string &field);
int integer(const Json &json, const std::string &field);
zavSize size_in(const Json &json, const std::string &field);

// A value that is no number is null in JSON, and null is read as such.
Json number(float value);
float real(const Json &json, const std::string &field);

// The word of a code, and the code as FIELD_code.
void add_coded(Json &json, const std::string &field, const States &states, int code);

// The code of either; they must not contradict each other, and one must be there.
int coded(const Json &json, const std::string &field, const States &states);

Json device_json(const zavDevice &device, const PathOf &path_of);
zavDevice device_of(const Json &json);
zavDevice device_of(const Json &json, const std::string &field);

// An empty list if there is no such field.
const Json &list_in(const Json &json, const std::string &field, std::size_t most);

template <std::size_t size>
Json text(const char (&chars)[size]) {
    return std::string(chars, strnlen(chars, size));
}

template <std::size_t size>
void read_text(const Json &json, const std::string &field, char (&chars)[size]) {
    const Json *value = field_of(json, field);
    if (value == nullptr)
        return;
    if (!value->is_string() || value->get_ref<const std::string &>().size() >= size)
        throw NoEvent(fmt::format("'{}' is a text of at most {} bytes", field, size - 1));
    const std::string &given = value->get_ref<const std::string &>();
    std::copy(given.begin(), given.end(), chars);
}

} // namespace zavctl
