// Progress of a running job, its cancellation, and the clean-up of what it leaves behind.
#include "cdburn/zav_cdburn_progress_parse.h"
#include "common/diag.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "work_files.h"
#include "zav_api.h"

#include <cctype>
#include <cstdio>
#include <cstring>
#include <dirent.h>
#include <unistd.h>

namespace {

// ---- Simulated progress, where a tool reports none ----

struct Course {
    int updates;
    int step; // percent
    unsigned pause;
};

constexpr Course kCdBlank = {24, 4, 1};
constexpr Course kDvdBlank = {96, 1, 10};
constexpr Course kDvdEmpty = {9, 10, 1};

// The first line tells where the progress began.
void write_progress(int percent) {
    zav::File file;
    zav::write_work_file(file, zav::kProgressFile);
    if (!file)
        return;
    fprintf(file.get(), "%d%s\n", 0, "% done, estimate finish");
    fprintf(file.get(), "%d%s\n", percent, "% done, estimate finish");
}

// To the end, also when the job has ended before.
void run_course(const Course &course) {
    for (int i = 0; i < course.updates; ++i) {
        write_progress(i * course.step);
        sleep(course.pause);
    }
}

// ---- Running media tools ----

constexpr const char *kTools[] = {"growisofs", "cdrecord", "mkisofs", "dvd+rw-mediainfo",
                                  "dvd+rw-format"};

bool any_tool_runs() {
    for (const char *tool : kTools)
        if (PIDOF(tool, 1) != 1)
            return true;
    return false;
}

class ProcessTable {
  public:
    ProcessTable() : directory_(opendir("/proc")) {}
    ProcessTable(const ProcessTable &) = delete;
    ProcessTable &operator=(const ProcessTable &) = delete;
    ~ProcessTable() {
        if (directory_ != nullptr)
            closedir(directory_);
    }

    explicit operator bool() const { return directory_ != nullptr; }

    // The next process's number as text, or null.
    const char *next() {
        while (const dirent *entry = readdir(directory_))
            if (entry->d_name[strspn(entry->d_name, "0123456789")] == '\0')
                return entry->d_name;
        return nullptr;
    }

  private:
    DIR *directory_;
};

// False for a process that has gone since.
bool has_name(const char *process, const char *name) {
    char path[300];
    snprintf(path, sizeof path, "/proc/%s/status", process);
    const zav::File status(path, "re");
    return status && zav::process_has_name(status.get(), name);
}

} // namespace

int zavCDProgress(void) {
    zav::CommandOutput file("cat /tmp/progress.outfile");
    zav::Progress progress;
    if (file) {
        char line[80];
        while (file.line(line, sizeof line))
            progress.read_line(line);
    }
    ZAV_TRACE(zav::kTraceStep, "currProgress: %d\n", progress.percent());
    return progress.percent();
}

void setCDBlankProgress(void) {
    run_course(kCdBlank);
}

void setDVDBlankProgress(void) {
    run_course(kDvdBlank);
}

void setDVDEmptyProgress(void) {
    run_course(kDvdEmpty);
}

int zavCDBurnCancel(void) {
    zav::Command("killall growisofs cdrecord mkisofs dvd+rw-mediainfo dvd+rw-format &>/dev/null",
                 {})
        .run();
    return ZAV_RC_OK;
}

int zavCDBurnSyncCancel(void) {
    zavCDBurnCancel();
    while (any_tool_runs())
        sleep(3);
    return ZAV_RC_OK;
}

unsigned long PIDOF(const char *_process_name, unsigned int _sequence) {
    if (_process_name == nullptr || _sequence == 0)
        return ZAV_RC_ERR_EINVAL;
    ProcessTable processes;
    if (!processes)
        return ZAV_RC_ERR_ENOENT;
    unsigned matches = 0;
    while (const char *process = processes.next())
        if (has_name(process, _process_name) && ++matches == _sequence)
            return zav::to_unsigned(process);
    return 1; // none; no media tool is the first process
}

// The tools' outputs stay for inspection.
void cleanUp(void) {
    zav::Command("rm -rf /tmp/burnDir /tmp/linkDir /tmp/zav.iso", {}).run();
}
