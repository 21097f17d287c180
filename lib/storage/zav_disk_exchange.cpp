// Taking a disk out of service and bringing another in, while the appliance runs.
#include "common/diag.h"
#include "common/model.h"
#include "common/node.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"

#include <cstdio>
#include <cstring>
#include <unistd.h>

namespace {

using zav::Command;
using zav::CommandOutput;

constexpr int kLastPartition = 15;
constexpr int kAttach = 1;
constexpr int kDetach = 2;
constexpr int kNoPipe = 32; // a tool that cannot be started
constexpr const char *kRemove = "zavDiskHotRemove";
constexpr const char *kAdd = "zavDiskHotAdd";

// What a call works with: the disk itself, the healthy disk it is compared with, their names.
struct Workspace {
    zavDevice target;
    zavDevice source;
    char target_name[128];
    char source_name[128];
    char text[1024];
};

int read_config(const char *function, zav::ModelConfig &config) {
    const int rc = config.read();
    if (rc != ZAV_RC_OK)
        ZAV_TRACE(zav::kTraceCommand, "%s() - ERR! model[0x%x], diskmax[%d], raidcount[%d]\n",
                  function, static_cast<unsigned>(config.model), config.diskmax, config.raidcount);
    return rc;
}

int refuse(const char *function, const char *message) {
    ZAV_TRACE(zav::kTraceCommand, "%s() - %s\n", function, message);
    zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EINVAL, "%s", message);
    return ZAV_RC_ERR_EINVAL;
}

// What both refuse of the disk. Their messages differ in the way the minor type is printed and in
// a line feed.
int check_disk(const char *function, const zavDevice *disk, const char *minor_type_format,
               const char *part_format) {
    char message[128];
    if (disk == nullptr)
        return refuse(function, "Error: argu diskdev is NULL. Return ZAV_RC_ERR_EINVAL.");
    if (disk->type != ZAV_DEV_HDD)
        snprintf(message, sizeof message,
                 "Error: diskdev.type(0x%x) is not ZAV_DEV_HDD. Return ZAV_RC_ERR_EINVAL",
                 static_cast<unsigned>(disk->type));
    else if (disk->minor_type != ZAV_MINDEV_HDD_SATA)
        snprintf(message, sizeof message, minor_type_format, disk->minor_type);
    else if (disk->part != 0)
        snprintf(message, sizeof message, part_format, disk->part);
    else
        return ZAV_RC_OK;
    return refuse(function, message);
}

void begin(Workspace &work, const zavDevice &disk) {
    work.target = disk;
    work.source = disk;
    work.source.part = 0;
}

int name_disks(Workspace &work) {
    if (const int rc = zavDevToStr(work.source_name, sizeof work.source_name, &work.source);
        rc != ZAV_RC_OK)
        return rc;
    return zavDevToStr(work.target_name, sizeof work.target_name, &work.target);
}

// ---- Removing ----

// The first other disk that is there and healthy. The disk itself is asked in its turn.
bool find_remaining_disk(Workspace &work, int slots) {
    for (int slot = 1; slot <= slots; ++slot) {
        zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
        zavHddState info = {};
        if (zavGetStateDisk(&disk, &info) == ZAV_RC_OK && (info.state & ZAV_HDD_FOUND) != 0 &&
            slot != work.target.disk) {
            work.source.disk = slot;
            return true;
        }
    }
    return false;
}

// Does mdadm find the superblocks of the disk that will remain consistent?
int check_source(Workspace &work) {
    zavDevice partition = work.source;
    for (partition.part = 1; partition.part <= kLastPartition; ++partition.part) {
        char name[128];
        if (const int rc = zavDevToStr(name, sizeof name, &partition); rc != ZAV_RC_OK)
            return rc;
        if (!zav::node_opens(name))
            continue;
        const Command query("/sbin/mdadm --misc --query %s 2>&1", {name});
        ZAV_TRACE(zav::kTraceStep, "%s() - cmd: %s\n", kRemove, query.text());
        CommandOutput output(query);
        if (!output)
            return kNoPipe;
        output.text(work.text, sizeof work.text);
        if (zav::contains(work.text, "mismatch"))
            return ZAV_RC_ERR;
    }
    return ZAV_RC_OK;
}

