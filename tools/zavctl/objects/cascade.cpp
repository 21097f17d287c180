#include "cascade.h"

#include "../core/event.h"
#include "../core/raid_set.h"
#include "../core/report_check.h"
#include "../core/slot_id.h"
#include "../system/files.h"
#include "../system/library.h"
#include "../system/run.h"
#include "asking.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr std::chrono::seconds script_limit{10};
constexpr int unit_items = 5;
constexpr int card_items = 4;

zavDevice enclosure_device(int unit) {
    if (unit == controller)
        return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0};
    return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, packed({unit, 1}), 0};
}

void add_set(EnclosureReport &enclosure, int unit) {
    const library::SetAnswer answer = library::raid_set(enclosure_device(unit));
    if (answer.result == ZAV_RC_OK)
        enclosure.set = answer.set;
    else
        enclosure.no_set = answer.result == ZAV_RC_ERR_ENODEV
                               ? doubt_without_set(unit)
                               : in_words(*library::failure_of(answer.result));
}

// All readings stand in one line: after the first that fails the others are not asked.
template <class Ask>
void add_readings(EnclosureReport &enclosure, int items, const Ask &ask) {
    enclosure.readings.assign(static_cast<std::size_t>(items), std::nullopt);
    int item = 0;
    for (std::optional<double> &reading : enclosure.readings) {
        const library::ReadingAnswer answer = ask(item++);
        if (answer.result != ZAV_RC_OK)
            return;
        reading = answer.value;
    }
}

// The library reads a script that fails as no units at all.
std::string doubt_of_empty_cascade() {
    if (find_tool(cascade_script).empty())
        return fmt::format("{} is missing or not executable", cascade_script);
    const RunResult script = run({cascade_script}, script_limit);
    if (script.end == RunResult::End::exited && script.status == 0)
        return "";
    return fmt::format("{} does not do its work ({})", cascade_script, how_it_ended(script));
}

std::optional<Failure> failure_of_cascade(int result) {
    std::optional<Failure> failure = library::failure_of(result);
    if (failure && result == ZAV_RC_ERR)
        failure->meaning = "an expander has no link towards the controller, or the report is not "
                           "to be had, or the list of units cannot be written";
    return failure;
}

struct Discovery {
    std::vector<UnitReport> units;
    std::optional<Failure> failure;
    std::string doubt;
};

Discovery discover() {
    const library::UnitsAnswer answer = library::expansion_units();
    Discovery found{units_of(answer.units), failure_of_cascade(answer.result), ""};
    if (found.units.empty() && !found.failure)
        found.doubt = doubt_of_empty_cascade();
    for (UnitReport &unit : found.units)
        if (unit.present)
            add_set(unit.enclosure, unit.number);
    return found;
}

EnclosureReport read_controller() {
    EnclosureReport enclosure;
    add_set(enclosure, controller);
    add_readings(enclosure, card_items, library::card_reading);
    return enclosure;
}

bool borrows_readings(int unit) {
    const FileFact report = read_file(controller_report);
    for (const CheckedEnclosure &enclosure : check_report("", report.text).enclosures)
        if (enclosure.unit == unit)
            return enclosure.borrows_readings;
    return false;
}

UnitSensor asked_sensor(int unit, int id) {
    const library::UnitAnswer answer = library::unit_state(unit, id);
    UnitSensor sensor;
    sensor.state = answer.state.state;
    sensor.value = as_written(answer.state.value).value_or(0);
    sensor.failure = library::failure_of(answer.result);
    sensor.record = answered_event(answer.result, answer.state);
    if (sensor.failure && sensor.failure->code == ZAV_RC_ERR_ENODEV)
        sensor.failure->meaning = "the RAID controller's report has no section of this unit";
    if (sensor.failure && sensor.failure->code == ZAV_RC_ERR_ENOENT)
        sensor.failure->meaning = "the RAID controller's report cannot be read";
    if (!sensor.failure && answer.state.rbod.iExist != 1)
        sensor.doubt = "the unit has gone meanwhile";
    doubt_reading(sensor);
    return sensor;
}

UnitReport with_sensors(UnitReport unit) {
    unit.temperature = asked_sensor(unit.number, ZAV_RBOD_TEMP_CPU);
    unit.voltage = asked_sensor(unit.number, ZAV_RBOD_VOLT_CPU);
    add_readings(unit.enclosure, unit_items,
                 [&unit](int item) { return library::unit_reading(unit.number, item); });
    if (borrows_readings(unit.number))
        for (UnitSensor *sensor : {&unit.temperature, &unit.voltage})
            sensor->doubt = "the unit's section of the RAID controller's report has no monitor "
                            "line: this is the next one's";
    return unit;
}

} // namespace

SharedCascade begin_cascade(const Machine &machine, const Session &session) {
    auto cascade = std::make_shared<CascadeReport>();
    if (machine.model.hardware_raid()) {
        cascade->failure = no_answer(session);
        cascade->controller.no_set = cascade->failure->meaning;
    }
    return cascade;
}

std::vector<Question> ask_cascade(const Machine &machine, const SharedCascade &cascade) {
    if (!machine.model.hardware_raid())
        return {};
    const auto units = [cascade] {
        return [found = discover(), cascade] {
            cascade->units = found.units;
            cascade->failure = found.failure;
            cascade->doubt = found.doubt;
        };
    };
    const auto own = [cascade] {
        return [enclosure = read_controller(), cascade] { cascade->controller = enclosure; };
    };
    return {{"the expansion units", units}, {"the RAID controller", own}};
}

std::vector<Question> ask_sensors(const Session &session, const SharedCascade &cascade) {
    std::vector<Question> questions;
    std::size_t next = 0;
    for (UnitReport &unit : cascade->units) {
        const std::size_t index = next++;
        if (!unit.present)
            continue;
        unit.temperature.failure = unit.voltage.failure = no_answer(session);
        questions.push_back({fmt::format("unit {}", unit.number), [begin = unit, index, cascade] {
                                 return [unit = with_sensors(begin), index, cascade] {
                                     cascade->units[index] = unit;
                                 };
                             }});
    }
    return questions;
}

SharedCascade asked_cascade(Session &session, const Machine &machine) {
    SharedCascade cascade = begin_cascade(machine, session);
    session.ask(ask_cascade(machine, cascade));
    return cascade;
}

void refuse_foreign(const Machine &machine, const std::string &word, const zavDevice &device) {
    const int minor = device.minor_type;
    const bool hardware = minor == ZAV_MINDEV_HDD_HWSATA || minor == ZAV_MINDEV_HDD_SAS ||
                          minor == ZAV_MINDEV_RAID_HW || minor == ZAV_MINDEV_RAID_SAS;
    const bool software = minor == ZAV_MINDEV_HDD_SATA || minor == ZAV_MINDEV_RAID_SW;
    const ModelReport &model = machine.model;
    if (model.known() && hardware && !model.hardware_raid())
        throw UsageError(fmt::format("'{}': this model ({}) has no RAID controller and no "
                                     "expansion units",
                                     printable(word), model_name(model)));
    if (model.known() && software && model.hardware_raid())
        throw UsageError(fmt::format("'{}': disks and arrays of this model ({}) are the RAID "
                                     "controller's, named like 1 and 2-1, which is number 1 of "
                                     "unit 2",
                                     printable(word), model_name(model)));
}

} // namespace zavctl
