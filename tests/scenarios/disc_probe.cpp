// Runs on the simulated appliance: asks the library about the disc or lets it work on it, as told
// by the first word, and prints what came of it.
#include "zav_api.h"

#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <linux/cdrom.h>
#include <unistd.h>

namespace {

struct Name {
    int value;
    const char *word;
};

constexpr Name types[] = {{ZAV_DVD_ROM, "DVD-ROM"},
                          {ZAV_DVD_MINUS_R_SEQ, "DVD-R"},
                          {ZAV_DVD_RAM, "DVD-RAM"},
                          {ZAV_DVD_MINUS_RW_RES, "DVD-RW restricted"},
                          {ZAV_DVD_MINUS_RW_SEQ, "DVD-RW sequential"},
                          {ZAV_DVD_PLUS_RW, "DVD+RW"},
                          {ZAV_DVD_PLUS_R, "DVD+R"},
                          {ZAV_DVD_PLUS_R_DOUBLE, "DVD+R double"},
                          {ZAV_CD_RW, "CD-RW"},
                          {ZAV_CD_R, "CD-R"},
                          {ZAV_DISC_NONE, "none"}};

constexpr Name states[] = {{ZAV_DISC_BLANK, "blank"},
                           {ZAV_DISC_APPENDABLE, "appendable"},
                           {ZAV_DISC_COMPLETE, "complete"}};

constexpr Name codes[] = {{ZAV_RC_OK, "ok"},
                          {ZAV_RC_ERR, "error"},
                          {ZAV_RC_ERR_BADDISC, "bad disc"},
                          {ZAV_RC_ERR_NODISC, "no disc"},
                          {ZAV_RC_ERR_EFBIG, "too big"},
                          {ZAV_RC_ERR_EINVAL, "invalid"},
                          {ZAV_RC_ERR_CDTOOL, "CD tool failed"},
                          {ZAV_RC_ERR_BURNER, "DVD tool failed"},
                          {ZAV_RC_ERR_BLANK, "blanking failed"},
                          {ZAV_RC_ERR_FORMAT, "formatting failed"},
                          {ZAV_RC_ERR_PKTSETUP, "packet device failed"}};

template <size_t count>
const char *word_of(const Name (&names)[count], int value) {
    for (const Name &name : names)
        if (name.value == value)
            return name.word;
    return "unknown";
}

int told(int rc) {
    printf("%s\n", word_of(codes, rc));
    return 0;
}

int query() {
    zavMediaInfo info = {};
    const int rc = zavQueryDisc(&info, 0);
    if (rc != ZAV_RC_OK)
        return told(rc);
    printf("%s %s %d %d\n", word_of(types, info.discType), word_of(states, info.discState),
           info.discTotalSize, info.discAvailableSize);
    return 0;
}

int number(const char *word) {
    return static_cast<int>(strtol(word, nullptr, 10));
}

int burn(char **words) {
    return told(zavCDBurn(words[0], number(words[1])));
}

int burn_below(char **words) {
    return told(zavCDBurnEx(words[0], words[1], number(words[2])));
}

// Says how READ DISC INFORMATION ends and which status it tells.
int packet() {
    const int drive = open("/dev/scd0", O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    cdrom_generic_command command = {};
    command.cmd[0] = 0x51;
    command.cmd[8] = 34;
    std::array<unsigned char, 34> reply{};
    if (wait_cmd(drive, &command, reply.data(), static_cast<int>(reply.size()), CGC_DATA_READ, 100,
                 0) != 0)
        return 1;
    printf("status %d\n", reply[2] & 3);
    return 0;
}

int without_words(const char *what) {
    if (strcmp(what, "query") == 0)
        return query();
    if (strcmp(what, "combo") == 0)
        return printf("%d\n", zavIsComboDrive()) < 0;
    if (strcmp(what, "packet") == 0)
        return packet();
    if (strcmp(what, "blank") == 0)
        return told(zavCDBlank());
    if (strcmp(what, "format") == 0)
        return told(zavCDFormat());
    if (strcmp(what, "tools") == 0)
        return told(checkExternalBin());
    if (strcmp(what, "progress") == 0)
        return printf("%d\n", zavCDProgress()) < 0;
    if (strcmp(what, "cancel") == 0)
        return told(zavCDBurnSyncCancel());
    if (strcmp(what, "eject") == 0)
        zavEjectDVD();
    if (strcmp(what, "reset") == 0)
        cdrom_reset();
    if (strcmp(what, "reattach") == 0)
        rm_add_odd();
    return 0;
}

} // namespace

int main(int argc, char **argv) {
    if (argc == 4 && strcmp(argv[1], "burn") == 0)
        return burn(argv + 2);
    if (argc == 5 && strcmp(argv[1], "burn-below") == 0)
        return burn_below(argv + 2);
    if (argc == 3 && strcmp(argv[1], "pidof") == 0)
        return printf("%lu\n", PIDOF(argv[2], 1)) < 0;
    return argc == 2 ? without_words(argv[1]) : 64;
}
