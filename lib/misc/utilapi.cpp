// Trace output, return-code conversion, trimming, and the names of software arrays.
#include "common/text.h"
#include "zav_api.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

void zavdbgmsg(int debugtype, int debuglevel, const char *dbgmsg, ...) {
    if (debugtype > debuglevel)
        return;
    char message[256];
    va_list arguments;
    va_start(arguments, dbgmsg);
    vsnprintf(message, sizeof message, dbgmsg, arguments);
    va_end(arguments);
    printf("%s", message);
    if (debugtype == 0) {
        // A message that stops the program is printed twice.
        printf("%s", message);
        zavdbgStop(debuglevel);
    }
}

void zavdbgStop(int debuglevel) {
    if (debuglevel <= 1)
        return;
    puts("Press Enter to continue....");
    getchar();
}

// Success is not passed through either: callers convert only after a failure.
int zavRCSysToZav(int systemerrno) {
    switch (systemerrno) {
    case ZAV_RC_ERR_ENOENT:
    case ZAV_RC_ERR_ENODEV:
    case ZAV_RC_ERR_EINVAL:
    case ZAV_RC_ERR_ESTRPIPE:
        return systemerrno;
    default:
        return ZAV_RC_ERR;
    }
}

int zavRCZavToSys(int zaverrno) {
    return zavRCSysToZav(zaverrno);
}

// Line feeds go at the end only; carriage returns stay.
void trim(char *s) {
    if (s == nullptr)
        return;
    const char *start = s + strspn(s, " \t");
    memmove(s, start, strlen(start) + 1);
    char blanks[] = " \t\n";
    rtrim(s, blanks);
}

// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
void rtrim(char *string, char *trim) {
    if (string == nullptr || trim == nullptr)
        return;
    size_t length = strlen(string);
    while (length > 0 && strchr(trim, string[length - 1]) != nullptr)
        string[--length] = '\0';
}

// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
void ltrim(char *string, char *trim) {
    if (string == nullptr || trim == nullptr)
        return;
    const char *start = string + strspn(string, trim);
    memmove(string, start, strlen(start) + 1);
}

// A substring test in this order: "/dev/md/MD10" is taken for MD1.
// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
int trans_mdname(char *metaname, char *zavname) {
    static constexpr struct {
        const char *metadata;
        const char *node;
    } kArrays[] = {
        {"/dev/md/MD0", "/dev/swraid/disk1p1"},
        {"/dev/md/MD1", "/dev/swraid/disk2p1"},
        {"/dev/md/MD2", "/dev/swraid/disk3p1"},
        {"/dev/md/MD3", "/dev/swraid/disk4p1"},
    };
    if (metaname == nullptr || zavname == nullptr)
        return ZAV_RC_ERR;
    for (const auto &array : kArrays) {
        if (zav::contains(metaname, array.metadata)) {
            strcpy(zavname, array.node);
            return ZAV_RC_OK;
        }
    }
    return ZAV_RC_ERR;
}
