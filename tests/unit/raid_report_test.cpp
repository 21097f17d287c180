// What is taken from a report of the RAID controller.
#include "common/raid_report.h"

#include <cmath>
#include <cstdio>
#include <cstring>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace {

using zav::EnclosureReader;
using zav::IdentityReader;
using zav::Marker;
using zav::MonitorReader;
using Kind = EnclosureReader::Kind;

// Feeds a reader as the library does, until `take` has enough.
template <class Take>
void feed(const std::string &text, int size, Take take) {
    std::string copy = text;
    FILE *file = fmemopen(copy.data(), copy.size(), "r");
    ASSERT_TRUE(file != nullptr || text.empty());
    char piece[256];
    while (file != nullptr && fgets(piece, size, file) != nullptr)
        if (!take(piece))
            break;
    if (file != nullptr)
        fclose(file);
}

struct Enclosure {
    bool has_set = false;
    sRaidSetInfo info = {};
    std::vector<EnclosureReader::Piece> pieces;
};

Enclosure read(const std::string &text, const Marker &marker = Marker::controller()) {
    EnclosureReader reader(marker);
    Enclosure answer;
    memset(&answer.info, 0x55, sizeof answer.info); // what nobody cleared would show
    feed(text, zav::kReportPiece, [&](char *piece) {
        answer.pieces.push_back(reader.take(piece));
        return true;
    });
    answer.has_set = reader.fill(answer.info);
    return answer;
}

bool is_zero(const sRaidSetInfo &info) {
    const sRaidSetInfo zero = {};
    return memcmp(&info, &zero, sizeof info) == 0;
}

const std::string kSet = "R:1:Raid Set # 00:2000.5:4:1234:0\n";

TEST(Report, GivesTheRaidSet) {
    const Enclosure answer = read("PCI\n" + kSet + "H:1\n");
    ASSERT_TRUE(answer.has_set);
    EXPECT_EQ(+answer.info.raidnum, 1);
    EXPECT_STREQ(answer.info.raidname, "Raid Set # 00");
    EXPECT_EQ(+answer.info.raidsize, 2000.5F);
    EXPECT_EQ(+answer.info.diskcount, 4);
    EXPECT_STREQ(answer.info.diskmember, "1234");
    EXPECT_EQ(+answer.info.status, 0);
}

TEST(Report, GivesAVolume) {
    const Enclosure answer = read("PCI\n" + kSet + "V:2:VOL#01:3:1500.25:42:4\nH:1\n");
    const sVolSetInfo &volume = answer.info.sVolInfo[1];
    EXPECT_EQ(+volume.volnum, 2);
    EXPECT_STREQ(volume.volname, "VOL#01");
    EXPECT_EQ(+volume.raidlevel, 3);
    EXPECT_EQ(+volume.volsize, 1500.25F);
    EXPECT_EQ(+volume.scsiId, 0);
    EXPECT_EQ(+volume.progress, 42);
    EXPECT_EQ(+volume.status, 4);
    EXPECT_EQ(+answer.info.sVolInfo[0].volnum, 0) << "a volume that is missing is all zero";
}

TEST(Report, GivesADisk) {
    const Enclosure answer = read("PCI\n" + kSet + "D:3:500.1:1\nH:1\n");
    EXPECT_EQ(+answer.info.sDiskInfo[2].disknum, 3);
    EXPECT_EQ(+answer.info.sDiskInfo[2].disksize, 500.1F);
    EXPECT_EQ(+answer.info.sDiskInfo[2].status, 1);
    for (const int slot : {0, 1, 3}) {
        EXPECT_EQ(+answer.info.sDiskInfo[slot].disknum, slot + 1);
        EXPECT_EQ(+answer.info.sDiskInfo[slot].disksize, 0.0F);
        EXPECT_EQ(+answer.info.sDiskInfo[slot].status, 0);
    }
}

TEST(Report, TakesSlotsByNumberWhateverTheOrder) {
    const Enclosure answer =
        read("PCI\n" + kSet + "V:2:b:0:2:0:1\nV:1:a:0:1:0:1\nD:4:4:1\nD:1:1:1\nH:1\n");
    EXPECT_STREQ(answer.info.sVolInfo[0].volname, "a");
    EXPECT_STREQ(answer.info.sVolInfo[1].volname, "b");
    EXPECT_EQ(+answer.info.sDiskInfo[0].disksize, 1.0F);
    EXPECT_EQ(+answer.info.sDiskInfo[3].disksize, 4.0F);
}

