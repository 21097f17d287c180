#include "targets.h"

#include "input.h"

#include "bios/zav_bios_smbios.h"
#include "cdburn/zav_cdburn_media.h"
#include "cdburn/zav_cdburn_progress_parse.h"
#include "common/raid_report.h"
#include "common/shell.h"
#include "common/text.h"
#include "nic/zav_nic_parse.h"
#include "storage/zav_disk_members_parse.h"
#include "storage/zav_hwraid_cascade.h"
#include "storage/zav_lvm_backup.h"
#include "storage/zav_raid_parse.h"
#include "zav_api.h"

namespace fuzz {

namespace {

bool same(const zavDevice &a, const zavDevice &b) {
    return a.type == b.type && a.minor_type == b.minor_type && a.disk == b.disk && a.part == b.part;
}

// Numbers of expansion units above 7 share the bits of their disks' numbers.
bool has_plain_numbers(const zavDevice &device) {
    return device.disk >= 0 && device.disk < 8 << 8;
}

// A name that is taken means the same device when it is written again.
void device_name(Bytes bytes) {
    Text text(bytes);
    zavDevice device = {};
    if (zavStrToDev(text.get(), &device) != ZAV_RC_OK || !has_plain_numbers(device))
        return;
    char written[64];
    require(zavDevToStr(written, sizeof written, &device) == ZAV_RC_OK, "an address has no name");
    zavDevice again = {};
    require(zavStrToDev(written, &again) == ZAV_RC_OK, "a written name is not taken");
    require(same(device, again), "a name means another device when it is written");
}

// An address that has a name is the one that the name means.
void device_address(Bytes bytes) {
    zavDevice device = taken<zavDevice>(bytes);
    const auto size = static_cast<std::size_t>(taken<std::uint8_t>(bytes));
    std::vector<char> label(size);
    if (zavDevToStr(label.data(), size, &device) == ZAV_RC_OK)
        require(std::memchr(label.data(), '\0', size) != nullptr, "a name does not end");
}

void names(Bytes bytes) {
    Text text(bytes);
    char path[20] = {};
    trans_mdname(text.get(), path);
    int group = 0;
    zavMapStrToVG(text.get(), &group);
    zavParserLine1(text.get());
    Text line(bytes);
    char address[20] = {};
    getsasaddr(line.get(), address);
    require(std::memchr(address, '\0', sizeof address) != nullptr, "an address does not end");
}

void enclosure(Bytes bytes) {
    const int unit = taken<std::uint8_t>(bytes) % 8;
    const zav::Marker marker = unit == 0 ? zav::Marker::controller() : zav::Marker::unit(unit);
    zav::EnclosureReader reader(marker);
    Pieces(bytes, zav::kReportPiece).each([&reader](char *piece) { reader.take(piece); });
    sRaidSetInfo info = {};
    reader.fill(info);
    zav::MonitorReader monitor(marker);
    Pieces(bytes, zav::kReportPiece).each([&monitor](char *piece) { monitor.take(piece); });
    zav::IdentityReader identity(unit);
    sRBODMap map = {};
    Pieces(bytes, zav::kIdentityPiece).each([&](char *piece) { identity.take(piece, map); });
    require(std::memchr(map.sn, '\0', sizeof map.sn) != nullptr &&
                std::memchr(map.model, '\0', sizeof map.model) != nullptr,
            "a serial number or a model does not end");
}

void cascade(Bytes bytes) {
    zav::Cascade cascade;
    Pieces(bytes, 80).each([&cascade](const char *line) { cascade.take(line); });
    SetRBODID(cascade.expanders, nullptr, 0);
    for (const sExpander &expander : cascade.expanders)
        require(std::memchr(expander.sasaddr, '\0', sizeof expander.sasaddr) != nullptr,
                "an expander's address does not end");
}

void smbios(Bytes bytes) {
    if (bytes.size() >= 2 * zav::kParagraph) {
        zav::SmbiosTable table = {};
        const auto *paragraph = reinterpret_cast<const char *>(bytes.data());
        if (zav::begins_entry_point(paragraph))
            zav::locates_table(paragraph + zav::kParagraph, table);
    }
    const std::vector<char> table(bytes.begin(), bytes.end());
    for (const int type : {0, 1, 2, 127})
        if (const char *text = zav::smbios_text(table.data(), table.size(), type))
            require(std::strlen(text) <= std::max<std::size_t>(table.size(), 16),
                    "a string is longer than its table");
}

void disc_report(Bytes bytes) {
    zavMediaInfo info = {};
    info.discType = ZAV_DISC_UNKNOWN;
    info.discState = ZAV_DISC_STATE_UNKNOWN;
    const int status = taken<std::uint8_t>(bytes);
    Pieces(bytes, 80).each([&info](char *line) { zav::read_dvd_line(line, info); });
    Pieces(bytes, 80).each([](const char *line) { zav::read_refusal_line(line); });
    Pieces(bytes, 80).each([&info](char *line) { zav::read_atip_line(line, info); });
    zav::read_disc_status(static_cast<unsigned char>(status), info);
    Pieces(bytes, 80).each([&info](char *line) { zav::read_session_offsets(line, info); });
    Pieces(bytes, 80).each([&info](char *line) { zav::read_used_space(line, info); });
    require(info.discTotalSize >= 0, "a disc of less than nothing");
}

void progress(Bytes bytes) {
    zav::Progress progress;
    Pieces(bytes, 80).each([&progress](char *line) { progress.read_line(line); });
}

void process_status(Bytes bytes) {
    Text text(bytes);
    FILE *file = fmemopen(text.get(), text.room(), "r");
    if (file == nullptr)
        return;
    zav::process_has_name(file, "growisofs");
    std::fclose(file);
}

void array_query(Bytes bytes) {
    Text query(bytes);
    const zav::ArrayQuery found = zav::read_array_query(query.get());
    require(std::memchr(found.array, '\0', sizeof found.array) != nullptr &&
                std::memchr(found.level, '\0', sizeof found.level) != nullptr,
            "a name or a level does not end");
    zav::DeviceNumbers numbers = {};
    Text row(bytes);
    zav::read_member_numbers(row.get(), numbers);
}

void array_detail(Bytes bytes) {
    zav::RaidDetail detail = {};
    Pieces(bytes, 256).each([&detail](char *line) { zav::read_detail_line(line, detail); });
    int percent = 0;
    Pieces(bytes, 256).each([&percent](const char *line) {
        zav::read_rebuild_line(line, percent);
    });
    Text status(bytes);
    zav::decide_raid_state(detail.level, detail.raid_devices, detail.active_devices, status.get());
}

class Backup : public zav::BackupSource {
  public:
    explicit Backup(Bytes bytes) : bytes_(bytes) {}

