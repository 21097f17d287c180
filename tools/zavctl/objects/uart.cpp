#include "../core/action_report.h"
#include "../system/change.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "../system/run.h"
#include "health_objects.h"

namespace zavctl {

namespace {

constexpr const char *sync_script = "/usr/bin/syncConf.sh";

constexpr VerbHelp uart_help = {
    "Routes the serial port",
    "MODE is 1 to 4. Three GPIO lines are set, one after the other:\n"
    "  MODE  LINE 34  LINE 35  LINE 49\n"
    "  1     1        1        0\n"
    "  2     0        0        1\n"
    "  3     0        0        0\n"
    "  4     0        1        0\n"
    "Shown: what the lines were set to. Critical: a line cannot be opened, and then none was\n"
    "changed; or it cannot be written.",
    "  zavctl uart 1",
};

constexpr VerbHelp sync_help = {
    "Has the appliance's configuration synchronised",
    "Runs /usr/bin/syncConf.sh and waits for its end, however long that takes; what it prints is\n"
    "told on standard error. Critical: it fails or is missing. Ctrl-C does not stop it, and\n"
    "--timeout does not apply.",
    "  zavctl sync",
};

Answer uart(int mode) {
    const int result = library::set_uart_mode(mode);
    std::optional<Failure> failure = library::failure_of(result);
    if (result == ZAV_RC_ERR_ENOENT)
        failure->meaning = "line 34, 35 or 49 in /proc/zav/sys/dev/gpio/ich9 cannot be opened; no "
                           "line was changed";
    else if (result == ZAV_RC_ERR)
        failure->meaning = "a line does not take its value; others may have changed";
    return {"uart", "", {action_section(uart_report(mode, failure))}};
}

Answer sync(const Session &session) {
    const int result =
        run_change(session.streams, library::synchronise, [] { return std::vector<Sight>(); });
    std::optional<Failure> failure = library::failure_of(result);
    if (failure)
        failure->meaning = find_tool(sync_script).empty()
                               ? "/usr/bin/syncConf.sh is missing or not executable"
                               : "/usr/bin/syncConf.sh has failed";
    return {"sync", "", {action_section(sync_report(failure))}};
}

} // namespace

void add_uart(Command root, Session &session) {
    const auto mode = std::make_shared<int>(0);
    const Command verb = add_verb(root, session, "uart", uart_help);
    verb.add_option("MODE", *mode, "1 to 4").required().within(1, 4);
    verb.callback([&session, mode] { session.action = [mode] { return uart(*mode); }; });
}

void add_sync(Command root, Session &session) {
    const Command verb = add_verb(root, session, "sync", sync_help);
    verb.callback([&session] { session.action = [&session] { return sync(session); }; });
}

} // namespace zavctl
