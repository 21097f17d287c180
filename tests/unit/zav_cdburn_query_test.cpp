// Which medium is in the drive.
#include "cdburn.h"

#include <filesystem>

namespace {

using namespace cdburn;

class DiscQuery : public Drive {
  protected:
    int ask() {
        info = {9, 9, 9, 9, 9};
        return checked([this] { return zavQueryDisc(&info, 0); });
    }
    void expect(int type, int state, int total, int available) const {
        EXPECT_EQ(info.type, ZAV_EVENT_DISC);
        EXPECT_EQ(info.discType, type);
        EXPECT_EQ(info.discState, state);
        EXPECT_EQ(info.discTotalSize, total);
        EXPECT_EQ(info.discAvailableSize, available);
    }
    void expect_untouched() const {
        EXPECT_EQ(info.type, 9);
        EXPECT_EQ(info.discAvailableSize, 9);
    }

    zavMediaInfo info = {};
};

TEST_F(DiscQuery, RefusesANullRecord) {
    EXPECT_EQ(zavQueryDisc(nullptr, 0), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(DiscQuery, FailsWithoutANodeOfTheDrive) {
    fails("ls /dev/cdrom");
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(record().commands, (Lines{query()[0], query()[1]}));
    fails("ls /dev/scd0");
    record().commands.clear();
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(record().commands, Lines{query()[0]});
    expect_untouched();
}

TEST_F(DiscQuery, ReadsADvd) {
    dvd("11h, DVD-R Sequential", "appendable", "1000*2048=2048000");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_DVD_MINUS_R_SEQ, ZAV_DISC_APPENDABLE, 4590000, 4583904);
    EXPECT_EQ(record().commands, query());
}

TEST_F(DiscQuery, TellsADriveWithoutADisc) {
    no_dvd(":-( no media mounted, exiting...");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_DISC_NONE, ZAV_DISC_STATE_UNKNOWN, 0, 0);
    EXPECT_EQ(record().commands, query());
}

TEST_F(DiscQuery, ReadsNothingOfADvdWhenTheToolFails) {
    dvd("1Bh, DVD+R", "blank");
    fails("dvd+rw-mediainfo");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0);
}

TEST_F(DiscQuery, TakesNoRefusalFromAToolThatSucceeds) {
    put("/tmp/dvd.outfile", ":-( no media mounted, exiting...\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0);
}

TEST_F(DiscQuery, LeavesTheRecordAloneWithoutAReport) {
    remove("/tmp/dvd.outfile");
    EXPECT_EQ(ask(), ZAV_RC_ERR_ENOENT);
    expect_untouched();
    EXPECT_EQ(record().commands, joined(query(), {kCleanUp}));
    put("/tmp/dvd.outfile", "");
    record().commands.clear();
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    expect_untouched();
    EXPECT_EQ(record().commands, query());
}

TEST_F(DiscQuery, DoesNotFollowALinkInPlaceOfAReport) {
    put("/scratch/planted", " Mounted Media:         10h, DVD-ROM\n");
    remove("/tmp/dvd.outfile");
    std::filesystem::create_symlink("/scratch/planted", "/tmp/dvd.outfile");
    EXPECT_EQ(ask(), ZAV_RC_ERR_ENOENT);
    expect_untouched();
}

TEST_F(DiscQuery, ReadsAReportInPiecesOf79Characters) {
    put("/tmp/dvd.outfile", std::string(79, 'x') + " Disc status:           blank\n" +
                                std::string(70, 'x') + " Disc status:           complete\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.discState, ZAV_DISC_BLANK);
}

TEST_F(DiscQuery, ReadsABlankCd) {
    cd(0, kCdR);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_CD_R, ZAV_DISC_BLANK, 719698, 719698);
    EXPECT_EQ(record().commands, joined(query(), {kAtip}));
}

TEST_F(DiscQuery, AsksTheDriveForDiscInformation) {
    cd(2, kCdRw);
    record().drive = [](unsigned long request, void *argument) {
        const auto *command = static_cast<cdrom_generic_command *>(argument);
        EXPECT_EQ(request, static_cast<unsigned long>(CDROM_SEND_PACKET));
        const std::vector<unsigned char> bytes(command->cmd, command->cmd + CDROM_PACKET_SIZE);
        EXPECT_EQ(bytes, (std::vector<unsigned char>{0x51, 0, 0, 0, 0, 0, 0, 0, 34, 0, 0, 0}));
        EXPECT_EQ(command->buflen, 300U);
        EXPECT_EQ(command->data_direction, CGC_DATA_READ);
        EXPECT_EQ(command->timeout, 12000);
        for (unsigned i = 0; i < command->buflen; ++i)
            EXPECT_EQ(command->buffer[i], 0);
        command->buffer[2] = 2;
        return 0;
    };
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_CD_RW, ZAV_DISC_COMPLETE, 719698, 0);
    EXPECT_EQ(record().requests.size(), 1U);
}