int remove_disk(Workspace &work, const zav::ModelConfig &config) {
    if (work.target.disk < 1 || work.target.disk > config.diskmax)
        return ZAV_RC_ERR_EINVAL;
    if (!find_remaining_disk(work, config.raidcount)) // the last disk of an array stays
        return ZAV_RC_ERR_EINVAL;
    if (const int rc = name_disks(work); rc != ZAV_RC_OK)
        return rc;
    ZAV_TRACE(zav::kTraceStep, "%s() - sdevname: %s\n", kRemove, work.source_name);
    ZAV_TRACE(zav::kTraceStep, "%s() - tdevname: %s\n", kRemove, work.target_name);
    if (!zav::node_opens(work.source_name)) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - open %s failed\n", kRemove, work.source_name);
        return ZAV_RC_ERR;
    }
    if (!zav::node_opens(work.target_name)) // one that has vanished can still leave its arrays
        ZAV_TRACE(zav::kTraceCommand, "%s() - open %s failed\n", kRemove, work.target_name);
    if (const int rc = check_source(work); rc != ZAV_RC_OK)
        return rc;
    if (const int rc = zavRmSWRaidDev(&work.source, &work.target); rc != ZAV_RC_OK)
        return rc;
    sleep(5);
    return zavHotCmd(kDetach, &work.target);
}

// ---- Adding ----

// The kernel name of the disk in mdadm's "/dev/sdb1": "sdb".
bool disk_of_member(char *line, char (&name)[256]) {
    constexpr const char *kNodes = "/dev/";
    trim(line);
    if (!zav::starts_with(line, kNodes))
        return false;
    zav::copy_text(name, sizeof name, line + strlen(kNodes));
    name[strcspn(name, " \t\n\v\f\r")] = '\0';
    if (strlen(name) < 2)
        return false;
    name[strlen(name) - 1] = '\0'; // the partition's digit
    return true;
}

// The appliance's address of the disk with that kernel name.
bool look_up_disk(const char *kernel_name, Workspace &work) {
    const Command links("echo /dev/`udevinfo -q symlink -p /sys/block/%s | sed -n 's/ /\\n/gp' | "
                        "sed '/^$/d' | sed '/^disk/d'`",
                        {kernel_name});
    ZAV_TRACE(zav::kTraceStep, "%s() - strcmd: %s\n", kAdd, links.text());
    CommandOutput output(links);
    if (!output) {
        zavlogd(const_cast<char *>(kAdd), zav::kWarning, 0, "popen failed. [%s]", links.text());
        ZAV_TRACE(zav::kTraceCommand, "%s() - popen failed. strcmd[%s]\n", kAdd, links.text());
        return false;
    }
    char path[257];
    if (output.text(path, sizeof path) == 0) {
        zavlogd(const_cast<char *>(kAdd), zav::kWarning, 0, "no popen result [%s]", links.text());
        ZAV_TRACE(zav::kTraceCommand, "%s() - no popen result [%s]\n", kAdd, links.text());
        return false;
    }
    trim(path);
    ZAV_TRACE(zav::kTraceStep, "%s() - zav device name[%s]\n", kAdd, path);
    zavDevice disk = {};
    if (zavStrToDev(path, &disk) != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - zavStrToDev failed [%s]\n", kAdd, path);
        return false;
    }
    work.source.disk = disk.disk;
    return true;
}

// The disk whose partition table is copied: that of the first array's first active member.
bool find_source_disk(Workspace &work) {
    const Command member(" mdadm --detail /dev/md0 | sed -n \"/active sync/p\" | sed -n '1p' | "
                         "awk '{print $7}'",
                         {});
    CommandOutput output(member);
    if (!output) {
        zavlogd(const_cast<char *>(kAdd), zav::kWarning, 0, "popen failed. [%s]", member.text());
        ZAV_TRACE(zav::kTraceCommand, "%s() - popen failed. strcmd[%s]\n", kAdd, member.text());
        return false;
    }
    char line[257];
    char kernel_name[256];
    return output.line(line, sizeof line) && disk_of_member(line, kernel_name) &&
           look_up_disk(kernel_name, work);
}

void run_step(const Command &command) {
    command.run();
    ZAV_TRACE(zav::kTraceStep, "%s() - [%s]\n", kAdd, command.text());
}

