#include "../core/action_report.h"
#include "../core/led_report.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "asking.h"
#include "health_objects.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *led_meaning = "no LED. There are panel-1 to panel-6 (1 to 6) and disk-1 to "
                                    "disk-4 (7 to 10)";

constexpr VerbHelp get_help = {
    "States of the LEDs",
    "Shown: all LEDs, or those that are named: 1 to 6 (panel-1 to panel-6) of the front panel, 7\n"
    "to 10 (disk-1 to disk-4) of the disks. States of the panel's are off, on and value2 (LED 5);\n"
    "a disk's has two lines: off, second-on, first-on, first-2, first-2-second-on.\n"
    "On model 2980 the disks' LEDs are the RAID controller's and cannot be asked.\n"
    "Could not tell: a GPIO line cannot be read, or holds a number that is no state.",
    "  zavctl led get\n"
    "  zavctl led get disk-3 --json | jq -r '.leds[0].state'",
};

constexpr VerbHelp set_help = {
    "Sets an LED",
    "Shown: what the LED reads afterwards. The states are those of 'zavctl led get'; value2 is "
    "LED\n"
    "5's alone. Critical: it was not set, or reads something else.",
    "  zavctl led set panel-1 on\n"
    "  zavctl led set disk-3 first-on",
};

constexpr VerbHelp alarm_help = {
    "Hands an alarm to the driver of LED alarms, which makes a pattern of it",
    "Shown: what was handed over. Critical: /dev/zavledevent is missing, is in use by another\n"
    "program, refuses the alarm or has no room for it.",
    "  zavctl led alarm --priority 1 --code 3 --state 1",
};

constexpr VerbHelp poll_help = {
    "Takes a pending alarm from the driver of LED alarms",
    "Shown: the alarm, which nobody else gets then, or that none is pending; both are well.\n"
    "Could not tell: /dev/zavledevent is missing or in use by another program.",
    "  zavctl led poll\n"
    "  zavctl led poll --json | jq .alarm",
};

Failure led_failure(int result) {
    Failure failure = *library::failure_of(result);
    if (result == ZAV_RC_ERR_ENOENT)
        failure.meaning = "its GPIO line in /proc/zav/sys/dev/gpio/ich9 cannot be opened";
    else if (result == ZAV_RC_ERR)
        failure.meaning = "its GPIO line cannot be read or written, or holds no state";
    return failure;
}

std::optional<Failure> alarm_failure(int result) {
    std::optional<Failure> failure = library::failure_of(result);
    if (result == ZAV_RC_ERR_EACCES)
        failure->meaning = "/dev/zavledevent is missing, or another program has it";
    else if (result == ZAV_RC_ERR_ENOMEM)
        failure->meaning = "the driver has no room for another alarm";
    else if (failure)
        failure->meaning = "the driver refuses";
    return failure;
}

LedReport read_led(LedReport report) {
    const int answer = library::led_state(report.led);
    report.failure.reset();
    report.state = answer;
    if (!led_state_word(answer))
        report.failure = led_failure(answer);
    return report;
}

void refuse_controllers(int led, const ModelReport &model) {
    if (is_disk_led(led) && model.hardware_raid())
        throw UsageError(fmt::format("LED {}: on this model ({}) the LEDs of the disks are the "
                                     "RAID controller's",
                                     led_name(led), model_name(model)));
}

std::vector<int> leds_of(const std::vector<std::string> &words) {
    const ModelReport model = read_model();
    std::vector<int> leds = ids_of<int>(words, led_number, led_meaning);
    for (const int led : leds)
        refuse_controllers(led, model);
    if (words.empty())
        for (int led = 1; led <= last_led; ++led)
            if (!is_disk_led(led) || !model.hardware_raid())
                leds.push_back(led);
    return leds;
}

Answer get(Session &session, const std::vector<std::string> &words) {
    const auto reports = no_reports<LedReport>();
    session.ask(questions_of(leds_of(words), [&](int led) {
        const LedReport begin{led, 0, no_answer(session)};
        return question("LED " + led_name(led), begin, reports, read_led);
    }));
    return {"led get", "", {led_section(*reports)}};
}

// The library opens the line, which clears it, before it looks at the state.
void refuse_state(int led, const std::string &word) {
    const std::vector<std::string> states = states_of(led);
    if (std::find(states.begin(), states.end(), word) == states.end())
        throw UsageError(fmt::format("'{}' is no state of LED {}. There are: {}", printable(word),
                                     led_name(led), listed(states)));
}

Answer set(const std::string &led_word, const std::string &state_word) {
    const int led = leds_of({led_word}).front();
    refuse_state(led, state_word);
    LedChange change;
    change.wanted = *led_state(state_word);
    change.after.led = led;
    const int result = library::set_led(led, change.wanted);
    if (result != ZAV_RC_OK)
        change.failure = led_failure(result);
    change.after = read_led(change.after);
    return {"led set", "", {led_change_section(change)}};
}

Answer poll() {
    const library::AlarmAnswer answer = library::take_led_alarm();
    LedAlarm alarm{answer.result == ZAV_RC_OK, answer.alarm.priority, answer.alarm.ledcode,
                   answer.alarm.state, std::nullopt};
    if (answer.result != library::no_alarm_pending)
        alarm.failure = alarm_failure(answer.result);
    return {"led poll", "", {led_alarm_section(alarm)}};
}

void add_get(Command led, Session &session) {
    const auto words = std::make_shared<std::vector<std::string>>();
    const Command verb = add_verb(led, session, "get", get_help);
    verb.add_option("LED", *words, "panel-1 to panel-6, disk-1 to disk-4, or 1 to 10");
    verb.callback(
        [&session, words] { session.action = [&session, words] { return get(session, *words); }; });
}

void add_set(Command led, Session &session) {
    const auto name = std::make_shared<std::string>();
    const auto state = std::make_shared<std::string>();
    const Command verb = add_verb(led, session, "set", set_help);
    verb.add_option("LED", *name, "panel-1 to panel-6, disk-1 to disk-4, or 1 to 10").required();
    verb.add_option("STATE", *state, "off, on, value2; first-on, second-on, ...").required();
    verb.callback(
        [&session, name, state] { session.action = [name, state] { return set(*name, *state); }; });
}

void add_alarm(Command led, Session &session) {
    const auto alarm = std::make_shared<LedAlarm>();
    const Command verb = add_verb(led, session, "alarm", alarm_help);
    verb.add_option("--priority", alarm->priority, "Of the alarm, as the driver counts")
        .type_name("P")
        .required();
    verb.add_option("--code", alarm->code, "Which alarm").type_name("C").required();
    verb.add_option("--state", alarm->state, "Its state").type_name("S").required();
    verb.callback([&session, alarm] {
        session.action = [alarm] {
            const int result = library::put_led_alarm(alarm->priority, alarm->code, alarm->state);
            return Answer{"led alarm",
                          "",
                          {action_section(led_alarm_report(alarm->priority, alarm->code,
                                                           alarm->state, alarm_failure(result)))}};
        };
    });
}

} // namespace

void add_led(Command root, Session &session) {
    const Command led = add_object(root, "led", "LEDs and their alarms: get, set, alarm, poll");
    add_get(led, session);
    add_set(led, session);
    add_alarm(led, session);
    add_verb(led, session, "poll", poll_help).callback([&session] { session.action = poll; });
}

} // namespace zavctl
