#include "../core/raid_set.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "asking.h"
#include "health_objects.h"
#include "health_surveys.h"

#include <sys/stat.h>

namespace zavctl {

namespace {

constexpr const char *daemon_file = "/var/log/apcupsd.status";
constexpr const char *hook_file = "/var/log/zavapcupsd.event";
constexpr int incomplete = 42;

constexpr VerbHelp help = {
    "The UPS: on line or on battery, and how full the battery is",
    "Shown: state, charge, and who told it:\n"
    "  online      with more than 20 % charge; with less: warning          ok\n"
    "  on battery  the power has failed                                    warning\n"
    "              and 20 % charge or less is left                         critical\n"
    "  other       neither, such as a test of the battery; with the number that the appliance's\n"
    "              hook wrote                                              warning\n"
    "  none        there is no word of a UPS                               ok\n"
    "  unknown     the daemon's word is older than 90 seconds, or cannot be read\n"
    "                                                                      could not tell\n"
    "The daemon writes /var/log/apcupsd.status, the appliance's hook /var/log/zavapcupsd.event;\n"
    "the newer one counts. A machine that has neither file has no UPS.",
    "  zavctl ups\n"
    "  zavctl ups --json | jq .ups.charge_percent",
};

struct Written {
    bool exists = false;
    time_t at = 0;
};

Written written(const char *path) {
    struct stat file {};
    const bool exists = stat(path, &file) == 0;
    return {exists, exists ? file.st_mtime : 0};
}

Failure ups_failure(int result) {
    Failure failure = *library::failure_of(result);
    if (result == ZAV_RC_ERR_ENODEV)
        failure.meaning = written(daemon_file).exists
                              ? "the UPS daemon does not run: its word is older than 90 seconds"
                              : "the UPS daemon has no status file, /var/log/apcupsd.status";
    else if (result == ZAV_RC_ERR_EACCES)
        failure.meaning = "a file of the UPS in /var/log cannot be read, is empty or too short";
    else if (result == incomplete)
        failure.meaning = "/var/log/apcupsd.status lacks LINEV, BCHARGE or STATUS";
    return failure;
}

UpsReport asked(UpsReport report) {
    const library::UpsAnswer answer = library::ups_state();
    const Written daemon = written(daemon_file);
    const Written hook = written(hook_file);
    report.failure.reset();
    report.present = daemon.exists || hook.exists;
    report.from_hook = hook.exists && hook.at >= daemon.at;
    report.state = answer.state.state;
    report.charge = as_written(answer.state.charge);
    if (answer.result != ZAV_RC_OK)
        report.failure = ups_failure(answer.result);
    doubt_charge(report);
    return report;
}

Answer ups(Session &session) {
    const auto reports = no_reports<UpsReport>();
    session.ask(ask_ups(session, reports));
    return {"ups", "", {ups_section(reports->front())}};
}

} // namespace

std::vector<Question> ask_ups(const Session &session, const Shared<UpsReport> &reports) {
    UpsReport begin;
    begin.present = true;
    begin.failure = no_answer(session);
    return {question("the UPS", begin, reports, asked)};
}

void add_ups(Command root, Session &session) {
    const Command verb = add_verb(root, session, "ups", help);
    verb.callback([&session] { session.action = [&session] { return ups(session); }; });
}

} // namespace zavctl