    bool line(char *buffer, int size) override {
        const auto room = static_cast<std::size_t>(size);
        std::vector<char> piece(room);
        Pieces pieces(bytes_.subspan(read_), room);
        if (!pieces.next(piece.data()))
            return false;
        const std::size_t left = bytes_.size() - read_;
        const auto *end = static_cast<const std::uint8_t *>(
            std::memchr(bytes_.data() + read_, '\n', std::min(left, room - 1)));
        read_ += end != nullptr ? static_cast<std::size_t>(end - (bytes_.data() + read_)) + 1
                                : std::min(left, room - 1);
        std::memcpy(buffer, piece.data(), room);
        return true;
    }
    Found find_device(const char *kernel_name, zavDevice &) override {
        char disk[9];
        if (zav::classify_pv(kernel_name) == zav::PvKind::kPartition)
            zav::disk_of_partition(kernel_name, disk);
        return static_cast<Found>(++asked_ % 3);
    }
    void measure(lvmLV &) override {}

  private:
    Bytes bytes_;
    std::size_t read_ = 0;
    int asked_ = 0;
};

void volume_backup(Bytes bytes) {
    lvmVG group = {};
    group.pvcount = taken<std::int8_t>(bytes);
    group.lvcount = taken<std::int8_t>(bytes);
    Backup source(bytes);
    zav::read_backup(source, group);
}

void network_port(Bytes bytes) {
    zavNetState info = {};
    Pieces(bytes, 80).each([&info](const char *line) {
        zav::read_port_line(line, info);
        zav::active_port(line);
    });
    require(info.value == 0 || info.value == 10 || info.value == 100 || info.value == 1000,
            "a speed that no port has");
}

void text(Bytes bytes) {
    const std::size_t half = bytes.size() / 2;
    Text set(bytes.subspan(0, half));
    Text line(bytes.subspan(half));
    zav::to_int(line.get());
    zav::to_unsigned(line.get());
    zav::to_int64(line.get());
    zav::whole_part(zav::to_double(line.get()));
    std::int32_t number = 0;
    zav::number_after(line.get(), set.get(), number);
    char copy[16];
    zav::copy_text(copy, sizeof copy, line.get());
    zav::Fields fields(line.get());
    while (fields.next(set.get()) != nullptr) {
    }
    for (const auto strip : {rtrim, ltrim}) {
        Text stripped(bytes);
        strip(stripped.get(), set.get());
    }
    Text stripped(bytes);
    trim(stripped.get());
}

// The one word that a shell makes of `quoted`, which begins a command; as far as the library
// quotes.
std::string unquoted(const char *quoted) {
    std::string word;
    bool in_quotes = false;
    for (const char *at = quoted; *at != '\0'; ++at) {
        if (*at == '\'')
            in_quotes = !in_quotes;
        else if (!in_quotes && *at == '\\' && at[1] != '\0')
            word += *++at;
        else {
            require(in_quotes || std::strchr(" \t\n|&;<>()$`\"*?[#~!{}", *at) == nullptr,
                    "a character that a shell acts upon stands unquoted");
            word += *at;
        }
    }
    require(!in_quotes, "a quote is not closed");
    return word;
}

void shell_word(Bytes bytes) {
    Text word(bytes);
    const zav::Command command("%s", {word.get()});
    const std::string taken_as = unquoted(command.text());
    const bool refused = command.text()[0] == '\0' || word.get()[0] == '-';
    require(refused || taken_as == word.get() || std::strlen(word.get()) > zav::Command::kSize / 4,
            "a shell takes another word than was meant");
}

constexpr Target kTargets[] = {
    {"array_detail", array_detail},
    {"array_query", array_query},
    {"cascade", cascade},
    {"device_address", device_address},
    {"device_name", device_name},
    {"disc_report", disc_report},
    {"enclosure", enclosure},
    {"names", names},
    {"network_port", network_port},
    {"process_status", process_status},
    {"progress", progress},
    {"shell_word", shell_word},
    {"smbios", smbios},
    {"text", text},
    {"volume_backup", volume_backup},
};

} // namespace

std::span<const Target> targets() {
    return kTargets;
}

const Target *target_named(const char *name) {
    for (const Target &target : kTargets)
        if (std::strcmp(target.name, name) == 0)
            return &target;
    return nullptr;
}

} // namespace fuzz
