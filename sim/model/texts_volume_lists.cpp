#include "model/arrays.hpp"
#include "model/texts_volumes.hpp"
#include "model/volumes.hpp"

#include <algorithm>
#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

struct Column {
    const char *heading;
    std::size_t least_width;
    bool right = false;
};
using Row = std::vector<std::string>;

// A column is as wide as its widest entry; the last one is filled up as well.
std::string table(const std::vector<Column> &columns, const std::vector<Row> &rows) {
    if (rows.empty())
        return {};
    std::string head = " ";
    std::vector<std::string> lines(rows.size(), " ");
    for (std::size_t i = 0; i < columns.size(); ++i) {
        std::size_t width = columns[i].least_width;
        for (const Row &row : rows)
            width = std::max(width, row[i].size());
        head += fmt::format(" {:{}}", columns[i].heading, width);
        for (std::size_t row = 0; row < rows.size(); ++row)
            lines[row] += columns[i].right ? fmt::format(" {:>{}}", rows[row][i], width)
                                           : fmt::format(" {:{}}", rows[row][i], width);
    }
    std::string text = head + "\n";
    for (const std::string &line : lines)
        text += line + "\n";
    return text;
}

std::uint64_t kib_of(int extents) {
    return static_cast<std::uint64_t>(extents) * extent_kib;
}

struct Rounded {
    std::string number;
    int unit = 0; // 0 is MiB
};

// To hundredths; nothing is said larger than it is without a "<".
Rounded rounded(std::uint64_t kib) {
    std::uint64_t unit_kib = 1024;
    int unit = 0;
    for (; unit < 2 && kib >= unit_kib * 1024; ++unit)
        unit_kib *= 1024;
    const std::uint64_t hundredths = (kib * 100 + unit_kib / 2) / unit_kib;
    const bool more = hundredths * unit_kib > kib * 100;
    return {fmt::format("{}{}.{:02}", more ? "<" : "", hundredths / 100, hundredths % 100), unit};
}

std::string volume_attributes(const State &state, const Group &group, const Volume &volume) {
    const char *activity = !volume.active ? "--" : volume.mount_point.empty() ? "a-" : "ao";
    return fmt::format("-wi-{}--{}-", activity, is_partial(state, group) ? 'p' : '-');
}

} // namespace

std::string short_size(std::uint64_t kib) {
    static constexpr std::array<char, 3> units = {'m', 'g', 't'};
    const Rounded size = rounded(kib);
    return kib == 0 ? "0 " : size.number + units.at(static_cast<std::size_t>(size.unit));
}

std::string long_size(std::uint64_t kib) {
    static constexpr std::array<const char *, 3> units = {" MiB", " GiB", " TiB"};
    const Rounded size = rounded(kib);
    return kib == 0 ? "0   " : size.number + units.at(static_cast<std::size_t>(size.unit));
}

std::string vgs_text(const State &state, const std::vector<const Group *> &groups) {
    std::vector<Row> rows;
    for (const Group *group : groups) {
        const auto pvs = pvs_of(state, group->name);
        int all = 0;
        int used = 0;
        for (const PhysicalVolume *pv : pvs) {
            all += pv->extents;
            used += used_extents(state, *pv);
        }
        rows.push_back({group->name, std::to_string(pvs.size()),
                        std::to_string(group->volumes.size()), "0",
                        is_partial(state, *group) ? "wz-pn-" : "wz--n-", short_size(kib_of(all)),
                        short_size(kib_of(all - used))});
    }
    return table({{"VG", 2},
                  {"#PV", 3, true},
                  {"#LV", 3, true},
                  {"#SN", 3, true},
                  {"Attr", 6},
                  {"VSize", 5, true},
                  {"VFree", 5, true}},
                 rows);
}

std::string lvs_text(const State &state, const std::vector<ListedVolume> &volumes) {
    std::vector<Row> rows;
    rows.reserve(volumes.size());
    for (const auto &[group, volume] : volumes)
        rows.push_back({volume->name, group->name, volume_attributes(state, *group, *volume),
                        short_size(kib_of(extents_of(*volume))), "", "", "", "", "", "", "", ""});
    return table({{"LV", 2},
                  {"VG", 2},
                  {"Attr", 10},
                  {"LSize", 5, true},
                  {"Pool", 4},
                  {"Origin", 6},
                  {"Data%", 6},
                  {"Meta%", 6},
                  {"Move", 4},
                  {"Log", 3},
                  {"Cpy%Sync", 8},
                  {"Convert", 7}},
                 rows);
}

std::string pvs_text(const State &state, const std::vector<const PhysicalVolume *> &volumes) {
    std::vector<Row> rows;
    for (const PhysicalVolume *pv : volumes) {
        const Place place = place_of(state, *pv);
        const bool in_group = !pv->group.empty();
        const std::uint64_t kib = in_group ? kib_of(pv->extents) : pv->sectors / 2;
        rows.push_back(
            {place.size_kib == 0 ? "[unknown]" : place.node, pv->group, "lvm2",
             !in_group             ? "---"
             : place.size_kib == 0 ? "a-m"
                                   : "a--",
             short_size(kib),
             short_size(in_group ? kib_of(pv->extents - used_extents(state, *pv)) : kib)});
    }
    return table(
        {{"PV", 10}, {"VG", 2}, {"Fmt", 4}, {"Attr", 4}, {"PSize", 5, true}, {"PFree", 5, true}},
        rows);
}

} // namespace zavsim
