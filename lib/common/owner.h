// Owners of what a call opens: nothing is left behind on any path.
#pragma once

#include <cstdio>
#include <cstdlib>
#include <unistd.h>
#include <utility>

namespace zav {

class File {
  public:
    File() = default;
    File(const char *path, const char *mode) : file_(fopen(path, mode)) {}
    File(const File &) = delete;
    File &operator=(const File &) = delete;
    ~File() { close(); }

    explicit operator bool() const { return file_ != nullptr; }
    FILE *get() const { return file_; }

    void open(const char *path, const char *mode) {
        close();
        file_ = fopen(path, mode);
    }

    // Takes an open descriptor over, unless there is no memory for it.
    bool adopt(int fd, const char *mode) {
        close();
        file_ = fdopen(fd, mode);
        return file_ != nullptr;
    }

    void close() {
        if (file_ != nullptr)
            fclose(std::exchange(file_, nullptr));
    }

    // Does all that was written reach the file?
    bool flush() { return fflush(file_) == 0; }

    // One line of at most `size` - 1 characters, line feed included; false at the end.
    bool line(char *buffer, int size) { return fgets(buffer, size, file_) != nullptr; }

  private:
    FILE *file_ = nullptr;
};

class Descriptor {
  public:
    explicit Descriptor(int fd) : fd_(fd) {}
    Descriptor(const Descriptor &) = delete;
    Descriptor &operator=(const Descriptor &) = delete;
    ~Descriptor() {
        if (fd_ >= 0)
            ::close(fd_);
    }

    explicit operator bool() const { return fd_ >= 0; }
    int get() const { return fd_; }

    // Does the system say that everything went well?
    bool close() { return ::close(std::exchange(fd_, -1)) == 0; }

  private:
    int fd_;
};

// A plain record on the heap, all zero; false without memory.
template <class Record>
class HeapRecord {
  public:
    HeapRecord() : record_(static_cast<Record *>(calloc(1, sizeof(Record)))) {}
    HeapRecord(const HeapRecord &) = delete;
    HeapRecord &operator=(const HeapRecord &) = delete;
    ~HeapRecord() { free(record_); }

    explicit operator bool() const { return record_ != nullptr; }
    Record &operator*() const { return *record_; }

  private:
    Record *record_;
};

} // namespace zav