TEST(Report, GivesTheSectionThatIsAskedForAlone) {
    const std::string text = "PCI\nR:1:card:1:4:1234:0\nV:1:v:3:1:0:1\nH:1\n"
                             "RBOD#1\nR:2:unit:2:3:123:0\nD:1:7:1\nH:1\n";
    const Enclosure card = read(text);
    EXPECT_STREQ(card.info.raidname, "card");
    EXPECT_EQ(+card.info.sDiskInfo[0].disksize, 0.0F);
    const Enclosure unit = read(text, Marker::unit(1));
    EXPECT_STREQ(unit.info.raidname, "unit");
    EXPECT_EQ(+unit.info.sVolInfo[0].volnum, 0);
    EXPECT_EQ(+unit.info.sDiskInfo[0].disksize, 7.0F);
    EXPECT_FALSE(read(text, Marker::unit(2)).has_set);
}

TEST(Report, FindsTheMarkerAnywhereInALine) {
    EXPECT_TRUE(read("x\nInfo of a PCIe card\n" + kSet).has_set);
    EXPECT_TRUE(read("RBOD#12\n" + kSet, Marker::unit(1)).has_set) << "RBOD#1 is in RBOD#12";
    EXPECT_FALSE(read("RBOD#1\n" + kSet, Marker::unit(2)).has_set);
}

TEST(Report, ExaminesTheMarkersOwnLine) {
    const Enclosure answer = read("R:7:PCI set:1:2:12:0\nH:1\n");
    EXPECT_EQ(+answer.info.raidnum, 7);
    EXPECT_FALSE(read("PCI H:\n" + kSet).has_set) << "it may also end the section at once";
}

TEST(Report, WithoutASetLeavesNothing) {
    for (const char *text : {"", "PCI\n", "PCI\nV:1:v:3:1:0:1\nD:1:1:1\nH:1\n", "PCI\nR\n",
                             "PCI\nR: :name\n", "R:1:before the marker:1:1:1:0\n"}) {
        const Enclosure answer = read(text);
        EXPECT_FALSE(answer.has_set) << text;
        EXPECT_TRUE(is_zero(answer.info)) << text;
    }
}

TEST(Report, EndsASectionAtAnyLineWithTheMonitorsLetterAndColon) {
    for (const char *end : {"H:1:2\n", "M:XYZ-H:1\n", "V:1:nameH:3:1:0:1\n"}) {
        const Enclosure answer = read("PCI\n" + kSet + end + "V:2:late:0:1:0:1\n");
        EXPECT_EQ(+answer.info.sVolInfo[0].volnum, 0) << end;
        EXPECT_EQ(+answer.info.sVolInfo[1].volnum, 0) << end;
        EXPECT_EQ(answer.pieces[2].kind, Kind::kEnd);
        EXPECT_EQ(answer.pieces[3].kind, Kind::kAfter);
    }
    EXPECT_EQ(+read("PCI\n" + kSet + "H 1\nV:1:v:0:1:0:1\n").info.sVolInfo[0].volnum, 1);
}

TEST(Report, WithoutAnEndRunsIntoTheNextSection) {
    const Enclosure answer = read("PCI\n" + kSet +
                                  "V:1:own:3:1:0:1\nRBOD#1\nR:2:other:1:2:12:0\n"
                                  "V:2:its:3:1:0:1\nD:1:7:1\nH:1\n");
    EXPECT_STREQ(answer.info.raidname, "other") << "the last set wins";
    EXPECT_EQ(+answer.info.raidnum, 2);
    EXPECT_STREQ(answer.info.sVolInfo[0].volname, "own");
    EXPECT_STREQ(answer.info.sVolInfo[1].volname, "its");
    EXPECT_EQ(+answer.info.sDiskInfo[0].disksize, 7.0F);
}

TEST(Report, KeepsWhatALaterSetDoesNotTell) {
    const Enclosure answer = read("PCI\n" + kSet + "R:5\n");
    EXPECT_EQ(+answer.info.raidnum, 5);
    EXPECT_STREQ(answer.info.raidname, "Raid Set # 00");
}

