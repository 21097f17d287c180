// Thousands of reports, sound and damaged, against a second description of how they are read: in
// terms of bytes at offsets, as if the tables were the memory of a 32-bit program.
#include "common/raid_report.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <gtest/gtest.h>
#include <random>
#include <string>
#include <vector>

namespace {

using Random = std::mt19937;

int below(Random &random, int limit) {
    return static_cast<int>(random() % static_cast<unsigned>(limit));
}

template <class List>
auto any(Random &random, const List &list) {
    return list[random() % std::size(list)];
}

// ---- Reports ----

std::string number(Random &random) {
    static const char *const odd[] = {"",           "-0", "0",   "17",   "16", "-61", "-62",
                                      "2147483648", "x",  "1.5", "1e30", "5",  "-1",  " 7 "};
    return below(random, 3) == 0 ? any(random, odd) : std::to_string(1 + below(random, 6));
}

std::string name(Random &random) {
    static const std::string letters = "abcRVDH IM:#PC\t%0";
    std::string text;
    for (int length = below(random, below(random, 8) == 0 ? 60 : 18); length > 0; --length)
        text += any(random, letters);
    return text;
}

std::string fields(Random &random, const char *kind, int usual) {
    std::string line = kind;
    for (int count = below(random, 4) == 0 ? below(random, 9) : usual; count > 0; --count) {
        line += below(random, 12) == 0 ? "::" : ":";
        line += below(random, 3) == 0 ? name(random) : number(random);
    }
    return line;
}

std::string line(Random &random) {
    switch (below(random, 12)) {
    case 0:
        return below(random, 2) == 0 ? "PCI" : "RBOD#" + std::to_string(below(random, 13));
    case 1:
    case 2:
        return fields(random, "R", 6);
    case 3:
    case 4:
    case 5:
        return fields(random, "V", 6);
    case 6:
    case 7:
    case 8:
        return fields(random, "D", 3);
    case 9:
        return fields(random, below(random, 2) == 0 ? "H" : "H ", 5);
    case 10:
        return fields(random, any(random, std::array{"M", "S", "I", "", "X", " R"}), 1);
    default:
        return name(random);
    }
}

std::string report(Random &random, const zav::Marker &marker) {
    std::string text = below(random, 4) == 0 ? "" : std::string(marker.text()) + "\n";
    for (int lines = below(random, 30); lines > 0; --lines)
        text += line(random) + (below(random, 20) == 0 ? "\r\n" : "\n");
    if (below(random, 5) == 0)
        text.resize(text.size() * static_cast<size_t>(below(random, 100)) / 100);
    return text;
}

// ---- How they are read ----

std::vector<std::string> pieces_of(const std::string &text, size_t most) {
    std::vector<std::string> pieces;
    for (size_t at = 0; at < text.size();) {
        const size_t end = std::min({text.find('\n', at), text.size() - 1, at + most - 1}) + 1;
        pieces.push_back(text.substr(at, end - at));
        at = end;
    }
    return pieces;
}

std::vector<std::string> split(const std::string &text, const std::string &separators) {
    std::vector<std::string> parts(1);
    for (const char c : text)
        if (separators.find(c) == std::string::npos)
            parts.back() += c;
        else if (!parts.back().empty())
            parts.emplace_back();
    if (parts.back().empty())
        parts.pop_back();
    return parts;
}

std::string trimmed(std::string text) {
    text.erase(0, std::min(text.find_first_not_of(" \t"), text.size()));
    text.erase(text.find_last_not_of(" \t\n") + 1);
    return text;
}

// The fields behind the first.
std::vector<std::string> values_of(const std::vector<std::string> &parts) {
    std::vector<std::string> values;
    for (size_t i = 1; i < parts.size(); ++i)
        if (parts[i].front() != '\n')
            values.push_back(trimmed(parts[i]));
    return values;
}

int whole(const std::string &text) {
    return static_cast<int>(
        std::clamp(strtoll(text.c_str(), nullptr, 10), -2147483648LL, 2147483647LL));
}

float real(const std::string &text) {
    return static_cast<float>(strtod(text.c_str(), nullptr));
}

// Rows of bytes; a text goes on to the end of its row.
class Rows {
  public:
    explicit Rows(size_t rows, size_t columns) : rows_(rows, std::string(columns * 16, '\0')) {}

