// Burning a directory or a file to the disc in the drive.
#include "common/diag.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "work_files.h"
#include "zav_api.h"
#include "zav_cdburn_choice.h"
#include "zav_cdburn_media.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <dirent.h>
#include <iterator>
#include <unistd.h>

namespace {

using zav::Choice;
using zav::Command;
using zav::Recipe;

// ---- Commands ----

struct DvdRecipe {
    Recipe recipe;
    const char *form;
};

constexpr DvdRecipe kDvdRecipes[] = {
    {Recipe::dvd_new, "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -Z /dev/scd0 "
                      "-R -J -f %s &>/tmp/progress.outfile"},
    {Recipe::dvd_append, "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -M "
                         "/dev/scd0 -R -J -f %s &>/tmp/progress.outfile"},
    {Recipe::dvd_closed, "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray "
                         "-dvd-compat -Z /dev/scd0 -R -J -f %s &>/tmp/progress.outfile"},
    {Recipe::dvd_at_once, "growisofs -use-the-force-luke=4gms -use-the-force-luke=dao  "
                          "-use-the-force-luke=notray -Z /dev/scd0 -R -J -f %s "
                          "&>/tmp/progress.outfile"},
    {Recipe::dvd_double_at_once, "growisofs -use-the-force-luke=dao -use-the-force-luke=notray -Z "
                                 "/dev/scd0 -R -J -f %s &>/tmp/progress.outfile"},
};

constexpr const char *kCdClosed =
    "mkisofs -R -J -f %s 2>/tmp/progress.outfile | cdrecord dev=/dev/scd0 -v -gracetime=3 -data "
    "-dao -tsize=%ss - &>/dev/null";
constexpr const char *kCdFirstSession =
    "mkisofs -R -J -f %s 2>/tmp/progress.outfile | cdrecord dev=/dev/scd0 -multi -v -gracetime=3 "
    "-data - &>/dev/null";
constexpr const char *kCdNextSession =
    "mkisofs -C %s -M /dev/scd0 -R -J -f %s 2>/tmp/progress.outfile | cdrecord dev=/dev/scd0 "
    "-multi -v -gracetime=3 -data - &>/dev/null";

// Every recipe for a DVD has its row.
const char *dvd_form(Recipe recipe) {
    return std::find_if(std::begin(kDvdRecipes), std::end(kDvdRecipes),
                        [recipe](const DvdRecipe &row) { return row.recipe == recipe; })
        ->form;
}

// The command for a disc that is not refused. `word` is what prepare() found.
Command command_for(Recipe recipe, const char *source, const char *word) {
    switch (recipe) {
    case Recipe::cd_closed:
        return Command(kCdClosed, {source, word});
    case Recipe::cd_first_session:
        return Command(kCdFirstSession, {source});
    case Recipe::cd_next_session:
        return Command(kCdNextSession, {word, source});
    default:
        return Command(dvd_form(recipe), {source});
    }
}

// ---- What a CD command needs to know before ----

// Runs a command that leaves its answer on the last line of the CD report.
int ask_tool(const Command &command, char *line, int size) {
    if (command.run() != 0)
        return ZAV_RC_ERR_CDTOOL;
    zav::File report;
    zav::read_work_file(report, zav::kCdReport);
    if (!report) {
        cleanUp();
        return ZAV_RC_ERR_ENOENT;
    }
    return zav::last_line(report, line, size) ? ZAV_RC_OK : ZAV_RC_ERR_CDTOOL;
}

// The image's size in sectors. One that is not told must not become an empty track.
int image_sectors(const char *source, char *word, int size) {
    const Command command("mkisofs -R -J -f -q -print-size %s &>/tmp/cd.outfile", {source});
    int sectors = 0;
    if (const int rc = ask_tool(command, word, size); rc != ZAV_RC_OK)
        return rc;
    if (!zav::read_count(word, sectors))
        return ZAV_RC_ERR_CDTOOL;
    snprintf(word, static_cast<size_t>(size), "%d", sectors);
    return ZAV_RC_OK;
}

// Where the last session begins and the next one will.
int session_offsets(char *word, int size) {
    const Command command("cdrecord dev=/dev/scd0 -msinfo &>/tmp/cd.outfile", {});
    if (const int rc = ask_tool(command, word, size); rc != ZAV_RC_OK)
        return rc;
    word[strcspn(word, "\n")] = '\0';
    return *word != '\0' ? ZAV_RC_OK : ZAV_RC_ERR_CDTOOL;
}

int prepare(Recipe recipe, const char *source, char *word, int size) {
    if (recipe == Recipe::cd_closed)
        return image_sectors(source, word, size);
    if (recipe == Recipe::cd_next_session)
        return session_offsets(word, size);
    return ZAV_RC_OK;
}

// ---- The burn ----

bool can_open_directory(const char *path) {
    DIR *directory = opendir(path);
    if (directory == nullptr)
        return false;
    closedir(directory);
    return true;
}

bool can_read_file(const char *path) {
    return static_cast<bool>(zav::File(path, "re"));
}

// In kilobytes; without du nothing is known and 0 assumed, -1 if du does not tell.
int size_of(const char *source) {
    zav::CommandOutput output(Command("du -sL %s", {source}));
    if (!output)
        return 0;
    char line[80] = "";
    output.line(line, sizeof line);
    int kilobytes = -1;
    zav::read_count(zav::Fields(line).next(" "), kilobytes);
    return kilobytes;
}

int burn(const char *function, const Command &command, int disc_type) {
    if (const int status = command.run(); status != 0) {
        const int code = (status >> 8) & 0xFF;
        zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EINVAL,
                "cmd[%s] failed. err: %d, %s.", command.text(), code, strerror(code));
        return disc_type == ZAV_CD_RW || disc_type == ZAV_CD_R ? ZAV_RC_ERR_CDTOOL
                                                               : ZAV_RC_ERR_BURNER;
    }
    cleanUp();
    sleep(2);
    cdrom_reset();
    sleep(2);
    zav::write_done();
    return ZAV_RC_OK;
}