TEST_F(DiscQuery, ReadsAnAppendableCd) {
    cd(1, std::string(kCdR) + "0,11702\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_CD_R, ZAV_DISC_APPENDABLE, 719698, 719698 - 23404 - 13800);
    EXPECT_EQ(record().commands, joined(query(), {kAtip, kMsinfo}));
}

TEST_F(DiscQuery, ReadsTheLastLineOfTheSessions) {
    cd(1, std::string(kCdR) + "1,2\n3,4,5");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.discAvailableSize, 719698 - 8 - 13800);
}

TEST_F(DiscQuery, LeavesACdAppendableWhoseSessionsAreNotTold) {
    cd(1, kCdR);
    fails("-msinfo");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_CD_R, ZAV_DISC_APPENDABLE, 719698, 0);
}

TEST_F(DiscQuery, DoesNotKnowTheStateOfACdWithoutSessions) {
    cd(1, kCdR);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_CD_R, ZAV_DISC_STATE_UNKNOWN, 719698, 0);
}

TEST_F(DiscQuery, FailsWhenACdCannotBeRead) {
    cd(0, kCdR);
    fails("-atip", 255);
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    expect(ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0);
    EXPECT_EQ(record().commands, joined(query(), {kAtip}));
}

TEST_F(DiscQuery, FailsWithoutAReportOfTheCd) {
    cd(0, kCdR);
    remove("/tmp/cd.outfile");
    EXPECT_EQ(ask(), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().commands, joined(query(), {kAtip, kCleanUp}));
}

TEST_F(DiscQuery, FailsWithoutAReportOfTheSessions) {
    cd(1, kCdR);
    const auto answer = record().drive;
    record().drive = [answer](unsigned long request, void *argument) {
        remove("/tmp/cd.outfile");
        return answer(request, argument);
    };
    EXPECT_EQ(ask(), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().commands, joined(query(), {kAtip, kMsinfo, kCleanUp}));
}

using DiscQueryDeathTest = DiscQuery;

TEST_F(DiscQueryDeathTest, EndsTheProcessWithoutADriveToAsk) {
    cd(0, kCdR);
    remove("/dev/scd0");
    EXPECT_EXIT(zavQueryDisc(&info, 0), testing::ExitedWithCode(1), "^open: No such file");
}

TEST_F(DiscQueryDeathTest, EndsTheProcessWhenTheDriveRefuses) {
    cd(0, kCdR);
    record().drive = nullptr;
    EXPECT_EXIT(zavQueryDisc(&info, 0), testing::ExitedWithCode(1), "^ioctl!: Input/output error");
}

TEST_F(DiscQuery, AsksTheFileSystemOfADiscThatIsWrittenOver) {
    for (const char *state : {"blank", "complete", "appendable"})
        for (const char *media : {"1Ah, DVD+RW", "13h, DVD-RW Restricted Overwrite"}) {
            dvd(media, state);
            record().shell->first("du -sL", prints("1000\t/media/cdrom\n"));
            record().commands.clear();
            EXPECT_EQ(ask(), ZAV_RC_OK);
            EXPECT_EQ(info.discAvailableSize, 4589000);
            EXPECT_EQ(record().commands, joined(query(), {kUsed}));
        }
}

TEST_F(DiscQuery, HasAllTheRoomWhenTheFileSystemCannotBeAsked) {
    dvd("1Ah, DVD+RW", "complete");
    record().shell->first("du -sL", no_start());
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE, 4590000, 4590000);
}

TEST_F(DiscQuery, DoesNotKnowTheStateWhenTheFileSystemDoesNotAnswer) {
    dvd("1Ah, DVD+RW", "complete");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_DVD_PLUS_RW, ZAV_DISC_STATE_UNKNOWN, 4590000, 0);
}

} // namespace
