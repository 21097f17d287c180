// BIOS settings in a file, and the board's identity.
#include "common/diag.h"
#include "common/owner.h"
#include "common/text.h"
#include "zav_api.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace {

constexpr const char *kSettings = "/dev/nvram";
constexpr size_t kSettingsSize = 114;

// The device hands over and takes all bytes in one go. A transfer that comes in pieces starts at
// the first byte again each time.
template <typename Transfer>
void transfer_settings(int device, char *settings, Transfer transfer) {
    size_t done = 0;
    while (done < kSettingsSize) {
        const ssize_t count = transfer(device, settings, kSettingsSize - done);
        if (count <= 0)
            return;
        done += static_cast<size_t>(count);
    }
}

int write_settings(const zav::File &file, const char *settings) {
    // Unbuffered, so that a full disk is noticed here and not when the file is closed.
    setvbuf(file.get(), nullptr, _IONBF, 0);
    if (fwrite(settings, kSettingsSize, 1, file.get()) != 1) {
        printf("fwrite error");
        return ZAV_RC_ERR;
    }
    const long length = ftell(file.get());
    if (length < static_cast<long>(kSettingsSize)) {
        printf("file length error, len = %ld\n", length);
        return 0x1001;
    }
    return ZAV_RC_OK;
}

// The first line of an identity file; a line feed that comes first is kept.
int read_identity(const char *function, const char *path, char *value, int size) {
    if (value == nullptr || size < 1)
        return ZAV_RC_ERR_EINVAL;
    zav::File file(path, "re");
    if (!file) {
        zavlogd(const_cast<char *>(function), zav::kAlert, ENOENT, "%s", strerror(ENOENT));
        return ZAV_RC_ERR;
    }
    if (file.line(value, size))
        zav::Fields(value).next("\n");
    return ZAV_RC_OK;
}

} // namespace

// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
int zavSaveBIOS(char *filepath) {
    if (filepath == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const zav::Descriptor device(open(kSettings, O_RDONLY | O_CLOEXEC));
    if (!device) {
        printf("file open error");
        return ZAV_RC_ERR;
    }
    const zav::File file(filepath, "we");
    if (!file) {
        printf("fopen error");
        return ZAV_RC_ERR;
    }
    // Zeros, so that a device that cannot be read does not save the stack.
    char settings[kSettingsSize] = {};
    transfer_settings(device.get(), settings, read);
    return write_settings(file, settings);
}

// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
int zavLoadBIOS(char *filepath) {
    if (filepath == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File file(filepath, "re");
    if (!file) {
        printf("fopen error");
        return ZAV_RC_ERR;
    }
    const zav::Descriptor device(open(kSettings, O_WRONLY | O_CLOEXEC));
    if (!device) {
        printf("file open error");
        return ZAV_RC_ERR;
    }
    char settings[kSettingsSize];
    if (fread(settings, sizeof settings, 1, file.get()) != 1) {
        printf("fread error");
        return ZAV_RC_ERR;
    }
    transfer_settings(device.get(), settings, write);
    return ZAV_RC_OK;
}

int zavGetModelBIOS(char *value, int size) {
    return read_identity(__func__, "/sys/class/dmi/id/product_name", value, size);
}

int zavGetSerialBIOS(char *value, int size) {
    return read_identity(__func__, "/sys/class/dmi/id/product_serial", value, size);
}
