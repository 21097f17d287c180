#include "root/driver_files.hpp"

#include "model/sensors.hpp"
#include "root/files.hpp"

#include <filesystem>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

std::string trimmed(const std::string &text) {
    return text.substr(0, text.find_last_not_of(" \t\n") + 1);
}

// A file that a program has emptied belongs to it for a while: the text follows.
bool may_be_replaced(const std::string &path, const std::string &present,
                     const DriverTexts &taken) {
    if (present.empty())
        return !is_fresh(path);
    const auto found = taken.find(path);
    return found == taken.end() || found->second == present;
}

void show_reading(const DriverFile &file) {
    if (file.text)
        write_text(file.path, *file.text);
    else
        fs::remove(file.path);
}

// In place, for whoever has it open writes to it still.
void show_writable(const DriverFile &file, const DriverTexts &taken) {
    if (!file.text) {
        fs::remove(file.path);
        return;
    }
    const auto present = read_text(file.path);
    if (!present)
        write_text(file.path, *file.text);
    else if (trimmed(*present) != trimmed(*file.text) &&
             may_be_replaced(file.path, *present, taken))
        overwrite_text(file.path, *file.text);
}

} // namespace

DriverTexts take_driver_files(State &state) {
    DriverTexts taken;
    for (const DriverFile &file : writable_files(state)) {
        const auto text = read_text(file.path);
        if (!text || text->empty())
            continue;
        taken[file.path] = *text;
        if (trimmed(*text) != trimmed(file.text.value_or("")))
            take_written(state, file.path, *text);
    }
    return taken;
}

void publish_driver_files(const State &state, const DriverTexts &taken) {
    for (const DriverFile &file : reading_files(state))
        show_reading(file);
    for (const DriverFile &file : writable_files(state))
        show_writable(file, taken);
}

} // namespace zavsim
