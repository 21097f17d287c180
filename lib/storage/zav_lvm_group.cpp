// A volume group: does it exist, how large is it, what is it made of and what does it hold?
#include "common/diag.h"
#include "common/lock.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"
#include "zav_lvm_backup.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <sys/wait.h>

namespace {

using zav::Command;
using zav::CommandOutput;

constexpr int kGroupLock = 26897; // 0x6911
constexpr int kLine = 120;
constexpr int kKbPerGbShift = 20;
constexpr const char *kDirectory = "/etc/Kiru/zav";
constexpr const char *kReporter = "zavgetStateLVMVG";

#define LOG_GROUP(priority, number, ...)                                                           \
    zavlogd(const_cast<char *>(kReporter), (priority), (number), __VA_ARGS__)

void trace_command(const Command &command) {
    ZAV_TRACE(zav::kTraceStep, "%s() - strcmd: %s\n", kReporter, command.text());
}

int run(const Command &command) {
    trace_command(command);
    return command.run();
}

// The group before anything is known of it.
zavLVMState undecided(const zavDevice &dev) {
    const zavDevice group_address = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, dev.disk, 0};
    zavLVMState state = {};
    state.type = ZAV_EVENT_LVM;
    state.state = ZAV_LVM_NORMAL;
    lvmVG &group = state.dev.lvmvgdev;
    group.lvmtype = dev.minor_type;
    group.lvmdev = {dev.type, dev.minor_type, dev.disk, 0};
    for (lvmPV &volume : group.pvdev)
        volume = {.lvmtype = ZAV_MINDEV_LVM_PV,
                  .lvmdev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 0, dev.disk},
                  .size = 0,
                  .vgdev = group_address,
                  .dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}};
    for (lvmLV &volume : group.lvdev)
        volume = {.lvmtype = ZAV_MINDEV_LVM_LV,
                  .lvmdev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, dev.disk},
                  .size = 0,
                  .usage = 0.0F,
                  .vgdev = group_address};
    return state;
}

// The name is looked for anywhere in the list: DataVG1 is also found in DataVG12.
int group_state(const char *name) {
    char list[64];
    snprintf(list, sizeof list, "%s/.vgs", kDirectory);
    run(Command("/usr/sbin/vgs &> %s", {list}));
    if (run(Command("cat %s | grep %s &>/dev/null", {list, name})) != 0)
        return ZAV_LVM_NOT_EXIST;
    const Command answers("/usr/sbin/vgs %s &>/dev/null", {name});
    const int status = run(answers);
    if (status == 0)
        return ZAV_LVM_NORMAL;
    ZAV_TRACE(zav::kTraceCommand, "%s() - errno: %d, errmsg: %s, strcmd: %s", kReporter,
              WEXITSTATUS(status), strerror(WEXITSTATUS(status)), answers.text());
    return ZAV_LVM_FAILED;
}

// How a number is got from a tool, and what is told when that cannot be started.
struct Question {
    const char *form;
    int log_number;
    int code;
};

constexpr Question kPvCount = {"cat %s | grep \"Cur PV\" | cut -c 12- ", 3, ZAV_RC_ERR_ESTRPIPE};
constexpr Question kLvCount = {"cat %s | grep \"Cur LV\" | cut -c 12- ", 4, ZAV_RC_ERR_ESTRPIPE};
constexpr Question kKilobytes = {"/usr/sbin/vgdisplay -c %s 2>/dev/null | cut -d ':' -f 12", 5,
                                 ZAV_RC_ERR};

// The first line of the answer.
int ask(const Question &question, const char *word, char (&line)[kLine]) {
    const Command command(question.form, {word});
    trace_command(command);
    CommandOutput output(command);
    if (!output) {
        LOG_GROUP(zav::kWarning, question.log_number, "popen failed. [%s]", command.text());
        return question.code;
    }
    if (!output.line(line, sizeof line))
        return ZAV_RC_ERR;
    trim(line);
    return ZAV_RC_OK;
}

