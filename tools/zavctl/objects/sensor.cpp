#include "../core/raid_set.h"
#include "../system/files.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "asking.h"
#include "health_objects.h"
#include "health_surveys.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "Temperatures, voltages and fans",
    "Shown: one line per sensor with its reading and the limits at and beyond which it is not\n"
    "normal, and what it measures:\n"
    "  normal    the reading is within the limits                        ok\n"
    "  warning   it has reached a warning limit                          warning\n"
    "  critical  it has reached a critical limit, or an alarm is latched critical\n"
    "  unknown   the driver's file cannot be read, or holds no number    could not tell\n"
    "An alarm that is latched stays when the reading is normal again, until 'zavctl sensor reset'\n"
    "clears it. thermal-4 is the RAID controller's, of model 2980 alone. Fan 4 tells no speed.\n"
    "All are asked at the same time. A fan that is slow or stands still is read three times,\n"
    "which takes 6 seconds.",
    "  zavctl sensor list\n"
    "  zavctl sensor list --jsonl | jq -r 'select(.kind == \"thermal\") | \"\\(.place) "
    "\\(.value)\"'",
};

constexpr VerbHelp show_help = {
    "One sensor, or several, in detail",
    "Shown: reading, limits and state; these and the exit status are those of 'zavctl sensor "
    "list'.",
    "  zavctl sensor show thermal-1\n"
    "  zavctl sensor show fan-1 fan-2 fan-3 fan-4 --json",
};

constexpr VerbHelp reset_help = {
    "Clears latched alarms of temperatures and voltages",
    "Shown: whether each alarm was cleared, and what the sensor says since: one whose reading is\n"
    "still beyond its limits stays critical. Fans latch no alarm, nor does thermal-4.\n"
    "Critical: an alarm was not cleared, or the sensor is critical. Else as 'zavctl sensor list'.",
    "  zavctl sensor reset thermal-1\n"
    "  zavctl sensor reset thermal-1 volt-3\n"
    "  zavctl sensor reset --all",
};

std::string driver_path(const char *file) {
    return std::string("/proc/zav/sys/") + file;
}

std::string cannot_be_read(const Sensor &sensor) {
    if (!latches(sensor))
        return driver_path(sensor.file) + " cannot be read";
    return fmt::format("{} or {} cannot be read", driver_path(sensor.file),
                       driver_path(sensor.status));
}

Failure reading_failure(const Sensor &sensor, int result) {
    Failure failure = *library::failure_of(result);
    if (result == ZAV_RC_ERR_ENODEV)
        failure.meaning = "only model 2980 has this sensor";
    else if (result == ZAV_RC_ERR_EACCES && is_controllers(sensor))
        failure.meaning = "the RAID controller tells no temperature";
    else if (result == ZAV_RC_ERR_EACCES)
        failure.meaning = cannot_be_read(sensor);
    return failure;
}

SensorReport asked(SensorReport report) {
    const library::SensorAnswer answer = library::sensor_state(*report.sensor);
    report.failure.reset();
    if (answer.result != ZAV_RC_OK)
        report.failure = reading_failure(*report.sensor, answer.result);
    report.value = as_written(answer.state.value);
    report.state = answer.state.state;
    doubt_reading(report);
    if (latches(*report.sensor))
        doubt_status(report, read_file(driver_path(report.sensor->status)).text);
    return report;
}

SensorReset reset(SensorReset reset) {
    const Sensor &sensor = *reset.after.sensor;
    const int result = library::reset_sensor(sensor);
    reset.failure = library::failure_of(result);
    if (result == ZAV_RC_ERR_EACCES)
        reset.failure->meaning = driver_path(sensor.status) + " cannot be written";
    reset.after = asked(reset.after);
    return reset;
}

Answer list(Session &session) {
    const auto reports = no_reports<SensorReport>();
    session.ask(ask_sensors(listed_sensors(read_machine()), session, reports));
    return {"sensor list", "", {sensor_list_section(*reports)}};
}