    void put(size_t row, size_t column, std::string text) {
        if (column * 16 >= rows_[0].size()) {
            ++row;
            column -= rows_[0].size() / 16;
        }
        if (row >= rows_.size())
            return;
        text.resize(std::min(text.size(), rows_[row].size() - column * 16 - 1));
        text += '\0';
        rows_[row].replace(column * 16, text.size(), text);
    }

    std::string get(size_t row, size_t column) const { return rows_[row].c_str() + column * 16; }

  private:
    std::vector<std::string> rows_;
};

// A record as bytes. Nothing is put where it would not fit whole.
class Bytes {
  public:
    static constexpr int kSize = 796;
    static constexpr int kVolumes = 44;
    static constexpr int kVolumeSize = 44;
    static constexpr int kDisks = 748;
    static constexpr int kDiskSize = 12;

    static bool fits(int64_t at, int size) { return at >= 0 && at + size <= kSize; }

    template <class Value>
    void put(int64_t at, Value value) {
        memcpy(bytes_.data() + at, &value, sizeof value);
    }
    void put_name(int64_t at, const std::string &text, size_t most) {
        const std::string name = text.substr(0, most);
        memcpy(bytes_.data() + at, name.c_str(), name.size() + 1);
    }
    const char *data() const { return bytes_.data(); }

