// Taking one disk's partitions out of the arrays, and putting another's in.
#include "common/diag.h"
#include "common/model.h"
#include "common/node.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"
#include "zav_disk_members_parse.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using zav::ArrayQuery;
using zav::Command;
using zav::CommandOutput;

constexpr int kLastPartition = 15;
constexpr int kNoPipe = 32; // a tool that cannot be started
constexpr const char *kTemporaryNode = "/dev/sata/hotrmtmp";
constexpr const char *kScan = "/sbin/mdadm --query --examine --scan %s 2>&1";
constexpr const char *kRemove = "zavRmSWRaidDev";
constexpr const char *kAdd = "zavAddSWRaidDev";

struct Output {
    char text[1024];
};

struct PartitionName {
    char text[32] = "";
};

PartitionName name_of(zavDevice disk, int partition) {
    PartitionName name;
    disk.part = partition;
    zavDevToStr(name.text, sizeof name.text, &disk);
    return name;
}

// The beginning of what the command prints; false if it cannot be started.
bool ask(const char *function, const Command &command, Output &output) {
    ZAV_TRACE(zav::kTraceStep, "%s() - pcmd: %s\n", function, command.text());
    CommandOutput pipe(command);
    if (!pipe) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - Command Failed [%s]\n", function, command.text());
        return false;
    }
    pipe.text(output.text, sizeof output.text);
    return true;
}

int no_memory(const char *function) {
    zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EINVAL,
            "Memory allocation failed. Return ZAV_RC_ERR_ENOMEM.");
    return ZAV_RC_ERR_ENOMEM;
}

// ---- Taking out ----

// The work of one removal. Its steps say whether it goes on.
class MemberRemoval {
  public:
    MemberRemoval(const zavDevice &source, const zavDevice &target, Output &output)
        : source_(source), target_(target), output_(output) {}

    int run() {
        for (int partition = kLastPartition; partition >= 1; --partition)
            if (!remove_partition(partition))
                break;
        return result_;
    }

  private:
    bool remove_partition(int partition) {
        const PartitionName source = name_of(source_, partition);
        if (!zav::node_opens(source.text))
            return true;
        const PartitionName target = name_of(target_, partition);
        if (!zav::node_opens(target.text)) {
            target_exists_ = false; // and counts as vanished for all partitions to come
            ZAV_TRACE(zav::kTraceStep, "%s() -- tpartname[%s], bTargetExist[%d]\n", kRemove,
                      target.text, 0);
        }
        const Command scan(kScan, {source.text});
        if (!ask(kRemove, scan, output_)) {
            zavlogd(const_cast<char *>(kRemove), zav::kAlert, 3, "popen()%s failed.", scan.text());
            return stop(kNoPipe);
        }
        const ArrayQuery query = zav::read_array_query(output_.text);
        ZAV_TRACE(zav::kTraceStep, "%s() - mdname: %s, raidtype: %s\n", kRemove, query.array,
                  query.level);
        if (!query.is_complete())
            return true;
        if (!query.is_redundant())
            return tear_down(query.array);
        return target_exists_ ? remove_member(query.array, target.text)
                              : remove_vanished_member(query.array);
    }

    bool remove_member(const char *array, const char *member) {
        if (!ask(kRemove, Command("/sbin/mdadm %s -f %s 2>&1", {array, member}), output_))
            return stop(kNoPipe);
        sleep(2);
        if (!ask(kRemove, Command("/sbin/mdadm %s -r %s 2>&1", {array, member}), output_))
            return stop(kNoPipe);
        sleep(1);
        result_ = ZAV_RC_OK;
        return true;
    }

    // The member that has no node any more gets one of its numbers for the time being.
    bool remove_vanished_member(const char *array) {
        const Command detail("/sbin/mdadm --detail %s | grep \"faulty spare\" 2>&1", {array});
        if (!ask(kRemove, detail, output_))
            return stop(kNoPipe);
        zav::DeviceNumbers numbers = {};
        if (!zav::read_member_numbers(output_.text, numbers))
            return true;
        ZAV_TRACE(zav::kTraceStep, "%s() - blk_major: %d, blk_minor: %d\n", kRemove, numbers.major,
                  numbers.minor);
        unlink(kTemporaryNode); // one left by a process that was killed has other numbers
        char form[32];
        snprintf(form, sizeof form, "mknod %%s b %d %d", numbers.major, numbers.minor);
        const Command make(form, {kTemporaryNode});
        ZAV_TRACE(zav::kTraceStep, "%s() - pcmdbuf: %s\n", kRemove, make.text());
        make.run();
        if (!ask(kRemove, Command("/sbin/mdadm %s -f %s 2>&1", {array, kTemporaryNode}), output_) ||
            !ask(kRemove, Command("/sbin/mdadm %s -r %s 2>&1", {array, kTemporaryNode}), output_)) {
            unlink(kTemporaryNode);
            return stop(kNoPipe);
        }
        Command("rm %s", {kTemporaryNode}).run();
        return true;
    }

