// The appliance's drivers that exchange records. One caller at a time can have such a device open.
#pragma once

#include "diag.h"
#include "owner.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/ioctl.h>

namespace zav {

constexpr int kNothingPending = 0x1201;

class Driver {
  public:
    enum Request : unsigned long { kPut = 1, kTake = 2, kTakePrivate = 0x10, kCountPrivate = 0x20 };

    // With these flags and no other.
    explicit Driver(const char *path) : device_(open(path, O_RDWR | O_EXCL | O_NOCTTY)) {}

    // ZAV_RC_ERR_EACCES, logged under the name `reporter`, if the device could not be opened. To be
    // called before anything else.
    int check(const char *reporter) const {
        if (device_)
            return ZAV_RC_OK;
        log_error(reporter, errno);
        return ZAV_RC_ERR_EACCES;
    }

    // ZAV_RC_ERR, which is not logged, if the driver refuses.
    int put(const char *reporter, void *record) const {
        const int answer = request(kPut, record);
        if (answer == 0)
            return ZAV_RC_OK;
        if (answer != -ENOMEM) // the queue is full, as told by a driver that answers with the error
            return ZAV_RC_ERR;
        log_error(reporter, ENOMEM);
        return ZAV_RC_ERR_ENOMEM;
    }

    int request(Request number, void *record) const { return ioctl(device_.get(), number, record); }

    static void log_error(const char *reporter, int error) {
        zavlogd(const_cast<char *>(reporter), kAlert, error, "%s", strerror(error));
    }

  private:
    Descriptor device_;
};

} // namespace zav