  private:
    std::array<char, kSize> bytes_ = {};
};

struct Expected {
    bool has_set = false;
    Bytes record;
};

void put_volume(Bytes &record, const Rows &rows, size_t row) {
    const int n = whole(rows.get(row, 0));
    const int64_t at = Bytes::kVolumes + (int64_t{n} - 1) * Bytes::kVolumeSize;
    if (rows.get(row, 0).empty() || !Bytes::fits(at, Bytes::kVolumeSize))
        return;
    record.put(at, n);
    record.put_name(at + 4, rows.get(row, 1), 16);
    record.put(at + 24, whole(rows.get(row, 2)));
    record.put(at + 28, real(rows.get(row, 3)));
    record.put(at + 36, whole(rows.get(row, 4)));
    record.put(at + 40, whole(rows.get(row, 5)));
}

void put_disk(Bytes &record, int n, float size, int status) {
    const int64_t at = Bytes::kDisks + (int64_t{n} - 1) * Bytes::kDiskSize;
    if (!Bytes::fits(at, Bytes::kDiskSize))
        return;
    record.put(at, n);
    record.put(at + 4, size);
    record.put(at + 8, status);
}

Expected evaluate(const Rows &set, const Rows &volumes, const Rows &disks) {
    Expected expected;
    expected.has_set = !set.get(0, 0).empty();
    if (!expected.has_set)
        return expected;
    Bytes &record = expected.record;
    record.put(0, whole(set.get(0, 0)));
    record.put_name(4, set.get(0, 1), 16);
    record.put(24, real(set.get(0, 2)));
    record.put(28, whole(set.get(0, 3)));
    record.put_name(32, set.get(0, 4), 4);
    for (size_t row = 0; row < 6; ++row)
        put_volume(record, volumes, row);
    for (int n = 1; n <= 4; ++n)
        put_disk(record, n, 0.0F, 0);
    for (size_t row = 0; row < 4; ++row)
        if (!disks.get(row, 0).empty())
            put_disk(record, whole(disks.get(row, 0)), real(disks.get(row, 1)),
                     whole(disks.get(row, 2)));
    return expected;
}

Expected expected_of(const std::string &text, const std::string &marker) {
    Rows set(1, 6);
    Rows volumes(6, 6);
    Rows disks(4, 3);
    size_t volume = 0;
    size_t disk = 0;
    bool started = false;
    for (const std::string &piece : pieces_of(text, 79)) {
        started = started || piece.find(marker) != std::string::npos;
        if (!started)
            continue;
        if (piece.find("H:") != std::string::npos)
            break;
        const std::vector<std::string> parts = split(piece, ":");
        const char kind = parts.empty() ? ' ' : parts[0][0];
        const std::vector<std::string> values = values_of(parts);
        for (size_t i = 0; i < values.size(); ++i) {
            if (kind == 'R' && i < 6)
                set.put(0, i, values[i]);
            if (kind == 'V' && i < 6 && volume < 6)
                volumes.put(volume, i, values[i]);
            if (kind == 'D' && i < 4 && disk < 4)
                disks.put(disk, i, values[i]);
        }
        volume += kind == 'V' ? 1 : 0;
        disk += kind == 'D' ? 1 : 0;
    }
    return evaluate(set, volumes, disks);
}

std::array<double, 5> readings_of(const std::string &text, const std::string &marker) {
    std::array<double, 5> readings = {};
    bool started = false;
    for (const std::string &piece : pieces_of(text, 79)) {
        if (started && piece.front() == 'H') {
            const std::vector<std::string> parts = split(piece, ":\n");
            for (size_t i = 1; i < parts.size() && i <= 5; ++i)
                readings.at(i - 1) = strtod(parts[i].c_str(), nullptr);
            break;
        }
        started = started || piece.find(marker) != std::string::npos;
    }
    return readings;
}

// ---- Both against each other ----

template <class Take>
void feed(const std::string &text, Take take) {
    for (const std::string &piece : pieces_of(text, 79)) {
        char buffer[zav::kReportPiece];
        memcpy(buffer, piece.c_str(), piece.size() + 1);
        if (!take(buffer))
            return;
    }
}

constexpr int kCases = 10'000;

TEST(RandomReports, AreReadAsDescribed) {
    Random random(20'261'121);
    int with_set = 0;
    for (int i = 0; i < kCases; ++i) {
        const int unit = below(random, 8);
        const zav::Marker marker = unit == 0 ? zav::Marker::controller() : zav::Marker::unit(unit);
        const std::string text = report(random, marker);
        zav::EnclosureReader reader(marker);
        feed(text, [&](char *piece) { return reader.take(piece), true; });
        sRaidSetInfo info;
        memset(&info, 0x55, sizeof info);
        const bool has_set = reader.fill(info);

        const Expected expected = expected_of(text, marker.text());
        static_assert(sizeof info == Bytes::kSize);
        ASSERT_EQ(has_set, expected.has_set) << marker.text() << "\n" << text;
        ASSERT_EQ(memcmp(&info, expected.record.data(), sizeof info), 0) << marker.text() << "\n"
                                                                         << text;
        with_set += has_set ? 1 : 0;
    }
    EXPECT_GT(with_set, kCases / 5) << "the generator makes reports that say something";
}

TEST(RandomReports, GiveTheirReadingsAsDescribed) {
    Random random(42);
    int with_readings = 0;
    for (int i = 0; i < kCases; ++i) {
        const zav::Marker marker = zav::Marker::unit(below(random, 4));
        const std::string text = report(random, marker);
        zav::MonitorReader reader(marker);
        feed(text, [&](char *piece) { return reader.take(piece); });
        const std::array<double, 5> expected = readings_of(text, marker.text());
        for (int item = 0; item < 5; ++item) {
            const double reading = reader.reading(item);
            ASSERT_EQ(memcmp(&reading, &expected.at(static_cast<size_t>(item)), sizeof reading), 0)
                << marker.text() << " " << item << "\n"
                << text;
        }
        with_readings += reader.line_found() ? 1 : 0;
    }
    EXPECT_GT(with_readings, kCases / 20);
}

} // namespace
