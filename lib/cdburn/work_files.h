// The burner's work files: fixed names below /tmp, where other users may plant links.
#pragma once

#include "common/owner.h"

#include <cstdio>
#include <fcntl.h>

namespace zav {

constexpr const char *kDrive = "/dev/scd0";
constexpr const char *kProgressFile = "/tmp/progress.outfile";
constexpr const char *kDvdReport = "/tmp/dvd.outfile";
constexpr const char *kCdReport = "/tmp/cd.outfile";

// A stream over the file itself, never over what a link of its name leads to, and no wait for
// anybody at the other end of a pipe.
inline void open_work_file(File &file, const char *path, int flags, const char *mode) {
    const int fd = open(path, flags | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC, 0666);
    if (fd >= 0 && !file.adopt(fd, mode))
        close(fd);
}

inline void read_work_file(File &file, const char *path) {
    open_work_file(file, path, O_RDONLY, "r");
}

// Emptied first.
inline void write_work_file(File &file, const char *path) {
    open_work_file(file, path, O_WRONLY | O_CREAT | O_TRUNC, "w");
}

// The last line of a tool's report, or the end of it that fits; false for an empty report.
inline bool last_line(File &file, char *line, int size) {
    bool found = false;
    while (file.line(line, size))
        found = true;
    return found;
}

// The end of a job. A file that cannot be opened stays as it is.
inline void write_done() {
    File file;
    write_work_file(file, kProgressFile);
    if (file)
        fputs("100", file.get());
}

} // namespace zav
