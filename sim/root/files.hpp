// Small file helpers of the private root.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>

namespace zavsim {

std::optional<std::string> read_text(const std::filesystem::path &path);

// Replaces the file whole, so that a reader sees the old text or the new one; leaves an unchanged
// file alone.
void write_text(const std::filesystem::path &path, const std::string &text);

// Writes a file that others write to as well, in place: whoever has it open still reaches it. At
// no moment is it shorter than the old text and the new.
void overwrite_text(const std::filesystem::path &path, const std::string &text);

// Whether it was written within the last second: one that is empty may be about to be written.
bool is_fresh(const std::filesystem::path &path);

// Makes or corrects a symbolic link.
void point_link(const std::filesystem::path &link, const std::string &target);

// A file of that size that occupies nothing.
void make_sparse(const std::filesystem::path &path, std::uint64_t bytes);

// The identifier of a disk's label, at its place on the disk.
void write_label_id(const std::filesystem::path &disk, std::uint32_t label_id);

// An open file that is closed with its owner.
class Descriptor {
  public:
    explicit Descriptor(int fd) : fd_(fd) {}
    ~Descriptor();
    Descriptor(const Descriptor &) = delete;
    Descriptor &operator=(const Descriptor &) = delete;
    int get() const { return fd_; }

  private:
    int fd_;
};

} // namespace zavsim
