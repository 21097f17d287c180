// The mark by which an expansion unit is known to belong to this chassis.
#include "common/diag.h"
#include "common/owner.h"
#include "common/text.h"
#include "zav_api.h"

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace {

constexpr off_t kMarkOffset = 440; // the disk signature of a master boot record
constexpr int kMarks = 100'000'000;

int failed(const char *function, int number, const char *step) {
    zavlogd(const_cast<char *>(function), zav::kAlert, number, "%s is failed!", step);
    return number;
}

// The first volume of a unit, opened where the mark stands. `transfer` reads or writes it there.
template <class Transfer>
int at_mark(const char *function, int unit, const char *step, const Transfer &transfer) {
    char path[48];
    snprintf(path, sizeof path, "/dev/sasraid/r%ddisk1", unit);
    zav::Descriptor volume(open(path, O_RDWR | O_CLOEXEC));
    if (!volume)
        return failed(function, errno, "open");
    if (lseek(volume.get(), kMarkOffset, SEEK_SET) < 0)
        return failed(function, errno, "lseek");
    errno = EIO; // of a transfer that ends early
    if (transfer(volume.get()) != static_cast<ssize_t>(sizeof(int32_t)))
        return failed(function, errno, step);
    return volume.close() ? ZAV_RC_OK : failed(function, errno, "close");
}

int chassis_mark(const char *function, int32_t &mark) {
    const int rc = zavMapRBODCCV(&mark);
    return rc == ZAV_RC_OK ? ZAV_RC_OK : failed(function, rc, "zavMapRBODCCV");
}

} // namespace

int zavMapRBODCCV(int *ccv) {
    if (ccv == nullptr)
        return ZAV_RC_ERR_EINVAL;
    char serial[32] = "";
    if (const int rc = zavGetSerialBIOS(serial, sizeof serial); rc != ZAV_RC_OK)
        return failed(__func__, rc, "zavGetSerialBIOS");
    for (char *c = serial; *c != '\0'; ++c)
        if (*c < '0' || *c > '9')
            *c = '0';
    *ccv = zav::to_int(serial) % kMarks + 1;
    return ZAV_RC_OK;
}

int zavSetiRBOD(sRBOD *rbod) {
    if (rbod == nullptr)
        return ZAV_RC_ERR_EINVAL;
    int32_t mark = 0;
    if (const int rc = chassis_mark(__func__, mark); rc != ZAV_RC_OK)
        return rc;
    return at_mark(__func__, rbod->id, "write",
                   [&](int volume) { return write(volume, &mark, sizeof mark); });
}

int zavGetiRBOD(sRBOD *rbod, int *state) {
    if (rbod == nullptr || state == nullptr)
        return ZAV_RC_ERR_EINVAL;
    int32_t mark = 0;
    if (const int rc = chassis_mark(__func__, mark); rc != ZAV_RC_OK)
        return rc;
    int32_t stored = 0;
    const int rc = at_mark(__func__, rbod->id, "read",
                           [&](int volume) { return read(volume, &stored, sizeof stored); });
    if (rc != ZAV_RC_OK)
        return rc;
    if (stored == mark)
        *state = ZAV_IRBOD_SAME;
    else
        *state = stored == 0 ? ZAV_IRBOD_UNMARKED : ZAV_IRBOD_OTHER;
    return ZAV_RC_OK;
}
