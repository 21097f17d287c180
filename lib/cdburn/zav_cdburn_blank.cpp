// Erasing a rewritable disc, and formatting one for packet writing.
#include "common/diag.h"
#include "common/shell.h"
#include "work_files.h"
#include "zav_api.h"
#include "zav_cdburn_choice.h"

#include <pthread.h>
#include <unistd.h>

namespace {

// ---- Steps ----

// Nobody waits for a simulator: it goes on for its fixed time and cleans up after itself.
template <void (*simulate)()>
void *simulator(void *) {
    pthread_detach(pthread_self());
    simulate();
    return nullptr;
}

bool start(void *(*body)(void *)) {
    pthread_t thread = {};
    return pthread_create(&thread, nullptr, body, nullptr) == 0;
}

int failed() {
    cleanUp();
    return ZAV_RC_ERR_BLANK;
}

int done() {
    cleanUp();
    zav::write_done();
    return ZAV_RC_OK;
}

bool run(const char *text) {
    return zav::Command(text, {}).run() == 0;
}

int write_empty_file_system() {
    if (!run("mkdir -p /tmp/linkDir") ||
        !run("growisofs  -use-the-force-luke=notray -Z /dev/scd0 -R -J -f /tmp/linkDir "
             "&>/dev/null"))
        return failed();
    sleep(3);
    return done();
}

// ---- By the disc's type ----

int blank_cd() {
    if (!start(simulator<setCDBlankProgress>))
        return ZAV_RC_ERR_BLANK;
    return run("cdrecord dev=/dev/scd0 -v -gracetime=3 -blank=fast &>/dev/null") ? done()
                                                                                 : failed();
}

int format_dvd() {
    if (!start(simulator<setDVDBlankProgress>))
        return ZAV_RC_ERR_BLANK;
    const zav::Command command("dvd+rw-format /dev/scd0 -force=full &>/dev/null", {});
    ZAV_TRACE(zav::kTraceStep, "%s() - %s\n", "zavCDBlank", command.text());
    if (command.run() != 0)
        return failed();
    sleep(2);
    return write_empty_file_system();
}

int empty_dvd() {
    if (!start(simulator<setDVDEmptyProgress>))
        return ZAV_RC_ERR_BLANK;
    return write_empty_file_system();
}

int blank(const zavMediaInfo &disc) {
    switch (disc.discType) {
    case ZAV_CD_RW:
        return blank_cd();
    case ZAV_DVD_MINUS_RW_RES:
        return disc.discState == ZAV_DISC_COMPLETE ? empty_dvd() : format_dvd();
    case ZAV_DVD_MINUS_RW_SEQ:
        return format_dvd();
    case ZAV_DVD_PLUS_RW:
        return empty_dvd();
    case ZAV_DISC_NONE:
        return ZAV_RC_ERR_NODISC;
    case ZAV_DVD_ROM:
    case ZAV_DVD_MINUS_R_SEQ:
    case ZAV_DVD_RAM:
    case ZAV_DVD_PLUS_R:
    case ZAV_DVD_PLUS_R_DOUBLE:
    case ZAV_CD_R:
    case ZAV_DISC_UNKNOWN:
        return ZAV_RC_ERR_BADDISC;
    default:
        return ZAV_RC_ERR_EINVAL;
    }
}

// Nothing is to be done, or nothing can be.
int already_blank(int disc_type) {
    switch (disc_type) {
    case ZAV_DVD_MINUS_R_SEQ:
    case ZAV_DVD_PLUS_R:
    case ZAV_DVD_PLUS_R_DOUBLE:
    case ZAV_CD_R:
        return ZAV_RC_ERR_BADDISC;
    default:
        return ZAV_RC_OK;
    }
}

} // namespace

int zavCDBlank(void) {
    if (!run("echo 0 > /tmp/progress.outfile"))
        return ZAV_RC_ERR;
    zavMediaInfo disc = {};
    if (const int rc = zavQueryDisc(&disc, 1); rc != ZAV_RC_OK)
        return rc;
    if (zavIsComboDrive() == 0 && zav::combo_drive_refuses(disc.discType))
        return ZAV_RC_ERR_BADDISC;
    // A sequential DVD-RW reads as blank also when only its table of contents is.
    if (disc.discState == ZAV_DISC_BLANK && disc.discType != ZAV_DVD_MINUS_RW_SEQ)
        return already_blank(disc.discType);
    return blank(disc);
}

int zavCDFormat(void) {
    zavMediaInfo disc = {};
    if (const int rc = zavQueryDisc(&disc, 0); rc != ZAV_RC_OK)
        return rc;
    if (!run("pktsetup pktcdvd0 /dev/scd0 &>/dev/null")) {
        cleanUp();
        return ZAV_RC_ERR_PKTSETUP;
    }
    switch (disc.discType) {
    case ZAV_DVD_PLUS_RW:
        return run("mkudffs /dev/pktcdvd/pktcdvd0 &>/dev/null") ? ZAV_RC_OK : ZAV_RC_ERR_FORMAT;
    case ZAV_CD_RW:
        if (run("cdrwtool -d /dev/scd0 -q &>/dev/null"))
            return ZAV_RC_OK;
        cleanUp();
        return ZAV_RC_ERR_FORMAT;
    default: // the packet device stays set up
        return ZAV_RC_ERR_BADDISC;
    }
}
