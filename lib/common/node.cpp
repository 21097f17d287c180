#include "node.h"

#include "diag.h"
#include "owner.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace zav {

namespace {

constexpr int kAttempts = 3;
constexpr unsigned kGraceSeconds = 10;

bool means_missing(int error) {
    return error == ENODEV || error == ENOENT;
}

} // namespace

NodeProbe probe_node(const char *reporter, const char *path) {
    int error = 0;
    for (int attempt = 1; attempt <= kAttempts; ++attempt) {
        if (access(path, F_OK) == 0)
            return {NodeProbe::Result::kPresent, 0};
        error = errno;
        if (!means_missing(error))
            zavlogd(const_cast<char *>(reporter), kWarning, ZAV_RC_ERR_ENODEV,
                    "access device %s failed for %d times. ErrCode[0x%x] %s", path, attempt,
                    static_cast<unsigned>(error), strerror(error));
        if (attempt < kAttempts)
            sleep(kGraceSeconds);
    }
    return {means_missing(error) ? NodeProbe::Result::kMissing : NodeProbe::Result::kInaccessible,
            error};
}

bool node_opens(const char *path) {
    return static_cast<bool>(Descriptor(open(path, O_RDONLY | O_CLOEXEC)));
}

void log_missing_node(const char *reporter, const char *kind, const char *path, int error) {
    zavlogd(const_cast<char *>(reporter), kWarning, ZAV_RC_ERR_ENODEV,
            "%s %s not found[1]. ErrCode[0x%x] %s", kind, path, static_cast<unsigned>(error),
            strerror(error));
}

} // namespace zav
