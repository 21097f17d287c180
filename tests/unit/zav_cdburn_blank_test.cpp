// Erasing and formatting.
#include "cdburn.h"

namespace {

using namespace cdburn;

class Blanking : public Drive {
  protected:
    Blanking() { record().thread_code = 0; }

    static int blank() {
        record().steps.clear();
        record().threads.clear();
        return checked(zavCDBlank);
    }
    static int format() {
        record().steps.clear();
        return checked(zavCDFormat);
    }

    // The course of the simulator that was started: its updates and the last percentage.
    static std::pair<size_t, std::string> course() {
        EXPECT_EQ(record().threads.size(), 1U);
        record().sleeps.clear();
        std::string last;
        record().during_sleep = [&last](size_t) { last = get("/tmp/progress.outfile"); };
        if (!record().threads.empty())
            run_detached(record().threads[0]);
        record().during_sleep = nullptr;
        return {record().sleeps.size(), last};
    }
    // In a thread of its own, since the body detaches the one that it runs in.
    static void run_detached(void *(*body)(void *)) {
        record().thread_code.reset();
        static pthread_mutex_t running = PTHREAD_MUTEX_INITIALIZER;
        static pthread_cond_t ended = PTHREAD_COND_INITIALIZER;
        static bool has_ended;
        static void *(*the_body)(void *);
        has_ended = false;
        the_body = body;
        pthread_t thread = {};
        ASSERT_EQ(pthread_create(
                      &thread, nullptr,
                      [](void *) -> void * {
                          the_body(nullptr);
                          pthread_mutex_lock(&running);
                          has_ended = true;
                          pthread_cond_signal(&ended);
                          pthread_mutex_unlock(&running);
                          return nullptr;
                      },
                      nullptr),
                  0);
        pthread_mutex_lock(&running);
        while (!has_ended)
            pthread_cond_wait(&ended, &running);
        pthread_mutex_unlock(&running);
    }

