// The functions of the C library that ask about a file or give it back: what they answer of the
// appliance's devices may be a test's own.
#include "harness.h"

#include <cerrno>
#include <dlfcn.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

template <typename Function>
Function *real(const char *name) {
    return reinterpret_cast<Function *>(dlsym(RTLD_NEXT, name));
}

bool fails(const char *function, const void *caller) {
    return harness::call_fails != nullptr && harness::call_fails(function, caller);
}

} // namespace

extern "C" {

int access(const char *path, int mode) noexcept {
    static const auto the_real = real<int(const char *, int)>("access");
    const bool refused = fails("access", __builtin_return_address(0));
    if (!refused && !harness::record().access_error)
        return the_real(path, mode);
    errno = refused ? EACCES : *harness::record().access_error;
    return -1;
}

int fstat(int descriptor, struct stat *status) noexcept {
    static const auto the_real = real<int(int, struct stat *)>("fstat");
    if (fails("fstat", __builtin_return_address(0))) {
        errno = EIO;
        return -1;
    }
    const int result = the_real(descriptor, status);
    if (result == 0 && harness::record().files_are_devices) {
        status->st_mode = S_IFCHR | 0600;
        status->st_size = 0;
    }
    return result;
}

// What fails is what was left to do; the descriptor is gone all the same.
int close(int descriptor) {
    const auto result = static_cast<int>(syscall(SYS_close, descriptor));
    if (!fails("close", __builtin_return_address(0)) && !harness::record().close_fails)
        return result;
    errno = EIO;
    return -1;
}
}
