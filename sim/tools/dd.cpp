// dd: on a device node what it writes is the model's business as well; elsewhere the host's own.
#include "model/arrays.hpp"
#include "model/contents.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/device_argument.hpp"
#include "tools/host_program.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <fmt/format.h>
#include <map>
#include <optional>
#include <set>
#include <sys/stat.h>
#include <unistd.h>

namespace zavsim {

namespace {

using Operands = std::map<std::string, std::string>;

constexpr std::uint64_t whole_input = UINT64_MAX;

int complain(const std::string &text) {
    fmt::print(stderr, "dd: {}\n", text);
    return 1;
}

Operands operands_of(const std::vector<std::string> &words) {
    Operands operands;
    for (const std::string &word : words) {
        const std::size_t sign = std::min(word.find('='), word.size());
        operands[word.substr(0, sign)] = sign == word.size() ? "" : word.substr(sign + 1);
    }
    return operands;
}

// "1", "2k", "1M"
std::optional<std::uint64_t> number(const std::string &text) {
    static const std::map<std::string, std::uint64_t> units = {
        {"", 1}, {"c", 1}, {"k", 1024}, {"K", 1024}, {"M", 1048576}, {"G", 1073741824}};
    const std::size_t end = std::min(text.find_first_not_of("0123456789"), text.size());
    const auto unit = units.find(text.substr(end));
    if (end == 0 || end > 9 || unit == units.end())
        return std::nullopt;
    return std::stoull(text.substr(0, end)) * unit->second;
}

struct Copy {
    std::string from; // empty: standard input
    std::string to;
    std::uint64_t block = 512;
    std::uint64_t blocks = whole_input;
    std::uint64_t seek = 0;
    bool quiet = false;
    std::string problem;
};

void read_number(const Operands &operands, const std::string &name, std::uint64_t &value,
                 std::string &problem) {
    const auto found = operands.find(name);
    if (found == operands.end())
        return;
    const auto read = number(found->second);
    if (!read)
        problem = fmt::format("invalid number: '{}'", found->second);
    value = read.value_or(value);
}

Copy copy_of(const Operands &operands) {
    Copy copy;
    copy.from = operands.count("if") == 0 ? "" : operands.at("if");
    copy.to = operands.at("of");
    copy.quiet = operands.count("status") != 0 && operands.at("status") == "none";
    read_number(operands, "bs", copy.block, copy.problem);
    read_number(operands, "count", copy.blocks, copy.problem);
    read_number(operands, "seek", copy.seek, copy.problem);
    if (copy.block == 0 || copy.block > 64U << 20)
        copy.problem = fmt::format("invalid number: '{}'", copy.block);
    for (const auto &[name, value] : operands)
        if (name != "if" && name != "of" && name != "bs" && name != "count" && name != "seek" &&
            name != "status" && !(name == "conv" && (value == "notrunc" || value == "fsync")))
            copy.problem = fmt::format("{}={} is not simulated for a device", name, value);
    return copy;
}

// One block, or what there is of one.
std::string read_block(int fd, std::uint64_t size) {
    std::string block(size, '\0');
    std::size_t got = 0;
    while (got < size) {
        const ssize_t length = read(fd, block.data() + got, size - got);
        if (length < 0 && errno == EINTR)
            continue;
        if (length <= 0)
            break;
        got += static_cast<std::size_t>(length);
    }
    block.resize(got);
    return block;
}

// Zeros take no memory in a file that is full of holes.
bool write_block(int fd, const std::string &block, std::uint64_t offset) {
    const auto place = static_cast<off_t>(offset);
    const auto length = static_cast<off_t>(block.size());
    if (block.find_first_not_of('\0') == std::string::npos &&
        fallocate(fd, FALLOC_FL_PUNCH_HOLE | FALLOC_FL_KEEP_SIZE, place, length) == 0)
        return true;
    return pwrite(fd, block.data(), block.size(), place) == static_cast<ssize_t>(block.size());
}

struct Count {
    std::uint64_t whole = 0;
    std::uint64_t partial = 0;
    std::uint64_t bytes = 0;
    bool full = false; // the device had no more room
};

Count copy_blocks(int in, int out, const Copy &copy, std::uint64_t device_bytes) {
    Count count;
    std::uint64_t offset = copy.seek * copy.block;
    for (std::uint64_t done = 0; done < copy.blocks && !count.full; ++done) {
        std::string block = read_block(in, copy.block);
        if (block.empty())
            break;
        const std::uint64_t room = device_bytes - std::min(device_bytes, offset);
        count.full = block.size() > room;
        block.resize(std::min<std::uint64_t>(block.size(), room));
        if (block.empty() || !write_block(out, block, offset))
            break;
        (block.size() == copy.block ? count.whole : count.partial) += 1;
        count.bytes += block.size();
        offset += block.size();
    }
    return count;
}

void tell(const Count &count, const Copy &copy) {
    if (!copy.quiet)
        fmt::print(stderr, "{}+{} records in\n{}+{} records out\n{} bytes copied\n", count.whole,
                   count.partial, count.whole, count.partial, count.bytes);
}

std::uint32_t label_in(int fd) {
    std::array<unsigned char, 4> bytes{};
    if (pread(fd, bytes.data(), bytes.size(), 440) != 4)
        return 0;
    return bytes[0] | bytes[1] << 8U | bytes[2] << 16U |
           static_cast<std::uint32_t>(bytes[3]) << 24U;
}

// What the writing means to the model.
void tell_model(const Copy &copy, Stretch stretch, std::uint32_t label_id) {
    Turn turn;
    State &state = turn.state();
    if (const auto minor = array_behind(copy.to)) {
        if (const Array *array = find_array(state, *minor))
            array_was_written(state, *array, stretch);
    } else if (const auto place = device_behind(copy.to)) {
        Disk *disk = attached_disk(state, place->letter);
        Partition *partition = disk == nullptr || place->partition == 0
                                   ? nullptr
                                   : find_partition(*disk, place->partition);
        if (partition != nullptr)
            partition_was_written(state, *disk, *partition, stretch);
        else if (disk != nullptr && place->partition == 0)
            disk_was_written(state, *disk, stretch, label_id);
    }
    turn.commit();
}

int copy_to_device(const Copy &copy) {
    const Descriptor in(copy.from.empty() ? dup(STDIN_FILENO)
                                          : open(copy.from.c_str(), O_RDONLY | O_CLOEXEC));
    if (in.get() < 0)
        return complain(fmt::format("failed to open '{}': {}", copy.from, strerror(errno)));
    const Descriptor out(open(copy.to.c_str(), O_RDWR | O_CLOEXEC));
    struct stat info {};
    if (out.get() < 0 || fstat(out.get(), &info) != 0)
        return complain(fmt::format("failed to open '{}': {}", copy.to, strerror(errno)));
    const Count count =
        copy_blocks(in.get(), out.get(), copy, static_cast<std::uint64_t>(info.st_size));
    tell_model(copy, {copy.seek * copy.block, count.bytes}, label_in(out.get()));
    if (count.full)
        complain(fmt::format("error writing '{}': No space left on device", copy.to));
    tell(count, copy);
    return count.full ? 1 : 0;
}

bool is_device(const std::string &path) {
    std::error_code error;
    const std::filesystem::path node = std::filesystem::canonical(path, error);
    const std::string name = node.filename();
    static const std::set<std::string> behind_controller = {"/dev/hwsata", "/dev/hwraid",
                                                            "/dev/sas", "/dev/sasraid"};
    if (error || behind_controller.count(node.parent_path()) != 0)
        return !error;
    return node.parent_path() == "/dev" &&
           (parse_kernel_name(name) || array_behind(path) || name.rfind("dm-", 0) == 0);
}

} // namespace

int run_dd(const std::vector<std::string> &words) {
    const Operands operands = operands_of(words);
    const auto to = operands.find("of");
    if (to == operands.end() || !is_device(to->second))
        return exec_host_program("dd", words);
    const Copy copy = copy_of(operands);
    return copy.problem.empty() ? copy_to_device(copy) : complain(copy.problem);
}

} // namespace zavsim