TEST(Report, LosesNothingToABareMarkerThatBeginsWithR) {
    const Enclosure answer = read("RBOD#1\n" + kSet + "RBOD#1\n", Marker::unit(1));
    EXPECT_EQ(+answer.info.raidnum, 1);
    EXPECT_STREQ(answer.info.raidname, "Raid Set # 00");
    EXPECT_EQ(answer.pieces[2].fields, 0U);
}

TEST(Report, ClassifiesByTheFirstCharacterOfTheFirstField) {
    EXPECT_EQ(+read("PCI\nRaid set:4:x:1:1:1:0\n").info.raidnum, 4);
    EXPECT_EQ(+read("PCI\n:::R:4:x:1:1:1:0\n").info.raidnum, 4) << "leading separators are skipped";
    EXPECT_FALSE(read("PCI\n R:4:x:1:1:1:0\n").has_set);
    EXPECT_FALSE(read("PCI\nr:4:x:1:1:1:0\n").has_set);
    const Enclosure ignored = read("PCI\n\n:\n:::\nM:model\nS:serial\nI:\nX:1\n" + kSet);
    EXPECT_TRUE(ignored.has_set);
    for (size_t i = 0; i + 1 < ignored.pieces.size(); ++i)
        EXPECT_EQ(ignored.pieces[i].kind, Kind::kOther) << i;
}

TEST(Report, TrimsItsFields) {
    const Enclosure answer = read("PCI\nR: 1 :\t a set \t: 3.5 : 4 : 12 \n");
    EXPECT_EQ(+answer.info.raidnum, 1);
    EXPECT_STREQ(answer.info.raidname, "a set");
    EXPECT_EQ(+answer.info.raidsize, 3.5F);
    EXPECT_STREQ(answer.info.diskmember, "12");
}

TEST(Report, CountsNoFieldBehindTheLastSeparator) {
    const Enclosure answer = read("PCI\nR:1:set:\nR:2:::\n");
    EXPECT_EQ(answer.pieces[1].fields, 2U);
    EXPECT_EQ(answer.pieces[2].fields, 1U);
    EXPECT_EQ(+answer.info.raidnum, 2);
    EXPECT_STREQ(answer.info.raidname, "set");
}

TEST(Report, TakesRunsOfSeparatorsAsOne) {
    EXPECT_EQ(+read("PCI\nR::1:::set::9\n").info.raidsize, 9.0F);
}

TEST(Report, ReadsNumbersAsFarAsTheyGo) {
    const Enclosure answer =
        read("PCI\nR:0x7:set:12GB:4 disks:1:0\nV:1:v:three:1e3x:-5%:99999999999\n"
             "D:2:abc:-9999999999\n");
    EXPECT_EQ(+answer.info.raidnum, 0);
    EXPECT_EQ(+answer.info.raidsize, 12.0F);
    EXPECT_EQ(+answer.info.diskcount, 4);
    EXPECT_EQ(+answer.info.sVolInfo[0].raidlevel, 0);
    EXPECT_EQ(+answer.info.sVolInfo[0].volsize, 1000.0F);
    EXPECT_EQ(+answer.info.sVolInfo[0].progress, -5);
    EXPECT_EQ(+answer.info.sVolInfo[0].status, INT32_MAX) << "saturates as on 32 bits";
    EXPECT_EQ(+answer.info.sDiskInfo[1].disksize, 0.0F);
    EXPECT_EQ(+answer.info.sDiskInfo[1].status, INT32_MIN);
}

TEST(Report, CutsNamesToFit) {
    // Of the set's members four letters fit, of a name sixteen characters: fifteen of its own
    // field and what the next one begins with.
    const Enclosure answer =
        read("PCI\nR:1:ABCDEFGHIJKLMNOP:2000:4:123456:0\nV:1:abcdefghijklmno:3:1:0:1\n");
    EXPECT_STREQ(answer.info.diskmember, "1234");
    EXPECT_STREQ(answer.info.raidname, "ABCDEFGHIJKLMNOP");
    EXPECT_EQ(answer.info.raidname[16], '\0');
    EXPECT_EQ(+answer.info.raidsize, 2000.0F);
    EXPECT_STREQ(answer.info.sVolInfo[0].volname, "abcdefghijklmno");
}

