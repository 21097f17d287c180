#include "root/ups_files.hpp"

#include "launcher/sandbox.hpp"
#include "model/ups.hpp"
#include "root/files.hpp"

#include <chrono>
#include <filesystem>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

const fs::path status_file = "/var/log/apcupsd.status";
const fs::path event_file = "/var/log/zavapcupsd.event";

// Each writing has its own number. In between the file is left alone, whoever changes it.
void show(const fs::path &file, int writing, const std::string &text) {
    const fs::path shown = place::run + "/" + file.filename().string();
    const std::string number = std::to_string(writing);
    if (read_text(shown) == number)
        return;
    write_text(file, text);
    fs::last_write_time(file, fs::file_time_type::clock::now()); // the text may be the old one
    write_text(shown, number);
}

// Nobody writes the files any more, and readers tell that by their age. It is the appliance's time
// that passes.
void age(const fs::path &file, double seconds) {
    std::error_code missing;
    fs::last_write_time(file,
                        fs::file_time_type::clock::now() -
                            std::chrono::duration_cast<fs::file_time_type::duration>(
                                std::chrono::duration<double>(seconds)),
                        missing);
}

} // namespace

void publish_ups(const State &state) {
    const Ups &ups = state.ups;
    show(status_file, ups.statuses, ups_status_text(state));
    if (ups.events > 0)
        show(event_file, ups.events, ups_event_text(state));
    if (!ups.silent)
        return;
    age(status_file, state.now - ups.status_at);
    if (ups.events > 0)
        age(event_file, state.now - ups.event_at);
}

} // namespace zavsim
