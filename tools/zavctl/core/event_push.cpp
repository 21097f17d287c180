#include "event_push.h"

#include "slot_id.h"
#include "text.h"
#include "volume_report.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>

namespace zavctl {

namespace {

// A kind of event by its word, and which options it takes.
struct Kind {
    const char *word;
    bool state;
    bool value;
    bool charge;
    bool progress;
    bool speed;
    zavSystemEvent (*make)(const EventWords &given, bool hardware_raid);
};

[[noreturn]] void refuse(const std::string &form) {
    throw NoEvent("it takes: zavctl event push " + form);
}

std::optional<int> whole_number(std::string_view word) {
    int number = 0;
    const auto [end, error] = std::from_chars(word.data(), word.data() + word.size(), number);
    if (error != std::errc() || end != word.data() + word.size())
        return std::nullopt;
    return number;
}

int number_in(const EventWords &given, const char *form) {
    const std::optional<int> number =
        given.words.size() == 2 ? whole_number(given.words[1]) : std::nullopt;
    if (!number)
        refuse(form);
    return *number;
}

int state_in(const EventWords &given, const States &states) {
    if (!given.state)
        throw NoEvent("--state is missing: there are " + known_words(states));
    const std::optional<int> state = code_of(states, *given.state);
    if (!state)
        throw NoEvent(fmt::format("'{}' is no state of it: there are {}", printable(*given.state),
                                  known_words(states)));
    return *state;
}

float float_in(const std::optional<double> &number) {
    return static_cast<float>(number.value_or(0));
}

template <int type>
zavSystemEvent sensor(const EventWords &given, bool) {
    const int number = number_in(given, "fan|thermal|volt N --value NUMBER --state STATE");
    return event_of(
        zavFanState{type, number, float_in(given.value), state_in(given, sensor_states())});
}

zavSystemEvent ups(const EventWords &given, bool) {
    if (given.words.size() != 1)
        refuse("ups --charge PERCENT --state STATE");
    return event_of(
        zavUpsState{ZAV_EVENT_UPS, float_in(given.charge), state_in(given, ups_states())});
}

SlotId slot_in(const EventWords &given, const char *form) {
    const std::optional<SlotId> id =
        given.words.size() == 2 ? slot_id(given.words[1]) : std::nullopt;
    if (!id)
        refuse(form);
    return *id;
}

zavSystemEvent disk(const EventWords &given, bool hardware_raid) {
    const SlotId id = slot_in(given, "disk N|UNIT-N --state STATE");
    zavDevice device{ZAV_DEV_HDD, hardware_raid ? ZAV_MINDEV_HDD_HWSATA : ZAV_MINDEV_HDD_SATA,
                     id.number, 0};
    if (id.unit != 0)
        device = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, packed(id), 0};
    return event_of(zavHddState{ZAV_EVENT_HDD, device, state_in(given, disk_states())});
}

zavSystemEvent array(const EventWords &given, bool hardware_raid) {
    const SlotId id = slot_in(given, "array N|UNIT-N --state STATE [--progress PERCENT]");
    zavRaidState record{};
    record.type = ZAV_EVENT_RAID;
    record.dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, id.number, 1};
    if (hardware_raid)
        record.dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, id.number, 0};
    if (id.unit != 0)
        record.dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, packed(id), 0};
    record.state = state_in(given, array_states());
    record.resync = float_in(given.progress);
    return event_of(record);
}

zavSystemEvent group(const EventWords &given, bool) {
    zavLVMState record{};
    record.type = ZAV_EVENT_LVM;
    record.dev.lvmvgdev.lvmtype = ZAV_MINDEV_LVM_VG;
    record.dev.lvmvgdev.lvmdev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG,
                                  number_in(given, "vg N --state STATE"), 0};
    record.state = state_in(given, group_states());
    return event_of(record);
}

VolumeId volume_in(const EventWords &given, const char *form) {
    const std::optional<VolumeId> id =
        given.words.size() == 2 ? volume_id(given.words[1]) : std::nullopt;
    if (!id)
        refuse(form);
    return *id;
}

zavSystemEvent physical_volume(const EventWords &given, bool) {
    const VolumeId id = volume_in(given, "pv GROUP-N --state STATE");
    zavLVMState record{};
    record.type = ZAV_EVENT_LVM;
    record.dev.lvmpvdev.lvmtype = ZAV_MINDEV_LVM_PV;
    record.dev.lvmpvdev.lvmdev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, id.number, id.group};
    record.state = state_in(given, group_states());
    return event_of(record);
}

zavSystemEvent logical_volume(const EventWords &given, bool) {
    const VolumeId id = volume_in(given, "lv GROUP-N --state STATE [--value PERCENT]");
    zavLVMState record{};
    record.type = ZAV_EVENT_LVM;
    record.dev.lvmlvdev.lvmtype = ZAV_MINDEV_LVM_LV;
    record.dev.lvmlvdev.lvmdev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, id.number, id.group};
    record.dev.lvmlvdev.usage = float_in(given.value);
    record.state = state_in(given, volume_states());
    return event_of(record);
}