// Chosen and prepared before anybody asks whether there is room.
int burn_if_room(const char *function, const zavMediaInfo &disc, const char *source, int session) {
    const int kilobytes = size_of(source);
    const Choice choice = zav::choose(disc.discType, disc.discState, session);
    if (choice.recipe == Recipe::none)
        return choice.refusal;
    char word[80] = "";
    if (const int rc = prepare(choice.recipe, source, word, sizeof word); rc != ZAV_RC_OK)
        return rc;
    if (!zav::has_room(disc, session, kilobytes))
        return ZAV_RC_ERR_EFBIG;
    return burn(function, command_for(choice.recipe, source, word), disc.discType);
}

// ---- Links that give the source its name on the disc ----

constexpr int kOpenSession = 1;

bool is_valid_name(const char *name) {
    return name != nullptr && strpbrk(name, "\\/") == nullptr;
}

// A link of this name would be made in that directory, under the source's own name.
bool is_directory_itself(const char *name) {
    return strcmp(name, ".") == 0 || strcmp(name, "..") == 0;
}

int invalid_after_clean_up() {
    cleanUp();
    return ZAV_RC_ERR_EINVAL;
}

// ZAV_RC_OK for a file that can be burned; `name` is the last part of its path, "/" included.
int look_at_file(const char *path, const char *&name) {
    if (!can_read_file(path)) {
        cleanUp();
        return ZAV_RC_ERR_ENOENT;
    }
    name = strrchr(path, '/');
    return name != nullptr ? ZAV_RC_OK : ZAV_RC_ERR_ENOENT;
}

} // namespace

int zavCDBurn(char *sourceDir, int sessionType) {
    if (sourceDir == nullptr) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - 1. sourceDir == NULL. Return ZAV_RC_ERR_EINVAL\n",
                  __func__);
        return ZAV_RC_ERR_EINVAL;
    }
    if (!can_open_directory(sourceDir)) {
        ZAV_TRACE(zav::kTraceCommand,
                  "%s() - 2. open Directory %s Failed. Return ZAV_RC_ERR_ENOENT\n", __func__,
                  sourceDir);
        return ZAV_RC_ERR_ENOENT;
    }
    const Command begin("echo 0 > /tmp/progress.outfile", {});
    if (begin.run() != 0) {
        ZAV_TRACE(zav::kTraceCommand,
                  "%s() - 3. ZAV_INITPROGRESS_CMD %s Failed. Return ZAV_RC_ERR\n", __func__,
                  begin.text());
        return ZAV_RC_ERR;
    }
    zavMediaInfo disc = {};
    if (const int rc = zavQueryDisc(&disc, 0); rc != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - 4. zavQueryDisc() failed! Return 0x%x\n", __func__,
                  static_cast<unsigned>(rc));
        return rc;
    }
    if (zavIsComboDrive() == 0 && zav::combo_drive_refuses(disc.discType)) {
        ZAV_TRACE(zav::kTraceCommand,
                  "%s() - 5. Burner is a ComboDrive.  DVD burn not supported!! Return "
                  "ZAV_RC_ERR_BADDISC\n",
                  __func__);
        return ZAV_RC_ERR_BADDISC;
    }
    return burn_if_room(__func__, disc, sourceDir, sessionType);
}

int zavCDBurnEx(char *sourceDir, char *destDir, int sessionType) {
    if (sourceDir == nullptr || !is_valid_name(destDir))
        return ZAV_RC_ERR_EINVAL;
    if (!can_open_directory(sourceDir))
        return ZAV_RC_ERR_ENOENT;
    char burn_directory[] = "/tmp/burnDir";
    char *directory = sourceDir;
    if (*destDir != '\0') {
        Command("mkdir -p %s &>/dev/null", {burn_directory}).run();
        const Command link("ln -s %s %s/%s &>/dev/null", {sourceDir, burn_directory, destDir});
        if (is_directory_itself(destDir) || link.run() != 0)
            return invalid_after_clean_up();
        directory = burn_directory;
    }
    ZAV_TRACE(zav::kTraceStep, "%s() - Burn dir: %s\n", __func__, directory);
    const int rc = zavCDBurn(directory, sessionType);
    cleanUp();
    return rc;
}

int zavCDBurnFile(char *filepath) {
    cleanUp();
    if (filepath == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const char *name = nullptr;
    if (const int rc = look_at_file(filepath, name); rc != ZAV_RC_OK)
        return rc;
    char directory[] = "/tmp/linkDir";
    Command("mkdir -p %s", {directory}).run();
    Command("ln -s %s %s%s", {filepath, directory, name}).run();
    const int rc = zavCDBurn(directory, kOpenSession);
    cleanUp();
    return rc;
}

int zavCDBurnFileEx(char *filepath, char *destDir) {
    cleanUp();
    if (filepath == nullptr || !is_valid_name(destDir))
        return ZAV_RC_ERR_EINVAL;
    const char *name = nullptr;
    if (const int rc = look_at_file(filepath, name); rc != ZAV_RC_OK)
        return rc;
    char directory[] = "/tmp/linkDir";
    Command("mkdir -p %s &>/dev/null", {directory}).run();
    if (Command("ln -s %s %s%s &>/dev/null", {filepath, directory, name}).run() != 0)
        return invalid_after_clean_up();
    const int rc = zavCDBurnEx(directory, destDir, kOpenSession);
    cleanUp();
    return rc;
}