int ask_count(const Question &question, const char *word, int &count) {
    char line[kLine];
    const int rc = ask(question, word, line);
    if (rc == ZAV_RC_OK)
        count = zav::to_int(line);
    return rc;
}

int read_display(const char *name, lvmVG &group) {
    char display[64];
    snprintf(display, sizeof display, "%s/.vgdisplay.%s", kDirectory, name);
    run(Command("/usr/sbin/vgdisplay %s &> %s", {name, display}));
    if (const int rc = ask_count(kPvCount, display, group.pvcount); rc != ZAV_RC_OK)
        return rc;
    if (const int rc = ask_count(kLvCount, display, group.lvcount); rc != ZAV_RC_OK)
        return rc;
    ZAV_TRACE(zav::kTraceStep, "%s() - pv count: %d, lv count: %d\n", kReporter, group.pvcount,
              group.lvcount);
    char line[kLine];
    if (const int rc = ask(kKilobytes, name, line); rc != ZAV_RC_OK)
        return rc;
    group.size = (static_cast<zavSize>(zav::to_int64(line)) >> kKbPerGbShift) + 1;
    return ZAV_RC_OK;
}

struct LinkQuestion {
    const char *form;
    bool asks_for_disk; // which disk's directory the partition is in
};

const LinkQuestion &link_question(zav::PvKind kind) {
    static constexpr LinkQuestion kArray = {"echo /dev/`udevinfo -q symlink -p /block/%s`", false};
    static constexpr LinkQuestion kPartition = {
        "echo /dev/sata/`udevinfo -q symlink -p /block/%s/%s | sed -n 's/sata\\//\\t/gp' | "
        "awk -F'\\t' '{print $2}' | awk '{print $1}'`",
        true};
    static constexpr LinkQuestion kWholeDisk = {
        "echo /dev/`udevinfo -q symlink -p /sys/block/%s | sed -n 's/ /\\n/gp' | sed '/^$/d' | "
        "sed '/^disk/d'`",
        false};
    if (kind == zav::PvKind::kArray)
        return kArray;
    return kind == zav::PvKind::kPartition ? kPartition : kWholeDisk;
}

Command link_command(const char *kernel_name) {
    const LinkQuestion &question = link_question(zav::classify_pv(kernel_name));
    if (!question.asks_for_disk)
        return {question.form, {kernel_name}};
    char disk[9];
    zav::disk_of_partition(kernel_name, disk);
    ZAV_TRACE(zav::kTraceStep, "%s() -- strDev2: %s\n", kReporter, disk);
    return {question.form, {disk, kernel_name}};
}

// The backup file as the parser wants it. A device that is not found is logged, and gives the
// group's lock up early: the end of the query releases it a second time.
class Backup final : public zav::BackupSource {
  public:
    Backup(zav::File &file, zav::Lock &lock) : file_(file), lock_(lock) {}

    bool line(char *buffer, int size) override { return file_.line(buffer, size); }

    void measure(lvmLV &volume) override { zavgetFSusage(&volume.lvmdev, &volume.usage); }

    Found find_device(const char *kernel_name, zavDevice &device) override {
        const Found found = look_up(kernel_name, device);
        if (found != Found::kYes)
            lock_.release_early();
        return found;
    }

  private:
    static Found look_up(const char *kernel_name, zavDevice &device) {
        char path[kLine];
        if (zav::classify_pv(kernel_name) == zav::PvKind::kNamed) {
            snprintf(path, sizeof path, "/dev/%s", kernel_name);
            return read_address(path, device, 10);
        }
        const Command command = link_command(kernel_name);
        trace_command(command);
        CommandOutput output(command);
        if (!output) {
            LOG_GROUP(zav::kWarning, 7, "popen failed. [%s]", command.text());
            return Found::kNo;
        }
        if (!output.line(path, sizeof path)) {
            LOG_GROUP(zav::kWarning, 9, "popen failed. [%s]", command.text());
            return Found::kNoAnswer;
        }
        trim(path);
        if (strcmp(path, "/dev/") == 0) {
            LOG_GROUP(zav::kWarning, 7, "udev path not found! [/dev/%s]", kernel_name);
            return Found::kNo;
        }
        return read_address(path, device, 8);
    }

