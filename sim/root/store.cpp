#include "root/store.hpp"

#include "launcher/sandbox.hpp"
#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/driver_events.hpp"
#include "model/factory.hpp"
#include "model/json.hpp"
#include "model/sentences.hpp"
#include "root/clock.hpp"
#include "root/driver_queue.hpp"
#include "root/optical_files.hpp"

#include <cerrno>
#include <fcntl.h>
#include <stdexcept>
#include <sys/file.h>
#include <system_error>

namespace zavsim {

namespace {

const std::string state_file = place::run + "/state.json";
const std::string lock_file = place::run + "/lock";

int open_locked() {
    const int fd = open(lock_file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0660);
    while (fd >= 0 && flock(fd, LOCK_EX) != 0 && errno == EINTR) {
    }
    return fd;
}

State load() {
    const auto text = read_text(state_file);
    if (!text)
        throw std::runtime_error("no simulated appliance here (" + state_file + " is missing)");
    return state_from_text(*text);
}

// A command stays in the file until it is taken; the list of devices then replaces it.
std::string take_scsi_command(State &state) {
    const auto text = read_text("/proc/scsi/scsi");
    if (!text || text->rfind("scsi ", 0) != 0)
        return {};
    scsi_command(state, *text);
    return *text;
}

} // namespace

Turn::Turn() : lock_(open_locked()), state_(load()) {
    advance(state_, (machine_seconds() - state_.real_start) * state_.time_scale);
    notice_ended_job(state_);
    taken_ = {take_scsi_command(state_), take_driver_files(state_)};
}

bool Turn::commit() {
    look_for_changes(state_);
    hand_over_events(state_);
    write_text(state_file, to_text(state_));
    return publish(state_, taken_);
}

void start_model(const Options &options) {
    State state =
        new_appliance({options.model, options.level, options.tools == "current", options.time_scale,
                       options.hosts == "ata", options.units, options.nics});
    state.real_start = machine_seconds();
    state.scenario = parse_scenario(options.scenario, options.scenario_file).events;
    write_text(state_file, to_text(state));
    publish(state, {});
}

} // namespace zavsim