    // An array without redundancy: what lives on it goes, then the array.
    bool tear_down(const char *array) {
        PartitionName name;
        zav::copy_text(name.text, sizeof name.text, array);
        zavDevice group = {};
        if (zavGetPVsVGDev(name.text, &group) == ZAV_RC_OK) {
            zavLVMState info = {};
            if (const int rc = zavGetStateLVM(&group, &info); rc != ZAV_RC_OK)
                return stop(rc);
            remove_volumes(info.dev.lvmvgdev);
            char group_name[128];
            if (const int rc = zavGetPVsVG(name.text, group_name); rc != ZAV_RC_OK)
                return stop(rc);
            Command("/usr/sbin/vgremove %s >/dev/null 2>&1", {group_name}).run();
            Command("/usr/sbin/pvremove %s >/dev/null 2>&1", {array}).run();
        }
        sleep(2);
        return stop_array(array);
    }

    // Ends at the first volume that does not go.
    void remove_volumes(lvmVG &group) {
        const int volumes = std::min(group.lvcount, static_cast<int>(std::size(group.lvdev)));
        for (int i = 0; i < volumes; ++i) {
            if (!remove_volume(&group.lvdev[i].lvmdev))
                return;
            usleep(200);
        }
    }

    bool remove_volume(zavDevice *volume) {
        char mount_point[48];
        zavDevToMnt(volume, mount_point);
        const Command unmount("/bin/umount %s 2>&1", {mount_point});
        if (is_busy(unmount)) {
            zavlogd(const_cast<char *>(kRemove), zav::kAlert, 1,
                    "Failed on umount(%s). errno: 0x%x %s", unmount.text(),
                    static_cast<unsigned>(EBUSY), strerror(EBUSY));
            return false;
        }
        char path[40];
        if (zavDevToStr(path, sizeof path, volume) != ZAV_RC_OK)
            return false;
        if (!ask(kRemove, Command("/usr/sbin/lvremove -f %s 2>&1", {path}), output_))
            return false;
        if (!zav::contains(output_.text, "device is busy"))
            return true;
        ZAV_TRACE(zav::kTraceCommand, "%s() - command output: %s\n", kRemove, output_.text);
        return false;
    }

    // Told by the exit status or by the error number that system() leaves behind.
    static bool is_busy(const Command &unmount) {
        errno = 0;
        const int status = unmount.run();
        const int error = errno;
        ZAV_TRACE(zav::kTraceStep, "%s() - After umount, rcEH: %d, error: %d %s\n", kRemove, status,
                  error, strerror(error));
        return status != 0 && (WEXITSTATUS(status) == EBUSY || error == EBUSY);
    }

    bool stop_array(const char *array) {
        const int status = Command("/sbin/mdadm --manage --stop %s &>/dev/null", {array}).run();
        if (status == 0) {
            result_ = ZAV_RC_OK;
            return true;
        }
        if (WEXITSTATUS(status) != 1)
            return stop(ZAV_RC_ERR);
        printf("Error: %s %s\n\n", array, strerror(EBUSY));
        return stop(ZAV_RC_ERR_EBUSY);
    }

    bool stop(int rc) {
        result_ = rc;
        return false;
    }

    zavDevice source_;
    zavDevice target_;
    Output &output_;
    bool target_exists_ = true;
    int result_ = ZAV_RC_OK;
};

// ---- Putting in ----

class MemberAddition {
  public:
    MemberAddition(const zavDevice &source, const zavDevice &target, int raidcount, Output &output)
        : source_(source), target_(target), raidcount_(raidcount), output_(output) {}

    int run() {
        for (int partition = 1; partition <= kLastPartition; ++partition)
            if (!add_partition(partition))
                break;
        return result_;
    }

