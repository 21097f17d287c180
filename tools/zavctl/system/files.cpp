#include "files.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <dirent.h>
#include <fcntl.h>
#include <filesystem>
#include <memory>
#include <sstream>
#include <unistd.h>

namespace zavctl {

FileFact read_descriptor(int descriptor) {
    FileFact file;
    std::array<char, 4096> piece{};
    ssize_t got = 0;
    while (file.text.size() < largest_file &&
           (got = read(descriptor, piece.data(), piece.size())) > 0)
        file.text.append(piece.data(), static_cast<std::size_t>(got));
    file.error = got < 0 ? errno : 0;
    return file;
}

FileFact read_file(const std::string &path) {
    const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return {errno, ""};
    FileFact file = read_descriptor(descriptor);
    close(descriptor);
    return file;
}

std::vector<std::string> names_in(const std::string &directory, int &error) {
    std::vector<std::string> names;
    const std::unique_ptr<DIR, int (*)(DIR *)> stream(opendir(directory.c_str()), closedir);
    error = stream ? 0 : errno;
    if (!stream)
        return names;
    for (const dirent *entry = readdir(stream.get()); entry; entry = readdir(stream.get()))
        if (const std::string name = entry->d_name; name != "." && name != "..")
            names.push_back(name);
    std::sort(names.begin(), names.end());
    return names;
}

bool is_mounted(const std::string &directory) {
    const std::string mounts = read_file("/etc/mtab").text;
    return mounts.find(" " + directory + " ") != std::string::npos;
}

std::string mounted_at(const std::string &device) {
    std::error_code error;
    const std::string target = std::filesystem::canonical(device, error).string();
    std::istringstream lines(read_file("/etc/mtab").text);
    for (std::string line; std::getline(lines, line);) {
        std::istringstream fields(line);
        std::string source;
        std::string directory;
        if (fields >> source >> directory && source.starts_with("/dev/") &&
            (source == device || std::filesystem::canonical(source, error).string() == target))
            return directory;
    }
    return "";
}

} // namespace zavctl
