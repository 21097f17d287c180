#include "disc.h"

#include "files.h"
#include "library.h"
#include "run.h"

#include "zav_api.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>
#include <sstream>
#include <unistd.h>

namespace zavctl {

namespace {

constexpr const char *drive_table = "/proc/sys/dev/cdrom/info";

struct BurnerTool {
    const char *name;
    const char *purpose;
    const char *without;
    bool counted; // by the library, when it says whether all are there
};

constexpr const char *no_dvd = "no DVD is burned or erased";
constexpr const char *no_disc_told = "no disc can be told, burned or erased";
constexpr const char *no_format = "no disc is formatted for packet writing";

constexpr BurnerTool burner_tools[] = {
    {"cdrecord", "burning CDs, the tray", "no CD can be told or burned, the tray does not open",
     true},
    {"mkisofs", "file systems for discs", "no disc is burned", true},
    {"growisofs", "burning DVDs", no_dvd, true},
    {"dvd+rw-mediainfo", "what a disc is", no_disc_told, true},
    {"dvd+rw-format", "erasing DVD-RWs", "no DVD-RW is erased", true},
    {"cdrwtool", "formatting CD-RWs", no_format, true},
    {"pktsetup", "packet writing", no_format, true},
    {"mkudffs", "formatting DVD+RWs", no_format, true},
    {"killall", "stopping a job", "no job of the burner can be stopped", false},
    {"du", "the size of what is burned", "every burn is refused as too large", false},
};

// The kernel keeps 15 characters of a name, so that a dvd+rw-mediainfo is never found.
constexpr const char *watched_tools[] = {"growisofs",     "cdrecord", "mkisofs",
                                         "dvd+rw-format", "cdrwtool", "mkudffs"};

void add_running(const char *name, std::vector<RunningTool> &running) {
    constexpr unsigned long no_process = 2; // 1: none left, 2: /proc cannot be read
    for (unsigned number = 1;; ++number) {
        const unsigned long process = PIDOF(name, number);
        if (process <= no_process)
            return;
        running.push_back({name, process});
    }
}

struct QueryResult {
    int code;
    zavMediaInfo media;
};

std::string query() {
    QueryResult result{};
    result.code = zavQueryDisc(&result.media, 0);
    std::string bytes(sizeof result, '\0');
    std::memcpy(bytes.data(), &result, sizeof result);
    return bytes;
}

void read_query(const Job &job, const DriveFacts &drive, DiscReport &report) {
    QueryResult result{};
    if (job.end().how != ChildEnd::How::answered || job.result().size() != sizeof result) {
        report.failure = Failure{-1, "", child_end_words(job.end())};
        return;
    }
    std::memcpy(&result, job.result().data(), sizeof result);
    report.media = result.media;
    report.failure = library::failure_of(result.code);
    if (report.failure)
        report.failure->meaning = query_failure_meaning(result.code, drive);
}

// What du complains of stands before its one line, which begins with the number; a path may have
// several lines.
void read_measure(const std::string &output, SourceFact &source) {
    std::istringstream lines(output);
    for (std::string line; !source.kib && std::getline(lines, line);) {
        if (!line.empty() && std::isdigit(static_cast<unsigned char>(line.front())) != 0)
            source.kib =
                static_cast<int>(std::min(std::strtol(line.c_str(), nullptr, 10), 0x7FFFFFFFL));
        else if (source.trouble.empty())
            source.trouble = trimmed(line);
    }
}

int run_burn(const BurnRequest &request, SessionType session) {
    std::string path = request.source.path;
    std::string name = request.name;
    cleanUp(); // a link that an earlier burn left would be burned as well
    if (request.source.is_file)
        return name.empty() ? zavCDBurnFile(path.data())
                            : zavCDBurnFileEx(path.data(), name.data());
    return zavCDBurnEx(path.data(), name.data(), static_cast<int>(session));
}

} // namespace

DriveFacts read_drive() {
    DriveFacts facts;
    facts.scd0 = access("/dev/scd0", F_OK) == 0;
    facts.cdrom = access("/dev/cdrom", F_OK) == 0;
    facts.combo = zavIsComboDrive();
    facts.table = read_file(drive_table).text;
    return facts;
}

DiscReport query_disc(std::chrono::seconds limit) {
    const DriveFacts drive = read_drive();
    DiscReport report;
    report.drive = kind_of_drive(drive);
    if (report.drive == DriveKind::none)
        return report;
    Job job(query);
    if (job.wait(limit))
        read_query(job, drive, report);
    else
        report.failure =
            Failure{-1, "", "no answer within " + std::to_string(limit.count()) + " s"};
    return report;
}

BurnerFacts read_burner(const DiscReport &disc) {
    BurnerFacts facts;
    facts.disc = disc;
    facts.tools_complete = checkExternalBin() == ZAV_RC_OK;
    for (const BurnerTool &tool : burner_tools)
        if (tool.counted && find_tool(tool.name).empty())
            facts.missing_tools.emplace_back(tool.name);
    facts.running = running_tools();
    return facts;
}

BurnerPlatform read_burner_platform() {
    BurnerPlatform facts;
    facts.drive = read_drive();
    facts.table_error = read_file(drive_table).error;
    for (const BurnerTool &tool : burner_tools)
        facts.tools.push_back(
            {tool.name, find_tool(tool.name), tool.purpose, tool.without, Severity::warning});
    return facts;
}

void measure(SourceFact &source, std::chrono::seconds limit) {
    const RunResult du = run({"du", "-sL", source.path}, limit);
    if (du.end == RunResult::End::exited)
        read_measure(du.output, source);
    else
        source.trouble = "du: " + how_it_ended(du);
}

std::optional<int> image_size(const SourceFact &source, std::chrono::seconds limit) {
    constexpr long sector = 2; // kilobytes
    const RunResult mkisofs =
        run({"mkisofs", "-R", "-J", "-f", "-q", "-print-size", source.path}, limit);
    const std::string output = trimmed(mkisofs.output);
    const std::string last = output.substr(output.rfind('\n') + 1);
    const long sectors = std::strtol(last.c_str(), nullptr, 10);
    if (mkisofs.end != RunResult::End::exited || mkisofs.status != 0 || sectors <= 0 ||
        sectors > 0x7FFFFFFFL / sector)
        return std::nullopt;
    return static_cast<int>(sectors * sector);
}

std::vector<RunningTool> running_tools() {
    std::vector<RunningTool> running;
    for (const char *name : watched_tools)
        add_running(name, running);
    return running;
}

namespace library {

std::string burn(const BurnRequest &request, SessionType session) {
    return std::to_string(run_burn(request, session));
}

std::string blank_disc() {
    return std::to_string(zavCDBlank());
}

std::string format_disc() {
    return std::to_string(zavCDFormat());
}

int code_in(const std::string &result) {
    return static_cast<int>(std::strtol(result.c_str(), nullptr, 10));
}

// The library would have its tool complain of a file that is not there.
std::optional<int> disc_progress() {
    if (access("/tmp/progress.outfile", F_OK) != 0)
        return std::nullopt;
    return zavCDProgress();
}

void cancel_job() {
    zavCDBurnCancel();
}

void cancel_job_and_wait() {
    zavCDBurnSyncCancel();
}

void eject_disc() {
    zavEjectDVD();
}

} // namespace library

} // namespace zavctl