std::vector<const Sensor *> sensors_of(const std::vector<std::string> &words) {
    const auto meant = [](const std::string &word) {
        const Sensor *sensor = find_sensor(word);
        return sensor == nullptr ? std::nullopt : std::optional(sensor);
    };
    return ids_of<const Sensor *>(words, meant,
                                  "no sensor. There are thermal-1 to thermal-4, volt-1 to volt-5 "
                                  "and fan-1 to fan-4");
}

void refuse_foreign(const Sensor &sensor, const ModelReport &model) {
    if (is_controllers(sensor) && model.known() && !model.hardware_raid())
        throw UsageError(fmt::format("this model ({}) has no {}: it is the RAID controller's, of "
                                     "model 2980",
                                     model_name(model), word_of(sensor)));
}

Answer show(Session &session, const std::vector<std::string> &words) {
    const std::vector<const Sensor *> sensors = sensors_of(words);
    const ModelReport model = read_model();
    for (const Sensor *sensor : sensors)
        refuse_foreign(*sensor, model);
    const auto reports = no_reports<SensorReport>();
    session.ask(ask_sensors(sensors, session, reports));
    return {"sensor show", "", {sensor_show_section(*reports)}};
}

std::vector<const Sensor *> sensors_to_reset(const std::vector<std::string> &words, bool all) {
    if (all == !words.empty())
        throw UsageError("name the sensors whose alarms are to be cleared, or --all");
    std::vector<const Sensor *> sensors = sensors_of(words);
    for (const Sensor *sensor : sensors)
        if (!latches(*sensor))
            throw UsageError(fmt::format("{} cannot be reset: {}", word_of(*sensor),
                                         is_controllers(*sensor)
                                             ? "the RAID controller latches no alarm"
                                             : "a fan latches no alarm"));
    if (all)
        for (const Sensor &sensor : all_sensors())
            if (latches(sensor))
                sensors.push_back(&sensor);
    return sensors;
}

Answer reset_alarms(Session &session, const std::vector<std::string> &words, bool all) {
    const auto resets = no_reports<SensorReset>();
    std::vector<Question> questions;
    for (const Sensor *sensor : sensors_to_reset(words, all)) {
        SensorReset begin;
        begin.after.sensor = sensor;
        begin.failure = begin.after.failure = no_answer(session);
        questions.push_back(question(word_of(*sensor), begin, resets, reset));
    }
    session.ask(questions);
    return {"sensor reset", "", {sensor_reset_section(*resets)}};
}

void add_reset(Command sensor, Session &session) {
    const auto words = std::make_shared<std::vector<std::string>>();
    const auto all = std::make_shared<bool>(false);
    const Command verb = add_verb(sensor, session, "reset", reset_help);
    verb.add_option("SENSOR", *words, "Such as thermal-1 or volt-3");
    verb.add_flag("--all", *all, "Every temperature and voltage of the main board");
    verb.callback([&session, words, all] {
        session.action = [&session, words, all] { return reset_alarms(session, *words, *all); };
    });
}

} // namespace

std::vector<const Sensor *> listed_sensors(const Machine &machine) {
    std::vector<const Sensor *> sensors;
    for (const Sensor &sensor : all_sensors())
        if (!is_controllers(sensor) || machine.model.hardware_raid())
            sensors.push_back(&sensor);
    return sensors;
}

std::vector<Question> ask_sensors(const std::vector<const Sensor *> &sensors,
                                  const Session &session, const Shared<SensorReport> &reports) {
    return questions_of(sensors, [&session, &reports](const Sensor *sensor) {
        SensorReport begin;
        begin.sensor = sensor;
        begin.failure = no_answer(session);
        return question(word_of(*sensor), begin, reports, asked);
    });
}

void add_sensor(Command root, Session &session) {
    const Command sensor =
        add_object(root, "sensor", "Temperatures, voltages, fans: list, show, reset");
    add_list(sensor, session, list_help, list);
    add_show<std::string>(sensor, session, show_help,
                          {"SENSOR", "thermal-1 to -4, volt-1 to -5, fan-1 to -4"}, show);
    add_reset(sensor, session);
}

} // namespace zavctl
