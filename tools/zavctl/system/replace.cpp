#include "replace.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

namespace zavctl {

namespace {

constexpr mode_t for_every_reader = 0644;

int write_all(int descriptor, std::string_view rest) {
    while (!rest.empty()) {
        const ssize_t done = write(descriptor, rest.data(), rest.size());
        if (done < 0 && errno != EINTR)
            return errno;
        rest.remove_prefix(done < 0 ? 0 : static_cast<std::size_t>(done));
    }
    return 0;
}

int error_of(int result) {
    return result == 0 ? 0 : errno;
}

} // namespace

int replace_file(const std::string &file, const std::string &text) {
    std::string temporary = file + ".XXXXXX"; // in the same file system
    const int descriptor = mkstemp(temporary.data());
    if (descriptor < 0)
        return errno;
    int error = write_all(descriptor, text);
    if (error == 0)
        error = error_of(fchmod(descriptor, for_every_reader));
    if (error == 0)
        error = error_of(fsync(descriptor));
    if (close(descriptor) != 0 && error == 0)
        error = errno;
    if (error == 0)
        error = error_of(std::rename(temporary.c_str(), file.c_str()));
    if (error != 0)
        unlink(temporary.c_str());
    return error;
}

} // namespace zavctl
