#include "appliance.h"

#include "../core/metrics.h"
#include "../system/replace.h"

#include <fmt/format.h>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <memory>

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "The whole appliance as metrics for Prometheus",
    "Shown: the text exposition format, every family with its HELP and TYPE. States are one "
    "series\n"
    "per state, 1 for the one that a thing has and 0 for the others; zav_answered tells of each\n"
    "thing whether it gave an answer to trust; what gave no number has no series.\n"
    "--output writes the file whole and in one step, beside it and renamed, as the textfile\n"
    "collector of node_exporter wants it; its name is to end in .prom.\n"
    "Exit status 0: written, whatever state the appliance is in, since a scrape must not fail "
    "when\n"
    "it has most to tell; 3: it cannot be written.",
    "  zavctl metrics\n"
    "  zavctl metrics --output /var/lib/prometheus/node-exporter/zav.prom",
};

int failed(const Session &session, const std::string &what, int error) {
    if (error != EPIPE)
        session.streams.say(fmt::format("zavctl: {}: {}\n", what, std::strerror(error)));
    return exit_status(Severity::unknown);
}

int metrics(Session &session, const std::string &file, Processor processor) {
    const auto begin = std::chrono::steady_clock::now();
    const Answer answer = ask_appliance(session, "metrics", processor);
    const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - begin;
    const std::string text = metrics_text(answer, taken.count());
    if (file.empty()) {
        const int error = session.streams.write(text);
        return error == 0 ? 0 : failed(session, "cannot write the metrics", error);
    }
    const int error = replace_file(file, text);
    return error == 0 ? 0 : failed(session, "cannot write " + printable(file), error);
}

} // namespace

void add_metrics(Command root, Session &session) {
    const auto file = std::make_shared<std::string>();
    const auto no_processor = std::make_shared<bool>(false);
    const Command verb = add_verb(root, session, "metrics", help);
    verb.add_flag("--no-processor", *no_processor,
                  "Leave the processor out, which takes 10 seconds to measure");
    verb.add_option("--output", *file, "Write the file in one step, in place of standard output")
        .type_name("FILE");
    verb.callback([&session, file, no_processor] {
        session.program = [&session, file, no_processor] {
            return metrics(session, *file,
                           *no_processor ? Processor::left_out : Processor::measured);
        };
    });
}

} // namespace zavctl