    static Lines begin(const Lines &more = {}) { return joined(joined({kBegin}, query()), more); }
    static constexpr const char *kFullFormat = "dvd+rw-format /dev/scd0 -force=full &>/dev/null";
    static constexpr const char *kEmptyFileSystem =
        "growisofs  -use-the-force-luke=notray -Z /dev/scd0 -R -J -f /tmp/linkDir &>/dev/null";
    static constexpr const char *kBlankCd =
        "cdrecord dev=/dev/scd0 -v -gracetime=3 -blank=fast &>/dev/null";
    static Lines emptied() {
        return {"mkdir -p /tmp/linkDir", kEmptyFileSystem, "sleep 3", kCleanUp};
    }
    static void used() { record().shell->first("du -sL /media", prints("5\n")); }
};

TEST_F(Blanking, BlanksACdQuickly) {
    cd(2, kCdRw);
    EXPECT_EQ(blank(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, begin({kAtip, kBlankCd, kCleanUp}));
    EXPECT_EQ(get("/tmp/progress.outfile"), "100");
    EXPECT_EQ(course(), (std::pair<size_t, std::string>{
                            24, "0% done, estimate finish\n92% done, estimate finish\n"}));
}

TEST_F(Blanking, TellsACdThatCannotBeBlanked) {
    cd(2, kCdRw);
    fails("-blank=fast");
    EXPECT_EQ(blank(), ZAV_RC_ERR_BLANK);
    EXPECT_EQ(record().steps, begin({kAtip, kBlankCd, kCleanUp}));
    EXPECT_EQ(get("/tmp/progress.outfile"), "");
}

TEST_F(Blanking, WritesAnEmptyFileSystemOverADvd) {
    used();
    for (const auto &[media, state] :
         {std::pair{"1Ah, DVD+RW", "complete"}, std::pair{"1Ah, DVD+RW", "appendable"},
          std::pair{"13h, DVD-RW Restricted Overwrite", "complete"}}) {
        dvd(media, state);
        record().thread_code = 0;
        EXPECT_EQ(blank(), ZAV_RC_OK);
        EXPECT_EQ(record().steps, begin(joined({kUsed}, emptied())));
        EXPECT_EQ(get("/tmp/progress.outfile"), "100");
        EXPECT_EQ(course(), (std::pair<size_t, std::string>{
                                9, "0% done, estimate finish\n80% done, estimate finish\n"}));
    }
}

TEST_F(Blanking, FormatsADvdThatIsNotComplete) {
    used();
    dvd("13h, DVD-RW Restricted Overwrite", "appendable");
    EXPECT_EQ(blank(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, begin(joined({kUsed, kFullFormat, "sleep 2"}, emptied())));
    EXPECT_EQ(course(), (std::pair<size_t, std::string>{
                            96, "0% done, estimate finish\n95% done, estimate finish\n"}));
}

TEST_F(Blanking, FormatsASequentialDvdEvenIfItReadsAsBlank) {
    for (const char *state : {"blank", "complete", "appendable"}) {
        dvd("14h, DVD-RW Sequential", state);
        EXPECT_EQ(blank(), ZAV_RC_OK);
        EXPECT_EQ(record().steps, begin(joined({kFullFormat, "sleep 2"}, emptied())));
        EXPECT_EQ(record().threads.size(), 1U);
    }
}

TEST_F(Blanking, TellsAFormatThatFails) {
    dvd("14h, DVD-RW Sequential", "blank");
    fails("dvd+rw-format");
    EXPECT_EQ(blank(), ZAV_RC_ERR_BLANK);
    EXPECT_EQ(record().steps, begin({kFullFormat, kCleanUp}));
}

TEST_F(Blanking, TellsAnEmptyFileSystemThatFails) {
    used();
    dvd("1Ah, DVD+RW", "complete");
    fails("growisofs");
    EXPECT_EQ(blank(), ZAV_RC_ERR_BLANK);
    EXPECT_EQ(record().steps, begin({kUsed, "mkdir -p /tmp/linkDir", kEmptyFileSystem, kCleanUp}));
    fails("mkdir");
    EXPECT_EQ(blank(), ZAV_RC_ERR_BLANK);
    EXPECT_EQ(record().steps, begin({kUsed, "mkdir -p /tmp/linkDir", kCleanUp}));
}

TEST_F(Blanking, NeedsItsThread) {
    record().thread_code = EAGAIN;
    used();
    for (const auto &[media, state] : {std::pair{"1Ah, DVD+RW", "complete"},
                                       std::pair{"13h, DVD-RW Restricted Overwrite", "appendable"},
                                       std::pair{"14h, DVD-RW Sequential", "blank"}}) {
        dvd(media, state);
        EXPECT_EQ(blank(), ZAV_RC_ERR_BLANK);
        EXPECT_EQ(record().steps.back(),
                  std::string(media).find("Sequential") == std::string::npos ? kUsed : query()[2]);
    }
    cd(2, kCdRw);
    EXPECT_EQ(blank(), ZAV_RC_ERR_BLANK);
    EXPECT_EQ(record().steps.back(), kAtip);
}

TEST_F(Blanking, LeavesABlankDiscAsItIs) {
    used();
    for (const char *media : {"1Ah, DVD+RW", "13h, DVD-RW Restricted Overwrite"}) {
        dvd(media, "blank");
        EXPECT_EQ(blank(), ZAV_RC_OK);
        EXPECT_EQ(record().steps, begin({kUsed}));
    }
    cd(0, kCdRw);
    EXPECT_EQ(blank(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, begin({kAtip}));
    EXPECT_TRUE(record().threads.empty());
}

TEST_F(Blanking, RefusesDiscsThatAreWrittenOnce) {
    for (const char *state : {"blank", "complete", "appendable"})
        for (const char *media :
             {"11h, DVD-R Sequential", "1Bh, DVD+R", "2Bh, DVD+R Double Layer"}) {
            dvd(media, state);
            EXPECT_EQ(blank(), ZAV_RC_ERR_BADDISC) << media << state;
        }
    for (const int status : {0, 2, 3}) {
        cd(status, kCdR);
        EXPECT_EQ(blank(), ZAV_RC_ERR_BADDISC);
    }
    EXPECT_TRUE(record().threads.empty());
}

TEST_F(Blanking, RefusesDiscsThatCannotBeWritten) {
    for (const char *media : {"10h, DVD-ROM", "12h, DVD-RAM", "99h, unheard of"}) {
        dvd(media, "complete");
        EXPECT_EQ(blank(), ZAV_RC_ERR_BADDISC) << media;
    }
    no_dvd(":-( no media mounted, exiting...");
    EXPECT_EQ(blank(), ZAV_RC_ERR_NODISC);
}

TEST_F(Blanking, TakesABlankDiscOfOtherKindsForDone) {
    for (const char *media : {"10h, DVD-ROM", "12h, DVD-RAM", "99h, unheard of"}) {
        dvd(media, "blank");
        EXPECT_EQ(blank(), ZAV_RC_OK) << media;
    }
}

TEST_F(Blanking, RefusesRewritableDvdsInAComboDrive) {
    combo_drive();
    used();
    for (const char *media : {"10h, DVD-ROM", "13h, DVD-RW Restricted Overwrite",
                              "14h, DVD-RW Sequential", "1Ah, DVD+RW"}) {
        dvd(media, "blank");
        EXPECT_EQ(blank(), ZAV_RC_ERR_BADDISC) << media;
    }
    cd(2, kCdRw);
    EXPECT_EQ(blank(), ZAV_RC_OK);
}

TEST_F(Blanking, NeedsTheProgressFileAndTheDisc) {
    put("/tmp/dvd.outfile", "");
    EXPECT_EQ(blank(), ZAV_RC_ERR);
    EXPECT_EQ(record().steps, begin());
    fails(kBegin);
    EXPECT_EQ(blank(), ZAV_RC_ERR);
    EXPECT_EQ(record().steps, Lines{kBegin});
}

constexpr const char *kPacketSetup = "pktsetup pktcdvd0 /dev/scd0 &>/dev/null";

TEST_F(Blanking, FormatsADvdForPacketWriting) {
    used();
    dvd("1Ah, DVD+RW", "complete");
    const Lines all =
        joined(query(), {kUsed, kPacketSetup, "mkudffs /dev/pktcdvd/pktcdvd0 &>/dev/null"});
    EXPECT_EQ(format(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, all);
    fails("mkudffs");
    EXPECT_EQ(format(), ZAV_RC_ERR_FORMAT);
    EXPECT_EQ(record().steps, all);
    EXPECT_FALSE(exists("/tmp/progress.outfile"));
}

TEST_F(Blanking, FormatsACdForPacketWriting) {
    cd(2, kCdRw);
    const Lines all =
        joined(query(), {kAtip, kPacketSetup, "cdrwtool -d /dev/scd0 -q &>/dev/null"});
    EXPECT_EQ(format(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, all);
    fails("cdrwtool");
    EXPECT_EQ(format(), ZAV_RC_ERR_FORMAT);
    EXPECT_EQ(record().steps, joined(all, {kCleanUp}));
}

TEST_F(Blanking, FormatsNoOtherDisc) {
    for (const char *media : {"1Bh, DVD+R", "14h, DVD-RW Sequential", "10h, DVD-ROM"}) {
        dvd(media, "blank");
        EXPECT_EQ(format(), ZAV_RC_ERR_BADDISC) << media;
        EXPECT_EQ(record().steps, joined(query(), {kPacketSetup}));
    }
    no_dvd(":-( no media mounted, exiting...");
    EXPECT_EQ(format(), ZAV_RC_ERR_BADDISC);
}

TEST_F(Blanking, NeedsThePacketDevice) {
    dvd("1Bh, DVD+R", "blank");
    fails("pktsetup");
    EXPECT_EQ(format(), ZAV_RC_ERR_PKTSETUP);
    EXPECT_EQ(record().steps, joined(query(), {kPacketSetup, kCleanUp}));
    put("/tmp/dvd.outfile", "");
    EXPECT_EQ(format(), ZAV_RC_ERR);
}

} // namespace
