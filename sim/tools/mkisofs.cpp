// mkisofs: the image of a directory on standard output.
#include "model/disc_image.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/disc_job.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <ctime>
#include <fcntl.h>
#include <filesystem>
#include <fmt/chrono.h>
#include <fmt/format.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

constexpr int failure = 255;
constexpr std::uint64_t progress_sectors = 5000; // between two lines at most
constexpr std::uint64_t least_lines = 20;
constexpr std::uint64_t largest_file = 0xFFFFFFFF;

struct Source {
    std::vector<DiscFile> files;
    std::vector<fs::path> paths;
    std::string problem;
};

void add_entry(Source &source, const fs::directory_entry &entry, const fs::path &root) {
    std::error_code error;
    const std::string name = entry.path().lexically_relative(root);
    if (entry.is_directory(error)) {
        source.files.push_back({name + "/", 0});
    } else if (entry.is_regular_file(error)) {
        source.files.push_back({name, entry.file_size(error)});
        if (source.files.back().bytes > largest_file)
            source.problem = fmt::format("File {} is larger than 4GiB-1.", entry.path().string());
    } else {
        fmt::print(stderr, "genisoimage: {}: ignored\n", entry.path().string());
        return;
    }
    source.paths.push_back(entry.path());
}

// What symbolic links lead to is taken.
Source read_source(const std::string &name) {
    Source source;
    std::error_code error;
    const auto options = fs::directory_options::follow_directory_symlink |
                         fs::directory_options::skip_permission_denied;
    fs::recursive_directory_iterator entries(name, options, error);
    if (error)
        source.problem = fmt::format("{}. Invalid node - '{}'.", strerror(error.value()), name);
    while (!error && entries != fs::end(entries)) {
        add_entry(source, *entries, name);
        entries.increment(error);
    }
    return source;
}

class Output {
  public:
    Output(int fd, std::uint64_t sectors, bool quiet, std::optional<int> fails_at)
        : fd_(fd), bytes_(sectors * disc_sector), quiet_(quiet), fails_at_(fails_at),
          begun_(std::time(nullptr)) {}

    // False when the tool is to fail here, or nobody reads.
    bool put(const char *data, std::size_t size) {
        while (size > 0) {
            if (fails_at_ && done_ * 100 >= bytes_ * static_cast<std::uint64_t>(*fails_at_))
                return false;
            const ssize_t length = write(fd_, data, std::min<std::size_t>(size, 16 * disc_sector));
            if (length <= 0)
                return false;
            data += length;
            size -= static_cast<std::size_t>(length);
            done_ += static_cast<std::uint64_t>(length);
            show();
        }
        return true;
    }

    bool put_zeros(std::uint64_t size) {
        const std::string zeros(disc_sector, '\0');
        for (; size > 0; size -= std::min<std::uint64_t>(size, disc_sector))
            if (!put(zeros.data(), std::min<std::uint64_t>(size, disc_sector)))
                return false;
        return true;
    }

  private:
    void show() {
        const std::uint64_t step =
            std::max<std::uint64_t>(
                1, std::min(progress_sectors, bytes_ / disc_sector / least_lines)) *
            disc_sector;
        if (quiet_ || done_ / step == shown_ || done_ >= bytes_)
            return;
        shown_ = done_ / step;
        const double part = static_cast<double>(done_) / static_cast<double>(bytes_);
        const double elapsed = static_cast<double>(std::time(nullptr) - begun_);
        const auto finish = begun_ + static_cast<std::time_t>(elapsed / part);
        fmt::print(stderr, "{:6.2f}% done, estimate finish {:%a %b %e %H:%M:%S %Y}\n", part * 100,
                   fmt::localtime(finish));
    }

    int fd_;
    std::uint64_t bytes_;
    bool quiet_;
    std::optional<int> fails_at_;
    std::time_t begun_;
    std::uint64_t done_ = 0;
    std::uint64_t shown_ = 0;
};

