// The library's line to the system log.
#include "zav_api.h"

#include <cstdarg>
#include <cstdio>
#include <syslog.h>

int zavlogd(char *funcname, int priority, int errnm, const char *errmsg, ...) {
    char message[512];
    va_list arguments;
    va_start(arguments, errmsg);
    vsnprintf(message, sizeof message, errmsg, arguments);
    va_end(arguments);

    openlog(funcname, LOG_CONS | LOG_PID, LOG_DAEMON);
    syslog(priority, "[%d] %s", errnm, message);
    closelog();
    return ZAV_RC_OK;
}
