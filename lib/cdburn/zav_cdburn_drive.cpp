// The drive itself: its tools, tray, reset, packet commands.
#include "common/diag.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "work_files.h"
#include "zav_api.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <linux/cdrom.h>
#include <sys/ioctl.h>

namespace {

constexpr const char *kTools[] = {"cdrecord",      "mkisofs",  "growisofs", "dvd+rw-mediainfo",
                                  "dvd+rw-format", "cdrwtool", "pktsetup",  "mkudffs"};

// The drive's address on the SCSI bus, "2:0:0:0"; false if the kernel names none.
bool scsi_address(char *address, size_t size) {
    zav::CommandOutput names("ls /sys/block/sr0/device | grep \"scsi_device\"");
    char line[80];
    if (!names || !names.line(line, sizeof line))
        return false;
    trim(line);
    constexpr const char *kPrefix = "scsi_device:";
    if (!zav::starts_with(line, kPrefix))
        return false;
    const char *text = line + strlen(kPrefix);
    zav::copy_text(address, size, text);
    // It stands between quotation marks in the commands.
    return *text != '\0' && text[strspn(text, "0123456789:")] == '\0';
}

void scsi_command(const char *function, const char *form, const char *address) {
    const zav::Command command(form, {address});
    ZAV_TRACE(zav::kTraceStep, "%s() - scsi cmd: %s\n", function, command.text());
    command.run();
}

} // namespace

int checkExternalBin(void) {
    for (const char *tool : kTools)
        if (zav::Command("which %s &>/dev/null", {tool}).run() != 0)
            return ZAV_RC_ERR;
    return ZAV_RC_OK;
}

int zavIsComboDrive(void) {
    zav::File table("/proc/sys/dev/cdrom/info", "re");
    if (!table)
        return ZAV_RC_ERR_ENOENT;
    constexpr const char *kAbility = "Can write DVD-R:";
    char line[80];
    while (table.line(line, sizeof line))
        if (const char *found = strstr(line, kAbility);
            found != nullptr && zav::to_int(found + strlen(kAbility)) == 0)
            return 0;
    return 1;
}

void zavEjectDVD(void) {
    zav::Command("cdrecord dev=/dev/scd0 -eject &>/dev/null", {}).run();
}

void cdrom_reset(void) {
    const zav::Descriptor drive(open("/dev/cdrom", O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (!drive || ioctl(drive.get(), CDROMRESET, 0) == -1)
        printf("CDROM Resetfailed");
}

// Removing and adding the drive makes the kernel look at its disc anew.
void rm_add_odd(void) {
    char address[80];
    if (!scsi_address(address, sizeof address))
        return;
    scsi_command(__func__, "echo \"scsi remove-single-device %s\" > /proc/scsi/scsi", address);
    scsi_command(__func__, "echo \"scsi add-single-device %s\" > /proc/scsi/scsi", address);
}

int wait_cmd(int fd, struct cdrom_generic_command *cgc, void *buffer, int buflen, int ddir,
             int timeout, int quiet) {
    if (cgc == nullptr) {
        errno = EINVAL;
        return -1;
    }
    unsigned char sense[64] = {};
    cgc->timeout = timeout;
    cgc->buffer = static_cast<unsigned char *>(buffer);
    cgc->buflen = static_cast<unsigned>(buflen);
    cgc->data_direction = static_cast<unsigned char>(ddir);
    cgc->quiet = 0;
    cgc->sense = reinterpret_cast<request_sense *>(sense);
    const int rc = ioctl(fd, CDROM_SEND_PACKET, cgc);
    cgc->sense = nullptr; // it ends with this call
    if (rc == -1 && quiet == 0)
        perror("ioctl!");
    constexpr unsigned kSpecificDataValid = 0x80;
    if ((sense[15] & kSpecificDataValid) != 0) {
        printf("failed!! sense is %x:%x-%x\n", sense[15], sense[12], sense[13]);
        exit(0);
    }
    return rc;
}
