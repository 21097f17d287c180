// The unit tests' optical drive: the tools' reports appear when the tools are run.
#pragma once

#include "harness.h"

#include <linux/cdrom.h>

namespace cdburn {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

using Lines = std::vector<std::string>;

class Drive : public harness::Appliance {
  protected:
    Drive() {
        record().shell = ScriptedShell{};
        put("/dev/scd0", "");
        put("/dev/cdrom", "");
        put("/tmp/dvd.outfile", "INQUIRY:\n");
        put("/tmp/cd.outfile", "");
        put("/proc/sys/dev/cdrom/info", "Can write DVD-R:\t1\n");
    }

    static void dvd(const std::string &media, const std::string &state,
                    const std::string &capacity = "1*2048=2048") {
        put("/tmp/dvd.outfile", "INQUIRY:                [A][B][C]\n"
                                " Mounted Media:         " +
                                    media + "\n Disc status:           " + state +
                                    "\nREAD CAPACITY:          " + capacity + "\n");
    }
    static void no_dvd(const std::string &refusal) {
        put("/tmp/dvd.outfile", refusal + "\nINQUIRY:                [A][B][C]\n");
        fails("dvd+rw-mediainfo", 252);
    }

    // Disc information whose third byte is `status`.
    static void cd(int status, const std::string &report) {
        no_dvd(":-( non-DVD media mounted, exiting...");
        put("/tmp/cd.outfile", report);
        record().drive = [status](unsigned long request, void *argument) {
            if (request == CDROM_SEND_PACKET)
                static_cast<cdrom_generic_command *>(argument)->buffer[2] =
                    static_cast<unsigned char>(status);
            return 0;
        };
    }
    static constexpr const char *kCdR = "  Is not erasable\n"
                                        "  ATIP start of lead out: 359849 (79:59/74)\n";
    static constexpr const char *kCdRw = "  Is erasable\n"
                                         "  ATIP start of lead out: 359849 (79:59/74)\n";

    static void fails(const std::string &tool, int status = 1) {
        record().shell->first(tool, exits(status));
    }
    static void combo_drive() { put("/proc/sys/dev/cdrom/info", "Can write DVD-R:\t0\n"); }

    // What is run to find out about a DVD, or about what is none.
    static Lines query() {
        return {"ls /dev/scd0 &> /dev/null", "ls /dev/cdrom &> /dev/null",
                "dvd+rw-mediainfo /dev/scd0 &>/tmp/dvd.outfile"};
    }
    static constexpr const char *kBegin = "echo 0 > /tmp/progress.outfile";
    static constexpr const char *kCleanUp = "rm -rf /tmp/burnDir /tmp/linkDir /tmp/zav.iso";
    static constexpr const char *kAtip = "cdrecord dev=/dev/scd0 -atip &>/tmp/cd.outfile";
    static constexpr const char *kMsinfo = "cdrecord dev=/dev/scd0 -msinfo &>/tmp/cd.outfile";
    static constexpr const char *kUsed = "du -sL /media/cdrom 2>/dev/null";

    static Lines joined(Lines first, const Lines &second) {
        first.insert(first.end(), second.begin(), second.end());
        return first;
    }
};

} // namespace cdburn
