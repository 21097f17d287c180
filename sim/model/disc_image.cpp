#include "model/disc_image.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <nlohmann/json.hpp>

namespace zavsim {

namespace {

constexpr std::size_t descriptor_at = 16 * disc_sector;
constexpr std::size_t size_at = descriptor_at + 80; // within the descriptor, lowest byte first
constexpr std::size_t list_at = 18 * disc_sector;
const std::string descriptor_mark = "\1CD001\1";
const std::string list_mark = "FILELIST";
constexpr std::size_t list_head = 16; // mark and length

constexpr std::uint64_t padding = 150;
constexpr std::uint64_t descriptors_and_tables = 31;
constexpr std::uint64_t per_directory = 2; // in either of its names

std::string list_of(const DiscImage &image) {
    nlohmann::json files = nlohmann::json::array();
    for (const DiscFile &file : image.files)
        files.push_back({file.path, file.bytes});
    const std::string text =
        nlohmann::json{{"merges", image.merges}, {"head", image.head}, {"files", files}}.dump(
            -1, ' ', false, nlohmann::json::error_handler_t::replace);
    return list_mark + fmt::format("{:08x}", text.size()) + text;
}

// Nothing while it is not whole.
std::optional<std::string> list_in(const std::string &bytes) {
    if (bytes.size() < list_at + list_head)
        return std::nullopt;
    if (bytes.compare(list_at, list_mark.size(), list_mark) != 0)
        return "";
    const std::size_t length = std::stoul(bytes.substr(list_at + list_mark.size(), 8), nullptr, 16);
    if (bytes.size() < list_at + list_head + length)
        return std::nullopt;
    return bytes.substr(list_at + list_head, length);
}

std::uint64_t told_size(const std::string &bytes) {
    if (bytes.compare(descriptor_at, descriptor_mark.size(), descriptor_mark) != 0)
        return 0;
    std::uint64_t size = 0;
    for (std::size_t i = 4; i-- > 0;)
        size = size << 8 | static_cast<unsigned char>(bytes[size_at + i]);
    return size;
}

} // namespace

DiscImage image_of(const std::vector<DiscFile> &files, bool merges) {
    DiscImage image;
    image.files = files;
    image.merges = merges;
    std::uint64_t data = 0;
    std::uint64_t directories = 1;
    for (const DiscFile &file : files) {
        data += sectors_of(file.bytes);
        directories += file.path.back() == '/' ? 1 : 0;
    }
    constexpr std::uint64_t digits = 32; // of a list whose numbers are not known yet
    const std::uint64_t list = sectors_of(list_at + list_of(image).size() + digits);
    image.head = std::max(descriptors_and_tables + per_directory * directories, list);
    image.sectors = image.head + data + padding;
    return image;
}

std::string image_head(const DiscImage &image) {
    std::string bytes(image.head * disc_sector, '\0');
    bytes.replace(descriptor_at, descriptor_mark.size(), descriptor_mark);
    for (std::size_t i = 0; i < 4; ++i)
        bytes[size_at + i] = static_cast<char>(image.sectors >> (8 * i) & 0xFF);
    const std::string list = list_of(image);
    bytes.replace(list_at, list.size(), list);
    return bytes;
}

std::optional<DiscImage> read_image_head(const std::string &bytes) {
    const auto list = list_in(bytes);
    if (!list)
        return std::nullopt;
    DiscImage image;
    image.sectors = told_size(bytes);
    if (list->empty())
        return image;
    const nlohmann::json told = nlohmann::json::parse(*list);
    image.merges = told.at("merges");
    image.head = told.at("head");
    for (const auto &file : told.at("files"))
        image.files.push_back({file.at(0), file.at(1)});
    return image;
}

std::vector<DiscFile> files_within(const DiscImage &image, std::uint64_t sectors) {
    std::vector<DiscFile> files;
    std::uint64_t end = image.head;
    for (const DiscFile &file : image.files) {
        end += sectors_of(file.bytes);
        if (end <= sectors)
            files.push_back(file);
    }
    return files;
}

} // namespace zavsim
