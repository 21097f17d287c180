// What the media tools say of a disc.
#include "cdburn/zav_cdburn_media.h"
#include "harness.h"

#include <sstream>

namespace {

using harness::data;

class Media : public ::testing::Test {
  protected:
    template <class Reader>
    void read(const Reader &reader, const std::string &text) {
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);) {
            line += '\n';
            reader(line.data(), info);
        }
    }
    void dvd(const std::string &text) { read(zav::read_dvd_line, text); }
    void atip(const std::string &text) { read(zav::read_atip_line, text); }

    void expect(int type, int state, int total, int available) const {
        EXPECT_EQ(info.discType, type);
        EXPECT_EQ(info.discState, state);
        EXPECT_EQ(info.discTotalSize, total);
        EXPECT_EQ(info.discAvailableSize, available);
    }

    zavMediaInfo info = {ZAV_EVENT_DISC, ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0};
};

TEST_F(Media, DvdHasItsTypeAndCapacity) {
    const struct {
        const char *text;
        int type;
        int total;
    } rows[] = {
        {"10h, DVD-ROM", ZAV_DVD_ROM, 0},
        {"11h, DVD-R Sequential", ZAV_DVD_MINUS_R_SEQ, 4590000},
        {"12h, DVD-RAM", ZAV_DVD_RAM, 0},
        {"13h, DVD-RW Restricted Overwrite", ZAV_DVD_MINUS_RW_RES, 4590000},
        {"14h, DVD-RW Sequential", ZAV_DVD_MINUS_RW_SEQ, 4590000},
        {"1Ah, DVD+RW", ZAV_DVD_PLUS_RW, 4590000},
        {"1Bh, DVD+R", ZAV_DVD_PLUS_R, 4590000},
        {"2Bh, DVD+R Double Layer", ZAV_DVD_PLUS_R_DOUBLE, 8347000},
    };
    for (const auto &row : rows) {
        info = {ZAV_EVENT_DISC, ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0};
        dvd(std::string(" Mounted Media:         ") + row.text + "\n");
        expect(row.type, ZAV_DISC_STATE_UNKNOWN, row.total, 0);
    }
}

TEST_F(Media, DvdOfAnotherKindIsNotDetermined) {
    dvd(" Mounted Media:         15h, DVD-R Dual Layer Sequential\n"
        " Mounted Media:         2Ah, DVD+RW Double Layer\n"
        "Mounted Media:         10h, DVD-ROM\n");
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0);
}

TEST_F(Media, DvdHasItsState) {
    dvd(" Disc status:           blank\n");
    EXPECT_EQ(info.discState, ZAV_DISC_BLANK);
    dvd(" Disc status:           appendable\n");
    EXPECT_EQ(info.discState, ZAV_DISC_APPENDABLE);
    dvd(" Disc status:           complete\n");
    EXPECT_EQ(info.discState, ZAV_DISC_COMPLETE);
}

TEST_F(Media, BlankDvdHasAllItsRoom) {
    dvd(" Mounted Media:         1Bh, DVD+R\n Disc status:           blank\n"
        "READ CAPACITY:          1*2048=2048\n");
    expect(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK, 4590000, 4590000);
}

TEST_F(Media, CompleteDvdHasNone) {
    info.discAvailableSize = 7;
    dvd(" Mounted Media:         1Bh, DVD+R\n Disc status:           complete\n"
        "READ CAPACITY:          1000*2048=2048000\n");
    expect(ZAV_DVD_PLUS_R, ZAV_DISC_COMPLETE, 4590000, 0);
}

TEST_F(Media, AppendableDvdHasWhatItsSectorsLeave) {
    dvd(" Mounted Media:         11h, DVD-R Sequential\n Disc status:           appendable\n"
        "READ CAPACITY:          1000*2048=2048000\n");
    expect(ZAV_DVD_MINUS_R_SEQ, ZAV_DISC_APPENDABLE, 4590000, 4590000 - 2000 - 4096);
}

TEST_F(Media, DvdWithoutSectorsHasAllButTheReserve) {
    dvd(" Mounted Media:         1Bh, DVD+R\n Disc status:           appendable\n"
        "READ CAPACITY:          0*2048=0\n");
    expect(ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE, 4590000, 4590000 - 4096);
}

TEST_F(Media, RoomOfADvdMayBeNegative) {
    dvd(" Mounted Media:         11h, DVD-R Sequential\n Disc status:           appendable\n"
        "READ CAPACITY:          2295000*2048=4700160000\n");
    EXPECT_EQ(info.discAvailableSize, -4096);
}