TEST(Report, LetsALongFieldRunIntoTheNext) {
    // 20 characters where 15 fit: the four behind the slot are in the next field, until that is
    // told.
    const std::string number = "00000000000000000012";
    EXPECT_EQ(+read("PCI\nR:" + number + "\n").info.raidnum, 12);
    EXPECT_STREQ(read("PCI\nR:" + number + "\n").info.raidname, "0012");
    const Enclosure told = read("PCI\nR:" + number + ":345\n");
    EXPECT_EQ(+told.info.raidnum, 345) << "the sixteen zeros go on with the next field";
    EXPECT_STREQ(told.info.raidname, "345");
}

TEST(Report, KeepsALongFieldInsideItsRow) {
    const std::string status(40, '1');
    const Enclosure answer =
        read("PCI\n" + kSet + "V:1:v:3:1:0:" + status + "\nD:1:2:" + status + "\n");
    EXPECT_EQ(+answer.info.sVolInfo[0].status, INT32_MAX);
    EXPECT_EQ(+answer.info.sVolInfo[1].volnum, 0);
    EXPECT_EQ(+answer.info.sDiskInfo[0].status, INT32_MAX);
    EXPECT_EQ(+answer.info.sDiskInfo[1].disksize, 0.0F);
}

TEST(Report, PutsADisksFourthFieldIntoTheNextDisksRow) {
    const Enclosure overwritten = read("PCI\n" + kSet + "D:1:10:1:3\nD:2:20:1\n");
    EXPECT_EQ(+overwritten.info.sDiskInfo[1].disksize, 20.0F);
    EXPECT_EQ(+overwritten.info.sDiskInfo[2].disksize, 0.0F);
    // With no line to overwrite it, it is a disk of its own without size.
    const Enclosure alone = read("PCI\n" + kSet + "D:1:10:1:1\n");
    EXPECT_EQ(+alone.info.sDiskInfo[0].disksize, 0.0F);
    EXPECT_EQ(+alone.info.sDiskInfo[0].disknum, 1);
    // A next line that tells nothing does not overwrite it either.
    EXPECT_EQ(+read("PCI\n" + kSet + "D:1:10:1:1\nD\n").info.sDiskInfo[0].disksize, 0.0F);
    // Behind the last row there is nothing.
    const Enclosure last = read("PCI\n" + kSet + "D:1:1:1\nD:2:2:1\nD:3:3:1\nD:4:4:1:9:9\n");
    EXPECT_EQ(last.pieces.back().fields, 3U);
    EXPECT_EQ(+last.info.sDiskInfo[3].disksize, 4.0F);
    EXPECT_EQ(read("PCI\n" + kSet + "D:1:1:1:1:1\n").pieces.back().fields, 4U);
}

TEST(Report, IgnoresMoreThanSixFieldsOfAVolume) {
    const Enclosure answer = read("PCI\n" + kSet + "V:1:v:3:1:0:1:77:88\n");
    EXPECT_EQ(answer.pieces[2].fields, 6U);
    EXPECT_EQ(+answer.info.sVolInfo[0].status, 1);
    EXPECT_EQ(+answer.info.sVolInfo[1].volnum, 0);
}

TEST(Report, IgnoresMoreThanSixVolumesAndFourDisks) {
    std::string text = "PCI\n" + kSet;
    for (int i = 1; i <= 7; ++i)
        text += "V:" + std::to_string(i) + ":v:3:1:0:1\n";
    for (int i = 1; i <= 4; ++i)
        text += "D:" + std::to_string(i) + ":1:1\n";
    text += "D:1:99:4\n";
    const Enclosure answer = read(text);
    EXPECT_EQ(+answer.info.sVolInfo[5].volnum, 6);
    EXPECT_EQ(+answer.info.sVolInfo[6].volnum, 0);
    EXPECT_EQ(+answer.info.sDiskInfo[0].disksize, 1.0F);
    EXPECT_EQ(answer.pieces[8].kind, Kind::kSurplus);
    EXPECT_EQ(answer.pieces[13].kind, Kind::kSurplus);
    EXPECT_EQ(answer.pieces[7].row, 5U);
}

