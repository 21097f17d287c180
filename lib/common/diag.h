// The library's own way to the log and the trace: under the name of the function that reports.
#pragma once

#include "zav_api.h"

namespace zav {

constexpr int kAlert = 1;   // LOG_ALERT
constexpr int kWarning = 4; // LOG_WARNING

// Trace types. They are compared with level 1, at which nearly all messages are issued: failures
// reach standard output, the others stay silent.
constexpr int kTraceFailure = 1;
constexpr int kTraceCommand = 2;
constexpr int kTraceStep = 3;
constexpr int kTraceParser = 4;

} // namespace zav

#define ZAV_LOG(priority, number, ...)                                                             \
    zavlogd(const_cast<char *>(__func__), (priority), (number), __VA_ARGS__)

#define ZAV_TRACE(type, ...) zavdbgmsg((type), 1, __VA_ARGS__)