// "eth0" is the first port, number 1.
zavSystemEvent network(const EventWords &given, bool) {
    constexpr int highest = 1000000; // far beyond any, and no overflow
    const std::string name = given.words.size() == 2 ? given.words[1] : "";
    const bool bond = name.starts_with("bond");
    const std::optional<int> number =
        whole_number(name.substr(std::min<std::size_t>(bond ? 4 : 3, name.size())));
    if (!number || *number < 0 || *number > highest || (!bond && !name.starts_with("eth")))
        refuse("nic ethN|bondN --state STATE [--speed MBIT]");
    return event_of(
        zavNetState{ZAV_EVENT_NET,
                    {ZAV_DEV_NIC, bond ? ZAV_MINDEV_NIC_BOND : ZAV_MINDEV_NIC_ETH, *number + 1, 0},
                    given.speed.value_or(0),
                    state_in(given, network_states())});
}

zavSystemEvent load(const EventWords &given, bool) {
    const std::optional<int> probe =
        given.words.size() == 2 ? code_of(load_probes(), given.words[1]) : std::nullopt;
    if (!probe)
        refuse(fmt::format("load PROBE --value PERCENT --state STATE, where PROBE is one of {}",
                           known_words(load_probes())));
    return event_of(zavSysinfoState{ZAV_EVENT_SYSINFO, *probe, float_in(given.value),
                                    state_in(given, load_states())});
}

zavSystemEvent unit(const EventWords &given, bool) {
    const bool whole = given.words.size() == 2;
    const std::optional<int> number =
        whole || given.words.size() == 3 ? whole_number(given.words[1]) : std::nullopt;
    const std::optional<int> part =
        whole ? ZAV_RBOD_EXPANDER : code_of(unit_sensors(), given.words.back());
    if (!number || !part)
        refuse("unit N [temperature|voltage] --state STATE [--value NUMBER]");
    zavRBODState record{};
    record.type = ZAV_EVENT_RBOD;
    record.rbod.id = *number;
    record.id = *part;
    record.value = float_in(given.value);
    record.state = state_in(given, unit_states());
    record.rbod.iExist = record.state == ZAV_RBOD_NOTEXIST ? 0 : 1;
    return event_of(record);
}

zavSystemEvent init(const EventWords &given, bool) {
    return event_of(zavInitState{ZAV_EVENT_INIT, number_in(given, "init NUMBER")});
}

// Word, then: state, value, charge, progress, speed.
constexpr Kind kinds[] = {
    {"fan", true, true, false, false, false, sensor<ZAV_EVENT_FAN>},
    {"thermal", true, true, false, false, false, sensor<ZAV_EVENT_THERMAL>},
    {"volt", true, true, false, false, false, sensor<ZAV_EVENT_VOLTAGE>},
    {"ups", true, false, true, false, false, ups},
    {"disk", true, false, false, false, false, disk},
    {"array", true, false, false, true, false, array},
    {"vg", true, false, false, false, false, group},
    {"pv", true, false, false, false, false, physical_volume},
    {"lv", true, true, false, false, false, logical_volume},
    {"nic", true, false, false, false, true, network},
    {"load", true, true, false, false, false, load},
    {"unit", true, true, false, false, false, unit},
    {"init", false, false, false, false, false, init},
};

void refuse_options(const Kind &kind, const EventWords &given) {
    struct Given {
        const char *name;
        bool given;
        bool taken;
    };
    for (const Given &option : {Given{"--state", given.state.has_value(), kind.state},
                                {"--value", given.value.has_value(), kind.value},
                                {"--charge", given.charge.has_value(), kind.charge},
                                {"--progress", given.progress.has_value(), kind.progress},
                                {"--speed", given.speed.has_value(), kind.speed}})
        if (option.given && !option.taken)
            throw NoEvent(fmt::format("{} says nothing about '{}'", option.name, kind.word));
}

} // namespace

zavSystemEvent event_of_words(const EventWords &given, bool hardware_raid) {
    const std::string word = given.words.empty() ? "" : given.words.front();
    const auto *kind = std::find_if(std::begin(kinds), std::end(kinds),
                                    [&word](const Kind &one) { return word == one.word; });
    if (kind != std::end(kinds)) {
        refuse_options(*kind, given);
        return kind->make(given, hardware_raid);
    }
    std::vector<std::string> words;
    for (const Kind &one : kinds)
        words.emplace_back(one.word);
    throw NoEvent(
        fmt::format("'{}' is no kind of event: there are {}", printable(word), listed(words)));
}

} // namespace zavctl
