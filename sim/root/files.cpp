#include "root/files.hpp"

#include <array>
#include <cerrno>
#include <chrono>
#include <fcntl.h>
#include <fstream>
#include <iterator>
#include <system_error>
#include <unistd.h>

namespace fs = std::filesystem;

namespace zavsim {

Descriptor::~Descriptor() {
    if (fd_ >= 0)
        close(fd_);
}

std::optional<std::string> read_text(const fs::path &path) {
    std::ifstream in(path, std::ios::binary);
    if (!in)
        return std::nullopt;
    return std::string{std::istreambuf_iterator<char>(in), {}};
}

void write_text(const fs::path &path, const std::string &text) {
    if (fs::is_regular_file(fs::symlink_status(path)) && read_text(path) == text)
        return;
    fs::create_directories(path.parent_path());
    const fs::path fresh = path.parent_path() / ("." + path.filename().string() + ".new");
    {
        std::ofstream out(fresh, std::ios::binary | std::ios::trunc);
        out << text;
        if (!out.flush())
            throw std::system_error(errno, std::generic_category(), fresh);
    }
    fs::rename(fresh, path);
}

void overwrite_text(const fs::path &path, const std::string &text) {
    const Descriptor file(open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0660));
    const auto size = static_cast<ssize_t>(text.size());
    if (file.get() < 0 || pwrite(file.get(), text.data(), text.size(), 0) != size ||
        ftruncate(file.get(), size) != 0)
        throw std::system_error(errno, std::generic_category(), path);
}

bool is_fresh(const fs::path &path) {
    return fs::file_time_type::clock::now() - fs::last_write_time(path) < std::chrono::seconds(1);
}

void point_link(const fs::path &link, const std::string &target) {
    std::error_code error;
    if (fs::read_symlink(link, error) == target && !error)
        return;
    fs::create_directories(link.parent_path());
    fs::remove(link);
    fs::create_symlink(target, link);
}

void make_sparse(const fs::path &path, std::uint64_t bytes) {
    const Descriptor file(open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0660));
    if (file.get() < 0 || ftruncate(file.get(), static_cast<off_t>(bytes)) != 0)
        throw std::system_error(errno, std::generic_category(), path);
}

void write_label_id(const fs::path &disk, std::uint32_t label_id) {
    const Descriptor file(open(disk.c_str(), O_WRONLY | O_CLOEXEC));
    std::array<unsigned char, 4> bytes{};
    for (std::size_t i = 0; i < bytes.size(); ++i)
        bytes.at(i) = static_cast<unsigned char>(label_id >> (8 * i));
    if (file.get() < 0 || pwrite(file.get(), bytes.data(), bytes.size(), 440) != 4)
        throw std::system_error(errno, std::generic_category(), disk);
}

} // namespace zavsim
