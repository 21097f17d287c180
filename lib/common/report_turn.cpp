#include "report_turn.h"

#include "diag.h"

namespace zav {

namespace {

constexpr int kLogNumber = 3; // of everything about locks

int refuse(const char *reporter, const char *format) {
    zavlogd(const_cast<char *>(reporter), kAlert, kLogNumber, format, ReportTurn::kKey);
    return ZAV_RC_ERR;
}

} // namespace

int ReportTurn::take(const char *reporter, int told_key) {
    if (lock_.get() != ZAV_RC_OK)
        return refuse(reporter, "Get Semaphore [%d] failed!!");
    if (lock_.take(told_key) != ZAV_RC_OK)
        return refuse(reporter, "semaphore_p [%d] failed!!");
    return ZAV_RC_OK;
}

} // namespace zav
