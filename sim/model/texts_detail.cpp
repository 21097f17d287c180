#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/texts.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <map>

namespace zavsim {

namespace {

// One line "     Label : value"; the labels of the current tools start three columns further in.
class Sheet {
  public:
    explicit Sheet(bool current) : width_(current ? 18 : 15) {}
    void row(const std::string &label, const std::string &value) {
        text_ += fmt::format("{:>{}} : {}\n", label, width_, value);
    }
    void row(const std::string &label, int value) { row(label, std::to_string(value)); }
    void gap() { text_ += "\n"; }
    const std::string &text() const { return text_; }

  private:
    int width_;
    std::string text_;
};

std::string sync_words(const Array &array) {
    const Sync &sync = array.sync;
    if (sync.kind == SyncKind::none)
        return {};
    if (sync.pending)
        return ", resyncing (PENDING)";
    if (!sync.running)
        return ", resyncing (DELAYED)";
    static const std::map<SyncKind, const char *> words = {{SyncKind::recovery, ", recovering"},
                                                           {SyncKind::resync, ", resyncing"},
                                                           {SyncKind::repair, ", resyncing"},
                                                           {SyncKind::check, ", checking"}};
    return words.at(sync.kind);
}

// The current mdadm judges by the members whose nodes it finds, whatever the kernel still holds.
bool looks_broken(const State &state, const Array &array) {
    if (!state.current_tools)
        return is_failed(state, array);
    Array found = array;
    for (Member &member : found.members)
        if (!has_device(state, member))
            member.role = Role::faulty;
    return is_broken(found);
}

// The blank at the end is mdadm's.
std::string state_words(const State &state, const Array &array) {
    const char *health = looks_broken(state, array) ? ", FAILED"
                         : is_degraded(array)       ? ", degraded"
                                                    : "";
    const std::string words =
        std::string(array.dirty ? "active" : "clean") + health + sync_words(array);
    const bool undisturbed = words == "clean" || words == "active";
    return words + (undisturbed && !state.current_tools ? "" : " ");
}

void sizes(Sheet &sheet, const Array &array) {
    const std::uint64_t kib = array_kib(array);
    sheet.row("Array Size", fmt::format("{}{}", kib, human_size(kib)));
    if (is_redundant(array))
        sheet.row("Used Dev Size",
                  fmt::format("{}{}", array.component_kib, human_size(array.component_kib)));
}

void counts(Sheet &sheet, const Array &array) {
    const int faulty = count_members(array, Role::faulty);
    const int total = static_cast<int>(array.members.size());
    sheet.row("Active Devices", count_members(array, Role::in_sync));
    sheet.row("Working Devices", total - faulty);
    sheet.row("Failed Devices", faulty);
    sheet.row("Spare Devices",
              count_members(array, Role::spare) + count_members(array, Role::rebuilding));
    sheet.gap();
}

void layout(Sheet &sheet, const Array &array, bool current) {
    static const std::map<std::string, const char *> layouts = {
        {"raid0", "-unknown-"}, {"raid5", "left-symmetric"}, {"raid6", "left-symmetric"}};
    const auto named = layouts.find(array.level);
    if (array.level == "raid10")
        sheet.row("Layout", current ? "near=2" : "near=2, far=1");
    else if (named != layouts.end() && (current || array.level != "raid0"))
        sheet.row("Layout", named->second);
    if (array.chunk_kib > 0)
        sheet.row("Chunk Size", fmt::format("{}K", array.chunk_kib));
    if (array.level == "linear")
        sheet.row("Rounding", "0K");
    if (array.chunk_kib > 0 || array.level == "linear")
        sheet.gap();
}

void policy(Sheet &sheet, const Array &array) {
    sheet.row("Consistency Policy", array.bitmap          ? "bitmap"
                                    : is_redundant(array) ? "resync"
                                                          : "none");
    sheet.gap();
}

void progress(Sheet &sheet, const Array &array) {
    if (!array.sync.running)
        return;
    static const std::map<SyncKind, const char *> labels = {{SyncKind::recovery, "Rebuild Status"},
                                                            {SyncKind::resync, "Resync Status"},
                                                            {SyncKind::repair, "Resync Status"},
                                                            {SyncKind::check, "Check Status"}};
    sheet.row(labels.at(array.sync.kind), fmt::format("{}% complete", sync_percent(array)));
    sheet.gap();
}

void identity(Sheet &sheet, const Array &array) {
    const std::string local = "  (local to host appliance)";
    if (array.metadata == "0.90") {
        sheet.row("UUID", array.uuid + " (local to host appliance)");
        sheet.row("Events", fmt::format("0.{}", array.events));
    } else {
        sheet.row("Name", "appliance:" + array.name + local);
        sheet.row("UUID", array.uuid);
        sheet.row("Events", array.events);
    }
    sheet.gap();
}

std::string device_path(const State &state, const Member &member) {
    if (!has_device(state, member))
        return state.current_tools ? "   missing" : "";
    return fmt::format("   /dev/sd{}{}", member.letter, member.partition);
}

std::string role_words(const State &state, const Array &array, const Member &member) {
    switch (member.role) {
    case Role::rebuilding:
        return "spare rebuilding";
    case Role::spare:
        return "spare";
    case Role::faulty:
        return state.current_tools ? "faulty" : "faulty spare";
    default:
        break;
    }
    if (array.level != "raid10" || !state.current_tools)
        return "active sync";
    return fmt::format("active sync set-{}", member.raid_device % 2 == 0 ? 'A' : 'B');
}

std::string member_row(const State &state, const Array &array, const Member &member) {
    const DeviceNumber device = device_number(member.letter, member.partition);
    const std::string place = member.raid_device < 0 ? "-" : std::to_string(member.raid_device);
    return fmt::format("{:8}{:8}{:9}{:>9}      {}{}\n", member.number, device.major, device.minor,
                       place, role_words(state, array, member), device_path(state, member));
}

std::string removed_row(const State &state, int place) {
    const std::string number = state.current_tools ? "-" : std::to_string(place);
    return fmt::format("{:>8}{:8}{:9}{:9}      removed\n", number, 0, 0, place);
}

std::string device_table(const State &state, const Array &array) {
    std::string text = "    Number   Major   Minor   RaidDevice State\n";
    for (int place = 0; place < array.raid_devices; ++place) {
        const Member *member = member_at(array, place);
        text += member == nullptr ? removed_row(state, place) : member_row(state, array, *member);
    }
    std::vector<Member> others;
    std::copy_if(array.members.begin(), array.members.end(), std::back_inserter(others),
                 [](const Member &member) { return member.raid_device < 0; });
    std::sort(others.begin(), others.end(),
              [](const Member &a, const Member &b) { return a.number < b.number; });
    text += others.empty() ? "" : "\n";
    for (const Member &member : others)
        text += member_row(state, array, member);
    return text;
}

} // namespace

std::string detail_text(const State &state, const Array &array, const std::string &shown_name) {
    const bool current = state.current_tools;
    Sheet sheet(current);
    sheet.row("Version", array.metadata);
    sheet.row("Creation Time", date_text(array.created));
    sheet.row("Raid Level", array.level);
    sizes(sheet, array);
    sheet.row("Raid Devices", array.raid_devices);
    sheet.row("Total Devices", static_cast<int>(array.members.size()));
    if (array.metadata == "0.90")
        sheet.row("Preferred Minor", array.minor);
    sheet.row("Persistence", "Superblock is persistent");
    sheet.gap();
    if (array.bitmap) {
        sheet.row("Intent Bitmap", "Internal");
        sheet.gap();
    }
    sheet.row("Update Time", date_text(array.updated));
    sheet.row("State", state_words(state, array));
    counts(sheet, array);
    layout(sheet, array, current);
    if (current)
        policy(sheet, array);
    progress(sheet, array);
    identity(sheet, array);
    return shown_name + ":\n" + sheet.text() + device_table(state, array);
}

} // namespace zavsim