TEST_F(Media, CapacityCountsFromTheStateThatWasReadBefore) {
    dvd(" Mounted Media:         1Bh, DVD+R\nREAD CAPACITY:          1000*2048=2048000\n"
        " Disc status:           blank\n");
    expect(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK, 4590000, 4590000 - 2000 - 4096);
}

TEST_F(Media, DvdWhoseCapacityNamesNoSectorsHasNoRoom) {
    for (const char *capacity :
         {"READ CAPACITY:\n", "READ CAPACITY:          *2048\n", "READ CAPACITY:          x*2048\n",
          "READ CAPACITY:          -5*2048=0\n", "READ CAPACITY:          99999999999*2048=0\n"}) {
        info = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE, 4590000, 0};
        dvd(capacity);
        EXPECT_EQ(info.discAvailableSize, 0) << capacity;
    }
}

TEST_F(Media, RealReportOfADvdRomIsRead) {
    dvd(data("captures/dvd-rom/dvd+rw-mediainfo.txt"));
    expect(ZAV_DVD_ROM, ZAV_DISC_STATE_UNKNOWN, 0, 0);
}

TEST_F(Media, RefusalsTellNoMediumFromACd) {
    EXPECT_EQ(zav::read_refusal_line(data("captures/no-disc/dvd+rw-mediainfo.txt").c_str()),
              zav::NoDvd::no_medium);
    EXPECT_EQ(zav::read_refusal_line(data("captures/cd-rom/dvd+rw-mediainfo.txt").c_str()),
              zav::NoDvd::cd);
    EXPECT_EQ(zav::read_refusal_line("INQUIRY:                [QEMU    ]\n"), zav::NoDvd::other);
}

TEST_F(Media, CdIsErasableOrNot) {
    atip("  Is erasable\n");
    EXPECT_EQ(info.discType, ZAV_CD_RW);
    atip("  Is not erasable\n");
    EXPECT_EQ(info.discType, ZAV_CD_R);
    atip("Is erasable\n");
    EXPECT_EQ(info.discType, ZAV_CD_R);
}

TEST_F(Media, CdHasTheSectorsBeforeItsLeadOut) {
    atip("  ATIP start of lead in:  -11634 (97:26/66)\n"
         "  ATIP start of lead out: 359849 (79:59/74)\n");
    EXPECT_EQ(info.discTotalSize, 719698);
}

TEST_F(Media, CdWithoutANumberBehindLeadOutHasNoSize) {
    for (const char *line : {"  ATIP start of lead out:\n", "  ATIP start of lead out: x\n",
                             "  ATIP start of lead out: 4000000000\n"}) {
        atip(line);
        EXPECT_EQ(info.discTotalSize, 0) << line;
    }
}

TEST_F(Media, StatusOfACdStandsInTwoBits) {
    info.discTotalSize = 1000;
    EXPECT_FALSE(zav::read_disc_status(0xFC, info));
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_BLANK, 1000, 1000);
    EXPECT_FALSE(zav::read_disc_status(2, info));
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_COMPLETE, 1000, 0);
    info.discAvailableSize = 5;
    EXPECT_FALSE(zav::read_disc_status(3, info));
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_COMPLETE, 1000, 5);
    EXPECT_TRUE(zav::read_disc_status(0x0D, info));
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_APPENDABLE, 1000, 5);
}

TEST_F(Media, AppendableCdHasWhatItsSessionsLeave) {
    info.discTotalSize = 719698;
    read(zav::read_session_offsets, "0,11702\n");
    EXPECT_EQ(info.discAvailableSize, 719698 - 2 * 11702 - 13800);
    EXPECT_EQ(info.discState, ZAV_DISC_STATE_UNKNOWN);
}

TEST_F(Media, CdWithoutASecondOffsetIsInAnUnknownState) {
    for (const std::string line : {"0\n", "\n", "0,\n", "0,x\n", "0,-4\n", "0,4000000000\n"}) {
        info = {ZAV_EVENT_DISC, ZAV_CD_R, ZAV_DISC_APPENDABLE, 1000, 0};
        read(zav::read_session_offsets, line);
        expect(ZAV_CD_R, ZAV_DISC_STATE_UNKNOWN, 1000, 0);
    }
}

TEST_F(Media, DiscThatIsWrittenOverHasWhatItsFileSystemLeaves) {
    info = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE, 4590000, 0};
    read(zav::read_used_space, "1000\t/media/cdrom\n");
    expect(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE, 4590000, 4589000);
}

TEST_F(Media, DiscWhoseUseIsNotToldIsInAnUnknownState) {
    for (const std::string line : {"\n", "x\n"}) {
        info = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE, 4590000, 7};
        read(zav::read_used_space, line);
        expect(ZAV_DVD_PLUS_RW, ZAV_DISC_STATE_UNKNOWN, 4590000, 7);
    }
}

} // namespace
