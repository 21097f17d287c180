// What is taken from the report of the RAID controller: text in, values out. A report is a text of
// sections, one for each enclosure; a section begins at the line that contains the enclosure's
// marker. Readers are fed with the pieces of the report in their order, as fgets() gives them.
#pragma once

#include "zav_hwraid.h"
#include "zav_rbod.h"

#include <cstddef>

namespace zav {

// Lines are read in pieces of at most one character less.
constexpr int kReportPiece = 80;
constexpr int kIdentityPiece = 128;

constexpr int kFirstUnit = 1;
constexpr int kLastUnit = 7;

// What marks the section of an enclosure.
class Marker {
  public:
    static Marker controller() { return {}; }
    static Marker unit(int number);

    bool in(const char *piece) const;
    const char *text() const { return text_; }

  private:
    char text_[20] = "PCI";
};

// Texts of at most 15 characters in rows. A longer one runs into the next of its row.
template <size_t Rows, size_t Columns>
class FieldTable {
  public:
    static constexpr size_t kRows = Rows;
    static constexpr size_t kColumns = Columns;

    const char *at(size_t row, size_t column) const { return row_[row] + column * kFieldSize; }

    // The field behind a row's last is the first of the next row; behind the last row there is
    // none.
    bool store(size_t row, size_t column, const char *text);

  private:
    static constexpr size_t kFieldSize = 16;
    char row_[Rows][Columns * kFieldSize] = {};
};

// RAID set, volumes and disks of one enclosure.
class EnclosureReader {
  public:
    enum class Kind {
        kBefore,  // the section has not begun
        kRaidSet, // the fields of one were stored
        kVolume,
        kDisk,
        kSurplus, // a volume or a disk for which there is no row
        kOther,   // none of these: ignored
        kEnd,     // ends the section
        kAfter,   // the section has ended
    };
    // What became of a piece.
    struct Piece {
        Kind kind;
        size_t row;    // of the volume or disk
        size_t fields; // stored
    };

    explicit EnclosureReader(const Marker &marker) : marker_(marker) {}

    // The piece is split in place.
    Piece take(char *piece);

    bool started() const { return started_; }
    bool ended() const { return ended_; }

    // What was gathered, into `info`; all zero, and false, without a RAID set.
    bool fill(sRaidSetInfo &info) const;

    // What the rows hold: field 0 is the number of the set, volume or disk.
    const char *raid_set(size_t column) const { return raid_set_.at(0, column); }
    const char *volume(size_t row, size_t column) const { return volumes_.at(row, column); }
    const char *disk(size_t row, size_t column) const { return disks_.at(row, column); }

    static constexpr size_t kVolumeRows = 6;
    static constexpr size_t kDiskRows = 4;

  private:
    Marker marker_;
    bool started_ = false;
    bool ended_ = false;
    FieldTable<1, 6> raid_set_;
    FieldTable<kVolumeRows, 6> volumes_;
    FieldTable<kDiskRows, 3> disks_;
    size_t volume_lines_ = 0;
    size_t disk_lines_ = 0;
};

// The readings of the first line behind the marker's that begins with "H".
class MonitorReader {
  public:
    static constexpr int kReadings = 5;

    explicit MonitorReader(const Marker &marker) : marker_(marker) {}

    // The piece is split in place. False when nothing more is needed.
    bool take(char *piece);

    bool marker_found() const { return marker_found_; }
    bool line_found() const { return line_found_; }
    double reading(int item) const { return readings_[item]; }

  private:
    Marker marker_;
    bool marker_found_ = false;
    bool line_found_ = false;
    double readings_[kReadings] = {};
};

// Model and serial number of a unit, from the lines behind the marker's up to one that begins with
// "I".
class IdentityReader {
  public:
    explicit IdentityReader(int unit) : marker_(Marker::unit(unit)) {}

    // The piece is split in place. False when nothing more is needed. What is not told stays.
    bool take(char *piece, sRBODMap &identity);

  private:
    Marker marker_;
    bool started_ = false;
};

} // namespace zav