    static Found read_address(const char *path, zavDevice &device, int log_number) {
        zavDevice address = {};
        if (zavStrToDev(path, &address) != ZAV_RC_OK) {
            LOG_GROUP(zav::kWarning, log_number, "zavStrToDev failed. pv: %s", path);
            return Found::kNo;
        }
        ZAV_TRACE(zav::kTraceStep, "pv device : %s\n", path);
        device = address;
        return Found::kYes;
    }

    zav::File &file_;
    zav::Lock &lock_;
};

int write_backup(const char *name, const char *path) {
    const Command command("/usr/sbin/vgcfgbackup -f %s %s &> /dev/null", {path, name});
    ZAV_TRACE(zav::kTraceStep, "%s() - vgcfgbackup strcmd: %s\n", kReporter, command.text());
    if (command.run() == 0)
        return ZAV_RC_OK;
    LOG_GROUP(zav::kWarning, 11, "Command failed.[%s]", command.text());
    return ZAV_RC_ERR;
}

// Of its volumes' states only that one is inactive reaches the group.
int states_of_volumes(lvmVG &group) {
    int state = 0;
    const int room = static_cast<int>(std::size(group.lvdev));
    for (int i = 0; i < std::min(group.lvcount, room); ++i) {
        zavLVMState volume = {};
        zavGetStateLVM(&group.lvdev[i].lvmdev, &volume);
        state |= volume.state & ZAV_LVM_INACTIVE;
    }
    return state;
}

} // namespace

int zavgetStateLVMVG(zavDevice *dev, zavLVMState *info) {
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::Lock lock(kGroupLock);
    if (lock.get() != ZAV_RC_OK)
        return ZAV_RC_ERR;
    if (lock.take(kGroupLock) != ZAV_RC_OK) {
        ZAV_LOG(zav::kAlert, 3, "semaphore_p [%d] failed!!", kGroupLock);
        return ZAV_RC_ERR;
    }
    *info = undecided(*dev);
    lvmVG &group = info->dev.lvmvgdev;

    char name[32];
    if (zavMapVGToStr(dev->disk, name) != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand,
                  "%s() - problem with getting VGName from zavMapVGToStr(). vgnum: %d\n", __func__,
                  dev->disk);
        ZAV_LOG(zav::kWarning, 1, "Problem with getting VGName from zavMapVGToStr(). vgnum: %d",
                dev->disk);
        return ZAV_RC_ERR_EINVAL;
    }
    info->state = group_state(name);
    if (info->state != ZAV_LVM_NORMAL)
        return ZAV_RC_OK;
    if (const int rc = read_display(name, group); rc != ZAV_RC_OK)
        return rc;

    char path[64];
    snprintf(path, sizeof path, "%s/%s", kDirectory, name);
    if (const int rc = write_backup(name, path); rc != ZAV_RC_OK)
        return rc;
    zav::File file(path, "re");
    if (!file) {
        ZAV_LOG(zav::kWarning, 6, "fopen failed. [ %s ]", path);
        return ZAV_RC_ERR;
    }
    Backup backup(file, lock);
    const int parsed = zav::read_backup(backup, group);
    file.close();
    info->state |= states_of_volumes(group);

    if (lock.release(1) != ZAV_RC_OK) { // the key in its messages is 1 here
        ZAV_LOG(zav::kAlert, 3, "semaphore_v [%d] failed!!", kGroupLock);
        return ZAV_RC_ERR;
    }
    return parsed;
}