TEST(Report, CountsALineWithoutFieldsAsOneOfTheSix) {
    const Enclosure answer = read("PCI\n" + kSet + "V\nV\nV\nV\nV\nV\nV:1:v:3:1:0:1\n");
    EXPECT_EQ(+answer.info.sVolInfo[0].volnum, 0);
}

TEST(Report, TakesVolumesUpToSixteen) {
    EXPECT_EQ(+read("PCI\n" + kSet + "V:16:v:3:1:0:1\n").info.sVolInfo[15].volnum, 16);
}

TEST(Report, LandsVolumeZeroOnTheSetsOwnFields) {
    const Enclosure answer = read("PCI\n" + kSet + "V:0:zero:3:1.5:7:9\n");
    EXPECT_EQ(+answer.info.raidnum, 0);
    EXPECT_STREQ(answer.info.raidname, "zero");
    int bits = 0;
    memcpy(&bits, &answer.info.raidsize, sizeof bits);
    EXPECT_EQ(bits, 3) << "the level stands where the size was";
    float size = 0;
    memcpy(&size, &answer.info.diskcount, sizeof size);
    EXPECT_EQ(size, 1.5F) << "the size stands where the count was";
    EXPECT_EQ(memcmp(answer.info.diskmember, "1234\7", 5), 0) << "the progress behind the members";
    EXPECT_EQ(+answer.info.status, 9);
    EXPECT_EQ(+answer.info.sVolInfo[0].volnum, 0);
}

TEST(Report, PresetsTheDisksAfterTheVolumes) {
    // Volume 17 would begin where the disks are.
    const Enclosure answer = read("PCI\n" + kSet + "V:17:abcdefghijklmno:3:1.5:7:9\n");
    for (int slot = 0; slot < 4; ++slot) {
        EXPECT_EQ(+answer.info.sDiskInfo[slot].disknum, slot + 1);
        EXPECT_EQ(+answer.info.sDiskInfo[slot].disksize, 0.0F);
        EXPECT_EQ(+answer.info.sDiskInfo[slot].status, 0);
    }
}

TEST(Report, LandsDiskZeroOnTheLastVolume) {
    const Enclosure answer = read("PCI\n" + kSet + "D:0:2.5:4\n");
    EXPECT_EQ(+answer.info.sVolInfo[15].scsiId, 0);
    float size = 0;
    memcpy(&size, &answer.info.sVolInfo[15].progress, sizeof size);
    EXPECT_EQ(size, 2.5F);
    EXPECT_EQ(+answer.info.sVolInfo[15].status, 4);
}

TEST(Report, IgnoresNumbersThatWouldLandOutsideTheRecord) {
    const Enclosure plain = read("PCI\n" + kSet);
    for (const char *line : {"V:18:v:3:1:0:1\n", "V:-1:v:3:1:0:1\n", "V:-9999999999:v:3:1:0:1\n",
                             "V:9999999999:v:3:1:0:1\n", "D:5:1:1\n", "D:9999999999:1:1\n",
                             "D:-62:1:1\n", "D:-9999999999:1:1\n"}) {
        const Enclosure answer = read("PCI\n" + kSet + line);
        EXPECT_EQ(memcmp(&answer.info, &plain.info, sizeof plain.info), 0) << line;
    }
    const Enclosure lowest = read("PCI\n" + kSet + "D:-61:2.5:4\n");
    EXPECT_NE(memcmp(&lowest.info, &plain.info, sizeof plain.info), 0) << "the lowest inside";
}

TEST(Report, ReadsLongLinesInPieces) {
    // 79 characters of a line that is ignored; what follows is a line of its own.
    const Enclosure answer = read("PCI\nM:" + std::string(77, 'x') + "R:8:set:1:4:1234:0\n");
    EXPECT_EQ(+answer.info.raidnum, 8);
    EXPECT_FALSE(read("PCI\nM:" + std::string(76, 'x') + "R:8:set:1:4:1234:0\n").has_set);
}

TEST(Report, KeepsCarriageReturns) {
    EXPECT_STREQ(read("PCI\r\nR:1:set\r\n").info.raidname, "set\r");
}

