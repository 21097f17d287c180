// Events from and to the appliance's event driver.
#include "common/driver.h"
#include "zav_api.h"

#include <unistd.h>

namespace {

using zav::Driver;

constexpr const char *kDevice = "/dev/zavevent0";
constexpr int kRefused = -1;

// The driver's refusal means that nothing is there; any answer but a refusal and 0 is none that it
// has.
int taken(const char *function, int answer) {
    if (answer == kRefused)
        return zav::kNothingPending;
    if (answer == 0)
        return ZAV_RC_OK;
    Driver::log_error(function, 1);
    return ZAV_RC_ERR;
}

// All of it, whichever record it will hold.
void clear(zavSystemEvent *event) {
    // cppcheck-suppress memsetClassFloat ; zero bits are the number 0
    memset(event, 0, sizeof *event);
}

int take(const Driver &driver, Driver::Request request, zavSystemEvent *event) {
    clear(event);
    return driver.request(request, event);
}

} // namespace

int zavPollEvent(zavSystemEvent *event) {
    if (event == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const Driver driver(kDevice);
    if (const int rc = driver.check(__func__); rc != ZAV_RC_OK)
        return rc;
    return taken(__func__, take(driver, Driver::kTake, event));
}

int zavWaitEvent(zavSystemEvent *event) {
    if (event == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const Driver driver(kDevice);
    if (const int rc = driver.check(__func__); rc != ZAV_RC_OK)
        return rc;
    int answer;
    while ((answer = take(driver, Driver::kTake, event)) == kRefused)
        sleep(1);
    if (answer == 0)
        return ZAV_RC_OK;
    Driver::log_error(__func__, errno);
    return ZAV_RC_ERR;
}

int zavPushEvent(zavSystemEvent *event) {
    if (event == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const Driver driver(kDevice);
    if (const int rc = driver.check(__func__); rc != ZAV_RC_OK)
        return rc;
    return driver.put(__func__, event);
}

int zavPollPrivateEvent(zavSystemEvent *event) {
    if (event == nullptr) { // logged here, and in none of the others
        Driver::log_error(__func__, EINVAL);
        return ZAV_RC_ERR_EINVAL;
    }
    clear(event);
    const Driver driver(kDevice);
    if (const int rc = driver.check(__func__); rc != ZAV_RC_OK)
        return rc;
    int pending = 0; // asked, and not used
    driver.request(Driver::kCountPrivate, &pending);
    return taken(__func__, take(driver, Driver::kTakePrivate, event));
}
