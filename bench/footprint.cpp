#include "footprint.h"

#include "appliance.h"
#include "paired.h"
#include "require.h"

#include <cstdio>
#include <filesystem>
#include <sstream>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

namespace fs = std::filesystem;

namespace bench {

namespace {

constexpr int kRounds = 41;

// ---- Size ----

std::string output_of(const std::string &command) {
    std::string text;
    FILE *output = popen(command.c_str(), "re");
    require(output != nullptr, command);
    char part[512];
    while (fgets(part, sizeof part, output) != nullptr)
        text += part;
    require(pclose(output) == 0, command);
    return text;
}

struct Sections {
    long text;
    long data;
    long bss;
};

Sections sections_of(const std::string &library) {
    std::istringstream row(output_of("size '" + library + "' | tail -n 1"));
    Sections sections = {};
    require(static_cast<bool>(row >> sections.text >> sections.data >> sections.bss), "size");
    return sections;
}

void print_size(const std::string &library) {
    const std::string stripped = "/run/zav_bench_stripped";
    output_of("strip -o " + stripped + " '" + library + "'");
    const Sections sections = sections_of(library);
    printf(
        "\nlibzav.so.1: %ju bytes as built, %ju without symbols and debug information; text %ld, "
        "data %ld, bss %ld\n",
        fs::file_size(library), fs::file_size(stripped), sections.text, sections.data,
        sections.bss);
}

// ---- Fresh processes ----

// What they do, and what was measured of all of them.
struct Process {
    const char *name;
    std::string loads;
    std::string query;
    std::vector<double> loading; // microseconds of dlopen
    std::vector<double> whole;   // from before its start to its end
    std::vector<double> peak;    // kilobytes
};

void exec_probe(const Process &process, int output) {
    const std::string probe = build_directory() + "/zav_bench_probe";
    dup2(output, STDOUT_FILENO);
    const char *library = process.loads.empty() ? nullptr : process.loads.c_str();
    const char *query = process.query.empty() ? nullptr : process.query.c_str();
    execl(probe.c_str(), probe.c_str(), library, query, nullptr);
    _exit(127);
}

// What the process prints.
std::string run_probe(const Process &process) {
    int ends[2];
    require(pipe(ends) == 0, "pipe");
    const pid_t child = fork();
    require(child >= 0, "fork");
    if (child == 0)
        exec_probe(process, ends[1]);
    close(ends[1]);
    char text[128] = "";
    const ssize_t length = read(ends[0], text, sizeof text - 1);
    close(ends[0]);
    int status = -1;
    waitpid(child, &status, 0);
    require(length > 0 && status == 0, process.name);
    return text;
}

void measure(Process &process) {
    std::string told;
    process.whole.push_back(microseconds([&] { told = run_probe(process); }));
    std::istringstream numbers(told);
    double loading = 0;
    double peak = 0;
    require(static_cast<bool>(numbers >> loading >> peak), process.name);
    process.loading.push_back(loading);
    process.peak.push_back(peak);
}

std::vector<Process> processes() {
    const std::string library = build_directory() + "/libzav.so.1";
    const std::string nothing = build_directory() + "/libzav_bench_nothing.so";
    return {
        {"loads nothing", "", "", {}, {}, {}},
        {"loads a library of one function", nothing, "", {}, {}, {}},
        {"loads libzav.so.1", library, "", {}, {}, {}},
        {"... and asks zavGetModel", library, "zavGetModel", {}, {}, {}},
        {"... and asks zavGetStateDisk", library, "zavGetStateDisk", {}, {}, {}},
        {"... and asks updateData", library, "updateData", {}, {}, {}},
        {"... and asks zavgetStateLVMVG", library, "zavgetStateLVMVG", {}, {}, {}},
    };
}

} // namespace

// All in turn, round by round, so that whatever else the machine does disturbs all alike.
void report_footprint() {
    print_size(fs::canonical(build_directory() + "/libzav.so.1"));
    std::vector<Process> all = processes();
    for (int round = 0; round < kRounds; ++round)
        for (Process &process : all)
            measure(process);
    printf("\nA fresh process (medians of %d, in turn)\n%-34s %12s %12s %14s\n", kRounds, "",
           "dlopen us", "whole us", "resident KiB");
    for (const Process &process : all)
        printf("%-34s %12.1f %12.1f %14.0f\n", process.name, median(process.loading),
               median(process.whole), median(process.peak));
    fflush(stdout);
}

} // namespace bench
