// Which medium is in the drive, in what state, and with how much room.
#include "common/diag.h"
#include "common/owner.h"
#include "common/shell.h"
#include "work_files.h"
#include "zav_api.h"
#include "zav_cdburn_media.h"

#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <linux/cdrom.h>

namespace {

constexpr int kLine = 80;

int missing_report() {
    cleanUp();
    return ZAV_RC_ERR_ENOENT;
}

bool is_empty(const zav::File &file) {
    const int first = fgetc(file.get());
    ungetc(first, file.get());
    return first == EOF;
}

// ---- A CD ----

// Ends the caller's process when the drive does not answer: what is in it then cannot be known.
unsigned char disc_status() {
    const zav::Descriptor drive(open(zav::kDrive, O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (!drive) {
        perror("open");
        exit(1);
    }
    constexpr unsigned char kReadDiscInformation = 0x51;
    constexpr unsigned char kAllocation = 34;
    constexpr int kTimeout = 12000;
    unsigned char reply[300] = {};
    cdrom_generic_command command = {};
    command.cmd[0] = kReadDiscInformation;
    command.cmd[8] = kAllocation;
    if (wait_cmd(drive.get(), &command, reply, sizeof reply, CGC_DATA_READ, kTimeout, 0) == -1)
        exit(1);
    return reply[2];
}

int read_atip(zavMediaInfo &info) {
    if (zav::Command("cdrecord dev=/dev/scd0 -atip &>/tmp/cd.outfile", {}).run() != 0)
        return ZAV_RC_ERR;
    zav::File report;
    zav::read_work_file(report, zav::kCdReport);
    if (!report)
        return missing_report();
    char line[kLine];
    while (report.line(line, sizeof line))
        zav::read_atip_line(line, info);
    return ZAV_RC_OK;
}

int read_room_of_session(zavMediaInfo &info) {
    if (zav::Command("cdrecord dev=/dev/scd0 -msinfo &>/tmp/cd.outfile", {}).run() != 0)
        return ZAV_RC_OK;
    zav::File report;
    zav::read_work_file(report, zav::kCdReport);
    if (!report)
        return missing_report();
    char last[kLine] = "";
    zav::last_line(report, last, sizeof last);
    zav::read_session_offsets(last, info);
    return ZAV_RC_OK;
}

int query_cd(zavMediaInfo &info) {
    if (const int rc = read_atip(info); rc != ZAV_RC_OK)
        return rc;
    if (!zav::read_disc_status(disc_status(), info))
        return ZAV_RC_OK;
    return read_room_of_session(info);
}

// ---- dvd+rw-mediainfo's report ----

void read_dvd(zav::File &report, zavMediaInfo &info) {
    char line[kLine];
    while (report.line(line, sizeof line))
        zav::read_dvd_line(line, info);
}

int read_refusal(zav::File &report, zavMediaInfo &info) {
    char line[kLine];
    while (report.line(line, sizeof line)) {
        const zav::NoDvd told = zav::read_refusal_line(line);
        if (told == zav::NoDvd::no_medium) {
            info.discType = ZAV_DISC_NONE;
            info.discState = ZAV_DISC_STATE_UNKNOWN;
        } else if (told == zav::NoDvd::cd) {
            if (const int rc = query_cd(info); rc != ZAV_RC_OK)
                return rc;
        }
    }
    return ZAV_RC_OK;
}

// What the mounted file system leaves of a disc that is written over.
void read_room_of_file_system(zavMediaInfo &info) {
    zav::CommandOutput used("du -sL /media/cdrom 2>/dev/null");
    if (!used) {
        info.discAvailableSize = info.discTotalSize;
        return;
    }
    char line[kLine] = "";
    used.line(line, sizeof line);
    zav::read_used_space(line, info);
}

} // namespace

int zavQueryDisc(zavMediaInfo *info, [[maybe_unused]] int flag) {
    if (info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (zav::Command("ls /dev/scd0 &> /dev/null", {}).run() != 0 ||
        zav::Command("ls /dev/cdrom &> /dev/null", {}).run() != 0)
        return ZAV_RC_ERR;
    const int status = zav::Command("dvd+rw-mediainfo /dev/scd0 &>/tmp/dvd.outfile", {}).run();
    zav::File report;
    zav::read_work_file(report, zav::kDvdReport);
    if (!report)
        return missing_report();
    if (is_empty(report))
        return ZAV_RC_ERR;
    *info = {ZAV_EVENT_DISC, ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0};
    if (status == 0)
        read_dvd(report, *info);
    else if (const int rc = read_refusal(report, *info); rc != ZAV_RC_OK)
        return rc;
    report.close();
    if (zav::is_overwritable(info->discType))
        read_room_of_file_system(*info);
    return ZAV_RC_OK;
}