TEST(Report, EndsALineAtANul) {
    const Enclosure answer = read(std::string("PCI\nR:1:a\0b:5\nV:1:v:3:1:0:1\n", 28));
    EXPECT_STREQ(answer.info.raidname, "a");
    EXPECT_EQ(+answer.info.raidsize, 0.0F);
    EXPECT_EQ(+answer.info.sVolInfo[0].volnum, 1);
}

TEST(Report, TellsWhatBecameOfEveryLine) {
    const Enclosure answer = read("x\nPCI\n" + kSet + "V:1:v:3:1:0:1\nD:1:1:1\nH:1\ny\n");
    const std::vector<Kind> expected = {Kind::kBefore, Kind::kOther, Kind::kRaidSet, Kind::kVolume,
                                        Kind::kDisk,   Kind::kEnd,   Kind::kAfter};
    ASSERT_EQ(answer.pieces.size(), expected.size());
    for (size_t i = 0; i < expected.size(); ++i)
        EXPECT_EQ(answer.pieces[i].kind, expected[i]) << i;
    EXPECT_EQ(answer.pieces[2].fields, 6U);
    EXPECT_EQ(answer.pieces[4].fields, 3U);
}

// ---- Monitor readings ----

MonitorReader monitor(const std::string &text, const Marker &marker = Marker::unit(1)) {
    MonitorReader reader(marker);
    feed(text, zav::kReportPiece, [&](char *piece) { return reader.take(piece); });
    return reader;
}

TEST(Monitor, GivesItsReadingsInOrder) {
    const MonitorReader reader = monitor("RBOD#1\nH:45.5:3200:11.9:5.1:1.2\n");
    EXPECT_TRUE(reader.line_found());
    const double expected[] = {45.5, 3200, 11.9, 5.1, 1.2};
    for (int item = 0; item < 5; ++item)
        EXPECT_EQ(reader.reading(item), expected[item]);
}

TEST(Monitor, ReadsZeroWhatTheLineDoesNotHave) {
    const MonitorReader reader = monitor("RBOD#1\nH:1:2:3\n");
    EXPECT_EQ(reader.reading(2), 3);
    EXPECT_EQ(reader.reading(3), 0);
    EXPECT_EQ(reader.reading(4), 0);
}

TEST(Monitor, TakesFiveReadingsAtMost) {
    EXPECT_EQ(monitor("RBOD#1\nH:1:2:3:4:5:6\n").reading(4), 5);
}

TEST(Monitor, SeparatesAtColonsAndLineEndsInRuns) {
    const MonitorReader reader = monitor("RBOD#1\nHW::1:::2:\n");
    EXPECT_EQ(reader.reading(0), 1);
    EXPECT_EQ(reader.reading(1), 2);
    EXPECT_EQ(reader.reading(2), 0);
}

TEST(Monitor, TakesTheFirstLineThatBeginsWithItsLetter) {
    EXPECT_EQ(monitor("RBOD#1\nM:H:9\n H:8\nH:7\nH:6\n").reading(0), 7);
    EXPECT_EQ(monitor("RBOD#1\nHello:5\nH:7\n").reading(0), 5);
    EXPECT_TRUE(monitor("RBOD#1\nH\n").line_found());
}

TEST(Monitor, LooksBehindTheMarkersLineOnly) {
    EXPECT_EQ(monitor("H:1\nRBOD#1\nH:2\n").reading(0), 2);
    EXPECT_EQ(monitor("H RBOD#1:1\nH:2\n").reading(0), 2) << "not at the marker's line itself";
}

TEST(Monitor, RunsIntoTheNextSection) {
    EXPECT_EQ(monitor("RBOD#1\nS:1\nRBOD#2\nH:22\n").reading(0), 22);
}

TEST(Monitor, TellsWhatItDidNotFind) {
    EXPECT_FALSE(monitor("RBOD#2\nH:1\n").marker_found());
    const MonitorReader unfinished = monitor("RBOD#1\nM:1\n");
    EXPECT_TRUE(unfinished.marker_found());
    EXPECT_FALSE(unfinished.line_found());
    EXPECT_EQ(unfinished.reading(0), 0);
}

