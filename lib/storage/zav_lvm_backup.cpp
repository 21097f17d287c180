#include "zav_lvm_backup.h"

#include "common/diag.h"
#include "common/text.h"

#include <algorithm>
#include <cstring>
#include <iterator>

namespace zav {

namespace {

constexpr int kLine = 120;
constexpr int kSectorsPerGbShift = 21;
constexpr int kBytesPerGbShift = 30;
constexpr int kBytesPerSectorShift = 9;

struct Line {
    char text[kLine];

    bool has(const char *part) const { return contains(text, part); }

    // The value of "key = value".
    const char *value() {
        zavParserLine1(text);
        return text;
    }

    const char *trimmed() {
        trim(text);
        return text;
    }
};

// The kernel name in a line `device = "/dev/md1" # Hint only`; "" if it holds none.
void kernel_name(const Line &line, char (&name)[kLine]) {
    char text[kLine];
    memcpy(text, line.text, sizeof text);
    constexpr const char *kSeparators = "=# \"";
    Fields fields(text);
    fields.next(kSeparators);
    char *path = fields.next(kSeparators);
    trim(path);
    constexpr const char *kNodes = "/dev/";
    name[0] = '\0';
    if (path == nullptr || !starts_with(path, kNodes))
        return;
    path += strlen(kNodes);
    path[strcspn(path, " \t\n\v\f\r")] = '\0';
    copy_text(name, sizeof name, path);
}

class BackupReader {
  public:
    BackupReader(BackupSource &source, lvmVG &group) : source_(source), group_(group) {}

    int read() {
        for (Line line = {}; next(line);) {
            if (line.has("extent_size"))
                read_extent_size(line);
            if (line.has("physical_volumes"))
                read_physical_volumes();
            if (line.has("logical_volumes"))
                read_logical_volumes();
        }
        return result_;
    }

  private:
    bool next(Line &line) { return source_.line(line.text, sizeof line.text); }

    // Sectors to bytes in 32 bits, as on the target: extents of 4 GB and more wrap.
    void read_extent_size(Line line) {
        extent_size_ = static_cast<uint32_t>(to_int(line.value())) << kBytesPerSectorShift;
        ZAV_TRACE(kTraceParser, "%s() - extent_size: %ld\n", __func__,
                  static_cast<long>(extent_size_));
    }

    // The group's count is asked each time: a device may end the list.
    void read_physical_volumes() {
        const int room = static_cast<int>(std::size(group_.pvdev));
        for (int i = 0; i < std::min(group_.pvcount, room); ++i)
            read_physical_volume(i);
    }

    void read_physical_volume(int index) {
        lvmPV &volume = group_.pvdev[index];
        for (Line line = {}; next(line);) {
            if (line.has("pv") && line.has("{"))
                read_pv_number(line, index);
            else if (line.has("dev_size"))
                volume.size =
                    static_cast<zavSize>(to_int64(line.value()) / (1LL << kSectorsPerGbShift) + 1);
            else if (line.has("device"))
                map_device(line, volume);
            else if (line.has("}"))
                return;
        }
    }

    // pv0 is number 1.
    void read_pv_number(Line &line, int index) {
        int &number = group_.pvdev[index].lvmdev.disk;
        number_after(line.trimmed(), "pv", number);
        number = static_cast<int>(static_cast<unsigned>(number) + 1);
        ZAV_TRACE(kTraceParser, "%s() - parse pv. info -> dev.lvmvgdev.pvdev[%d].lvmdev.disk: %d\n",
                  __func__, index, number);
    }

    void map_device(const Line &line, lvmPV &volume) {
        char name[kLine];
        kernel_name(line, name);
        ZAV_TRACE(kTraceParser, "%s() - pv block device: %s\n", __func__, name);
        const BackupSource::Found found = source_.find_device(name, volume.dev);
        if (found != BackupSource::Found::kYes)
            result_ = ZAV_RC_ERR;
        if (found == BackupSource::Found::kNoAnswer)
            group_.pvcount = 0;
    }

    void read_logical_volumes() {
        const int room = static_cast<int>(std::size(group_.lvdev));
        for (int i = 0; i < std::min(group_.lvcount, room); ++i)
            read_logical_volume(group_.lvdev[i]);
    }

    void read_logical_volume(lvmLV &volume) {
        for (Line line = {}; next(line);) {
            if (line.has("LogVol") && line.has("{")) {
                number_after(line.trimmed(), "LogVol", volume.lvmdev.disk);
                source_.measure(volume);
            } else if (line.has("segment_count")) {
                const uint64_t extents = read_segments(to_int(line.value()));
                volume.size = ((extents * extent_size_) >> kBytesPerGbShift) + 1;
            } else if (line.has("}")) {
                return;
            }
        }
    }

    // The extents of all segments, each of which ends at a closing brace.
    uint64_t read_segments(int count) {
        uint64_t extents = 0;
        Line line = {};
        while (count > 0 && next(line)) {
            if (line.has("extent_count"))
                extents += static_cast<uint64_t>(to_int64(line.value()));
            else if (line.has("}"))
                --count;
        }
        ZAV_TRACE(kTraceParser, "lv_extent_count: %lld\n", static_cast<long long>(extents));
        return extents;
    }

    BackupSource &source_;
    lvmVG &group_;
    uint32_t extent_size_ = 0;
    int result_ = ZAV_RC_OK;
};

} // namespace

// The test for digits is coarse: sda3 counts as a whole disk, sdb12 as a partition.
PvKind classify_pv(const char *kernel_name) {
    if (contains(kernel_name, "md"))
        return PvKind::kArray;
    if (!contains(kernel_name, "sd"))
        return PvKind::kNamed;
    return strpbrk(kernel_name, "12") != nullptr ? PvKind::kPartition : PvKind::kWholeDisk;
}

void disk_of_partition(const char *kernel_name, char (&disk)[9]) {
    const size_t length = strcspn(kernel_name, "1234567890");
    copy_text(disk, std::min(length + 1, sizeof disk), kernel_name);
}

int read_backup(BackupSource &source, lvmVG &group) {
    return BackupReader(source, group).read();
}

} // namespace zav