  private:
    bool add_partition(int partition) {
        const PartitionName source = name_of(source_, partition);
        const PartitionName target = name_of(target_, partition);
        if (!zav::node_opens(source.text) || !zav::node_opens(target.text))
            return true;
        if (!ask(kAdd, Command(kScan, {source.text}), output_))
            return stop_without_pipe();
        if (output_.text[0] == '\0') {
            set_up();
            return true;
        }
        const ArrayQuery query = zav::read_array_query(output_.text);
        int state = 0;
        int disks = 0;
        if (!ask_state(query.array, state) || get_diskcount(&disks) != ZAV_RC_OK)
            return true;
        ZAV_TRACE(zav::kTraceStep, "%s() - diskcount[%d], raidcount[%d]\n", kAdd, disks,
                  raidcount_);
        if (query.level[0] == '\0') {
            ZAV_TRACE(zav::kTraceCommand, "%s() - JJ\n", kAdd);
            return true;
        }
        if ((state & (ZAV_RAID_DEGRADED | ZAV_RAID_RESYNC)) != 0)
            return add_member(query.array, target.text);
        const bool lost = state == ZAV_RAID_FAILED || state == ZAV_RAID_NOT_EXIST;
        char form[zav::kLongestCreation];
        if (lost && disks == raidcount_ && zav::creation_form(form, raidcount_))
            return create_anew(form, query, target.text, state == ZAV_RAID_FAILED);
        return true;
    }

    // The source's partition belongs to no array: the appliance's own script sets things up.
    static void set_up() {
        if (zavGetDataRaidtype() != 1)
            run_script("/usr/bin/hbqSetup.sh createraid 2>&1");
        restore_volumes();
    }

    static void restore_volumes() { run_script("/usr/bin/hbqSetup.sh lvmrestore 2>&1"); }

    static void run_script(const char *line) {
        ZAV_TRACE(zav::kTraceStep, "%s() - [%s]\n", kAdd, line);
        Command(line, {}).run();
    }

    // False if the array cannot be asked. Only a failed query leaves its code as the result.
    bool ask_state(const char *array, int &state) {
        char metadata_name[sizeof ArrayQuery::array];
        zav::copy_text(metadata_name, sizeof metadata_name, array);
        char path[32];
        zavDevice address = {};
        if (trans_mdname(metadata_name, path) != ZAV_RC_OK ||
            zavStrToDev(path, &address) != ZAV_RC_OK)
            return false;
        zavRaidState info = {};
        if (const int rc = zavGetStateRaid(&address, &info); rc != ZAV_RC_OK) {
            result_ = rc;
            return false;
        }
        char words[128];
        ZAV_TRACE(zav::kTraceStep, "%s() - raidinfo.state[0x%x %s]\n", kAdd,
                  static_cast<unsigned>(info.state), zav_raidstatedef_to_str(info.state, words));
        state = info.state;
        return true;
    }

    bool add_member(const char *array, const char *member) {
        if (!ask(kAdd, Command("/sbin/mdadm %s -a %s 2>&1", {array, member}), output_))
            return stop_without_pipe();
        result_ = ZAV_RC_OK;
        return true;
    }

    bool create_anew(const char *form, const ArrayQuery &query, const char *member, bool running) {
        if (running)
            Command("mdadm --stop %s &>/dev/null", {query.array}).run();
        Command("/bin/dd if=/dev/zero of=%s bs=1M count=1 &>/dev/null", {member}).run();
        const Command create(form, {query.array, query.level});
        ZAV_TRACE(zav::kTraceStep, "%s() - pcmd: %s\n", kAdd, create.text());
        CommandOutput pipe(create);
        if (!pipe)
            return stop_without_pipe();
        pipe.close();
        sleep(10);
        restore_volumes();
        result_ = ZAV_RC_OK;
        return true;
    }

    bool stop_without_pipe() {
        result_ = kNoPipe;
        return false;
    }

    zavDevice source_;
    zavDevice target_;
    int raidcount_;
    Output &output_;
    int result_ = ZAV_RC_OK;
};

} // namespace

int zavRmSWRaidDev(zavDevice *sdev, zavDevice *tdev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (sdev == nullptr || tdev == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (zavGetDataRaidtype() == -1)
        return ZAV_RC_ERR;
    const zav::HeapRecord<Output> output;
    if (!output)
        return no_memory(__func__);
    const int rc = MemberRemoval(*sdev, *tdev, *output).run();
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
    return rc;
}

int zavAddSWRaidDev(zavDevice *sdev, zavDevice *tdev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s().\n", __func__);
    if (sdev == nullptr || tdev == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (zavGetDataRaidtype() == -1)
        return ZAV_RC_ERR;
    zav::ModelConfig config;
    if (const int rc = config.read(); rc != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - model[0x%x], raidcount[%d]\n", __func__,
                  static_cast<unsigned>(config.model), config.raidcount);
        return rc;
    }
    const zav::HeapRecord<Output> output;
    if (!output)
        return no_memory(__func__);
    const int rc = MemberAddition(*sdev, *tdev, config.raidcount, *output).run();
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
    return rc;
}