// Whether the commands succeed is left to the arrays to find out.
int prepare(Workspace &work) {
    const char *source = work.source_name;
    const char *target = work.target_name;
    run_step(Command("mdadm --zero-superblock %s &>/dev/null", {target}));
    run_step(Command("/bin/dd if=/dev/zero of=%s bs=2M count=1 &>/dev/null", {target}));
    sleep(1);
    run_step(Command("/sbin/sfdisk -d %s | sfdisk %s &>/dev/null", {source, target}));
    sleep(5);
    if (const int rc = zavDevToStr(work.text, sizeof work.text, &work.target); rc != ZAV_RC_OK)
        return rc;
    run_step(Command("echo -ne \"\\x4D\\x10\" | dd of=%s bs=1 seek=440 count=2 &>/dev/null",
                     {work.text}));
    return ZAV_RC_OK;
}

int add_disk(Workspace &work) {
    if (!find_source_disk(work))
        return ZAV_RC_ERR_EINVAL;
    if (work.source.disk == work.target.disk) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - [sdev->disk == tdev->disk = %d]\n", kAdd,
                  work.target.disk);
        return ZAV_RC_ERR_EINVAL;
    }
    if (const int rc = name_disks(work); rc != ZAV_RC_OK)
        return rc;
    if (!zav::node_opens(work.source_name))
        return ZAV_RC_ERR;
    if (zav::node_opens(work.target_name)) {
        ZAV_TRACE(zav::kTraceStep, "%s() - %s exist, res =ZAV_RC_ERR_EEXIST \n", kAdd,
                  work.target_name);
    } else {
        ZAV_TRACE(zav::kTraceStep, "%s() - %s NOT exist \n", kAdd, work.target_name);
        if (const int rc = zavHotCmd(kAttach, &work.target); rc != ZAV_RC_OK)
            return rc;
        sleep(10);
    }
    if (const int rc = prepare(work); rc != ZAV_RC_OK)
        return rc;
    return zavAddSWRaidDev(&work.source, &work.target);
}

} // namespace

int zavDiskHotRemove(zavDevice *diskdev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    zav::ModelConfig config;
    if (const int rc = read_config(__func__, config); rc != ZAV_RC_OK)
        return rc;
    if (!config.is_known())
        return refuse(__func__, "Error: Just support Solvane-2860 and Solvane-2740. "
                                "Return ZAV_RC_ERR_EINVAL.");
    if (const int rc = check_disk(
            __func__, diskdev,
            "Error: diskdev->minor_type(%d) is not ZAV_MINDEV_HDD_SATA. Return ZAV_RC_ERR_EINVAL",
            "Error: diskdev->part(%d) must be 0. Return ZAV_RC_ERR_EINVAL\n");
        rc != ZAV_RC_OK)
        return rc;
    const zav::HeapRecord<Workspace> work;
    if (!work) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_ENOMEM,
                "memory allocation failure! Return ZAV_RC_ERR_ENOMEM");
        return ZAV_RC_ERR_ENOMEM;
    }
    begin(*work, *diskdev);
    const int rc = remove_disk(*work, config);
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
    return rc;
}

int zavDiskHotAdd(zavDevice *diskdev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    zav::ModelConfig config;
    if (const int rc = read_config(__func__, config); rc != ZAV_RC_OK)
        return rc;
    if (!config.is_known())
        return refuse(__func__, "just be supported on model 2740H|2860. Return ZAV_RC_ERR_EINVAL.");
    if (diskdev != nullptr && (diskdev->disk < 1 || diskdev->disk > config.diskmax)) {
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR_EINVAL, "diskdev->disk(%d) is not acceptable.",
                diskdev->disk);
        return ZAV_RC_ERR_EINVAL;
    }
    if (const int rc = check_disk(
            __func__, diskdev,
            "Error: diskdev->minor_type(0x%x) is not ZAV_MINDEV_HDD_SATA. Return ZAV_RC_ERR_EINVAL",
            "Error: diskdev->part(%d) must be 0. Return ZAV_RC_ERR_EINVAL");
        rc != ZAV_RC_OK)
        return rc;
    const zav::HeapRecord<Workspace> work;
    if (!work) {
        // The log line's number is not the code that is returned.
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_EINVAL,
                "Memory allocation failed. Return ZAV_RC_ERR_ENOMEM");
        return ZAV_RC_ERR_ENOMEM;
    }
    begin(*work, *diskdev);
    const int rc = add_disk(*work);
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
    return rc;
}
