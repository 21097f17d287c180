// Functions of the C library that may be let fail, besides those that the unit tests' harness has.
#include "board.h"
#include "call.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <locale.h>
#include <sys/mman.h>
#include <sys/sem.h>
#include <sys/stat.h>
#include <unistd.h>

#define CALLER __builtin_return_address(0)

namespace {

template <class Function>
Function *real(const char *name) {
    return reinterpret_cast<Function *>(dlsym(RTLD_NEXT, name));
}

using faults::fails;

// The function of the C library, looked up once.
#define REAL(name) static const auto the_real = real<decltype(name)>(#name)

template <class Result>
Result failed(int error, Result result) {
    errno = error;
    return result;
}

} // namespace

extern "C" {

FILE *fopen(const char *path, const char *mode) {
    REAL(fopen);
    return fails("fopen", CALLER) ? failed<FILE *>(EMFILE, nullptr) : the_real(path, mode);
}

FILE *fdopen(int descriptor, const char *mode) noexcept {
    REAL(fdopen);
    return fails("fdopen", CALLER) ? failed<FILE *>(ENOMEM, nullptr) : the_real(descriptor, mode);
}

int fclose(FILE *file) {
    REAL(fclose);
    const int result = the_real(file); // what fails is the writing of what was left to write
    return fails("fclose", CALLER) ? failed(ENOSPC, EOF) : result;
}

int fflush(FILE *file) {
    REAL(fflush);
    return fails("fflush", CALLER) ? failed(ENOSPC, EOF) : the_real(file);
}

char *fgets(char *line, int size, FILE *file) {
    REAL(fgets);
    bool halved = false;
    if (fails("fgets", CALLER, halved))
        return failed<char *>(EIO, nullptr);
    char *result = the_real(line, size, file);
    if (halved && result != nullptr)
        line[strlen(line) / 2] = '\0';
    return result;
}

int fgetc(FILE *file) {
    REAL(fgetc);
    return fails("fgetc", CALLER) ? failed(EIO, EOF) : the_real(file);
}

int getc(FILE *file) {
    REAL(getc);
    return fails("getc", CALLER) ? failed(EIO, EOF) : the_real(file);
}

size_t fread(void *buffer, size_t size, size_t count, FILE *file) {
    REAL(fread);
    bool halved = false;
    if (fails("fread", CALLER, halved))
        return failed<size_t>(EIO, 0);
    return the_real(buffer, size, halved ? count / 2 : count, file);
}

size_t fwrite(const void *buffer, size_t size, size_t count, FILE *file) {
    REAL(fwrite);
    bool halved = false;
    if (fails("fwrite", CALLER, halved))
        return failed<size_t>(ENOSPC, 0);
    return the_real(buffer, size, halved ? count / 2 : count, file);
}

int fputs(const char *text, FILE *file) {
    REAL(fputs);
    return fails("fputs", CALLER) ? failed(ENOSPC, EOF) : the_real(text, file);
}

long ftell(FILE *file) {
    REAL(ftell);
    return fails("ftell", CALLER) ? failed(EIO, -1L) : the_real(file);
}

ssize_t read(int descriptor, void *buffer, size_t size) {
    REAL(read);
    bool halved = false;
    if (fails("read", CALLER, halved))
        return failed<ssize_t>(EIO, -1);
    return the_real(descriptor, buffer, halved ? size / 2 : size);
}

ssize_t write(int descriptor, const void *buffer, size_t size) {
    REAL(write);
    bool halved = false;
    if (fails("write", CALLER, halved))
        return failed<ssize_t>(ENOSPC, -1);
    return the_real(descriptor, buffer, halved ? size / 2 : size);
}

off_t lseek(int descriptor, off_t offset, int whence) noexcept {
    REAL(lseek);
    return fails("lseek", CALLER) ? failed<off_t>(ESPIPE, -1)
                                  : the_real(descriptor, offset, whence);
}

void *mmap64(void *address, size_t size, int protection, int flags, int descriptor,
             off64_t offset) noexcept {
    REAL(mmap64);
    return fails("mmap64", CALLER) ? failed(ENOMEM, MAP_FAILED)
                                   : the_real(address, size, protection, flags, descriptor, offset);
}

DIR *opendir(const char *path) {
    REAL(opendir);
    return fails("opendir", CALLER) ? failed<DIR *>(EMFILE, nullptr) : the_real(path);
}

dirent *readdir(DIR *directory) {
    REAL(readdir);
    return fails("readdir", CALLER) ? failed<dirent *>(EIO, nullptr) : the_real(directory);
}

int scandir(const char *path, dirent ***names, int (*chosen)(const dirent *),
            int (*compare)(const dirent **, const dirent **)) {
    REAL(scandir);
    const void *caller = CALLER;
    if (fails("scandir", caller))
        return failed(ENOMEM, -1);
    const int count = the_real(path, names, chosen, compare);
    for (int i = 0; i < count; ++i)
        faults::block_given((*names)[i], caller);
    if (count >= 0)
        faults::block_given(*names, caller);
    return count;
}

int stat(const char *path, struct stat *status) noexcept {
    static const auto the_real = real<int(const char *, struct stat *)>("stat");
    return fails("stat", CALLER) ? failed(EACCES, -1) : the_real(path, status);
}

int unlink(const char *path) noexcept {
    REAL(unlink);
    return fails("unlink", CALLER) ? failed(EACCES, -1) : the_real(path);
}

int semctl(int id, int number, int command, ...) noexcept {
    va_list arguments;
    va_start(arguments, command);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);
    static const auto the_real = real<int(int, int, int, ...)>("semctl");
    return fails("semctl", CALLER) ? failed(EINVAL, -1) : the_real(id, number, command, argument);
}

locale_t newlocale(int category, const char *name, locale_t base) noexcept {
    REAL(newlocale);
    const void *caller = CALLER;
    if (fails("newlocale", caller))
        return failed<locale_t>(ENOMEM, nullptr);
    const locale_t made = the_real(category, name, base);
    return made;
}

#ifndef __SANITIZE_ADDRESS__ // which has its own way to find blocks that are left
void *__libc_malloc(size_t size);
void __libc_free(void *memory);

void *malloc(size_t size) noexcept {
    const void *caller = CALLER;
    if (fails("malloc", caller))
        return failed<void *>(ENOMEM, nullptr);
    void *memory = __libc_malloc(size);
    faults::block_given(memory, caller);
    return memory;
}

void free(void *memory) noexcept {
    faults::block_returned(memory);
    __libc_free(memory);
}
#endif

// A query of the drive may end its caller: that is described, and there is nothing left to look at.
void exit(int status) {
    static const auto the_real = real<void(int)>("exit");
    if (faults::board != nullptr && faults::in_library(CALLER) && faults::board->fired) {
        faults::ended_by_library();
        faults::board->finished = true;
        _exit(0);
    }
    the_real(status);
    __builtin_unreachable();
}
}