TEST(Monitor, ReadsNumbersWhateverTheyAre) {
    const MonitorReader reader = monitor("RBOD#1\nH: 1.5 :-2:x:nan:1e2\n");
    EXPECT_EQ(reader.reading(0), 1.5);
    EXPECT_EQ(reader.reading(1), -2);
    EXPECT_EQ(reader.reading(2), 0);
    EXPECT_TRUE(std::isnan(reader.reading(3)));
    EXPECT_EQ(reader.reading(4), 100);
}

TEST(Monitor, FindsTheControllersMarker) {
    EXPECT_EQ(monitor("PCI\nH:3\n", Marker::controller()).reading(0), 3);
    EXPECT_STREQ(Marker::controller().text(), "PCI");
    EXPECT_STREQ(Marker::unit(7).text(), "RBOD#7");
    EXPECT_STREQ(Marker::unit(INT32_MIN).text(), "RBOD#-2147483648");
}

// ---- Identity ----

sRBODMap identity(const std::string &text) {
    sRBODMap map = {3, "addr", "old sn", "old model"};
    IdentityReader reader(3);
    feed(text, zav::kIdentityPiece, [&](char *piece) { return reader.take(piece, map); });
    return map;
}

TEST(UnitIdentity, IsModelAndSerialNumber) {
    const sRBODMap map = identity("RBOD#2\nM:x\nS:x\nI:\nRBOD#3\nM: HBQE-T500 \nS:A1 2\nI:\n");
    EXPECT_STREQ(map.model, "HBQE-T500");
    EXPECT_STREQ(map.sn, "A1 2");
    EXPECT_STREQ(map.sasaddr, "addr");
    EXPECT_EQ(+map.rbodid, 3);
}

TEST(UnitIdentity, StaysAsItWasWhereNothingIsTold) {
    const std::string silent[] = {"",
                                  "RBOD#4\nM:x\n",
                                  "RBOD#3\n",
                                  "M:x\nS:y\n",
                                  "RBOD#3\nM:\nS\nM::\n",
                                  "RBOD#3\nI:\nM:x\nS:y\n",
                                  "RBOD#3 M:x\n"};
    for (const std::string &text : silent) {
        const sRBODMap map = identity(text);
        EXPECT_STREQ(map.model, "old model") << text;
        EXPECT_STREQ(map.sn, "old sn") << text;
    }
}

TEST(UnitIdentity, GoesOnBehindALineThatTellsNothing) {
    const sRBODMap map = identity("RBOD#3\nM:\nX:1\nS\nM:model\nS:serial\n");
    EXPECT_STREQ(map.model, "model");
    EXPECT_STREQ(map.sn, "serial");
}

TEST(UnitIdentity, EndsAtTheFirstLineThatBeginsWithI) {
    EXPECT_STREQ(identity("RBOD#3\nM:a\nInfo\nM:b\n").model, "a");
    EXPECT_STREQ(identity("RBOD#3\nM:a\n:I\nM:b\n").model, "a");
    EXPECT_STREQ(identity("RBOD#3\nM:a\nH:1\nM:b\n").model, "b") << "and not at the monitor's";
}

TEST(UnitIdentity, IsCutToFit) {
    const sRBODMap map =
        identity("RBOD#3\nM:" + std::string(60, 'm') + "\nS:" + std::string(60, 's') + "\nI\n");
    EXPECT_EQ(map.model, std::string(39, 'm'));
    EXPECT_EQ(map.sn, std::string(19, 's'));
    EXPECT_STREQ(map.sasaddr, "addr");
}

TEST(UnitIdentity, KeepsPercentSigns) {
    const sRBODMap map = identity("RBOD#3\nM:%s%n 100%\nS:%d%%\nI\n");
    EXPECT_STREQ(map.model, "%s%n 100%");
    EXPECT_STREQ(map.sn, "%d%%");
}

TEST(UnitIdentity, ReadsPiecesOf127Characters) {
    EXPECT_STREQ(identity("RBOD#3\n" + std::string(127, 'x') + "M:y\n").model, "y");
    EXPECT_STREQ(identity("RBOD#3\n" + std::string(126, 'x') + "M:y\n").model, "old model");
}

TEST(UnitIdentity, TakesABlankAsATextWithoutAnything) {
    EXPECT_STREQ(identity("RBOD#3\nM: \n").model, "");
}

} // namespace