// So many bytes, whatever has become of the file meanwhile.
bool put_file(Output &output, const fs::path &path, std::uint64_t bytes) {
    const Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (file.get() < 0)
        return false;
    std::array<char, 16 * disc_sector> part{};
    std::uint64_t left = bytes;
    while (left > 0) {
        const ssize_t length =
            read(file.get(), part.data(), std::min<std::uint64_t>(left, part.size()));
        if (length <= 0)
            break;
        if (!output.put(part.data(), static_cast<std::size_t>(length)))
            return false;
        left -= static_cast<std::uint64_t>(length);
    }
    return output.put_zeros(left + sectors_of(bytes) * disc_sector - bytes);
}

bool put_image(Output &output, const DiscImage &image, const Source &source) {
    const std::string head = image_head(image);
    bool good = output.put(head.data(), head.size());
    std::uint64_t sectors = image.head;
    for (std::size_t i = 0; good && i < image.files.size(); ++i) {
        if (image.files[i].path.back() == '/')
            continue;
        good = put_file(output, source.paths[i], image.files[i].bytes);
        sectors += sectors_of(image.files[i].bytes);
    }
    return good && output.put_zeros((image.sectors - sectors) * disc_sector);
}

int complain(const std::string &text, int status) {
    fmt::print(stderr, "genisoimage: {}\n", text);
    return status;
}

// The session that a further one is to be merged with.
std::string merge_problem(const Arguments &arguments) {
    const bool merges = arguments.values.count("-M") != 0;
    if (merges && arguments.values.count("-C") == 0)
        return "Multisession usage bug: Must specify -C if -M is used.";
    Turn turn;
    const Medium *medium = medium_in(turn.state().drive);
    if (merges && (medium == nullptr || !is_mountable(*medium)))
        return fmt::format("Unable to find previous session PVD '{}'.", arguments.values.at("-M"));
    return {};
}

int write_image(const Arguments &arguments, const Source &source, int fd) {
    const bool quiet = arguments.has("-q");
    const DiscImage image = image_of(source.files, arguments.values.count("-M") != 0);
    const auto fault = fails_at("mkisofs");
    if (fault == 0)
        return complain("Input/output error.", EIO);
    if (arguments.has("-print-size")) {
        if (!quiet)
            fmt::print(stderr, "Total extents scheduled to be written = {}\n", image.sectors);
        fmt::print("{}\n", image.sectors);
        return 0;
    }
    Output output(fd, image.sectors, quiet, fault);
    if (!put_image(output, image, source))
        return complain("Input/output error. Cannot read or write.", EIO);
    if (!quiet)
        fmt::print(stderr,
                   "Total translation table size: 0\nTotal rockridge attributes bytes: {}\n"
                   "Total directory bytes: {}\nPath table size(bytes): 22\nMax brk space used 0\n"
                   "{} extents written ({} MB)\n",
                   203 * source.files.size(), disc_sector, image.sectors, image.sectors / 512);
    return 0;
}

} // namespace

int run_mkisofs(const std::vector<std::string> &words) {
    const Arguments arguments =
        sort_words(words, {"-R", "-r", "-J", "-f", "-q", "-print-size"}, {"-C", "-M", "-o", "-V"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return not_simulated(
            "mkisofs", arguments.unknown.empty() ? "anything but one directory" : arguments.unknown,
            failure);
    if (!arguments.has("-q") && arguments.has("-f"))
        fmt::print(stderr, "Warning: -follow-links does not always work correctly; be careful.\n");
    if (const std::string problem = merge_problem(arguments); !problem.empty())
        return complain(problem, failure);
    const Source source = read_source(arguments.names.front());
    if (!source.problem.empty())
        return complain(source.problem, 2);
    const auto file = arguments.values.find("-o");
    const Descriptor out(file == arguments.values.end()
                             ? dup(STDOUT_FILENO)
                             : open(file->second.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666));
    if (out.get() < 0)
        return complain(
            fmt::format("{}. Unable to open disc image file '{}'.", strerror(errno), file->second),
            failure);
    return write_image(arguments, source, out.get());
}

} // namespace zavsim
