// Erasing discs, and formatting them for packet writing.
#include "run.h"

TEST(RunBlank, ARewritableCdIsErased) {
    const Outcome run = on_zav("zavsim act drive gets complete CD-RW with 100 MB used; "
                               "zavctl disc blank --yes --json");
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    EXPECT_EQ(parsed(run.out)["outcome"]["outcome"], "done");
    EXPECT_EQ(parsed(run.out)["disc"]["state"], "blank");
}

TEST(RunBlank, ARewritableDvdGetsAnEmptyFileSystem) {
    const Outcome run = on_zav("zavsim act drive gets complete DVD+RW with 3000 MB used; "
                               "zavctl disc blank --yes --json");
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    const nlohmann::json disc = parsed(run.out)["disc"];
    EXPECT_GT(disc["free_kib"].get<int>(), disc["total_kib"].get<int>() - 2000) << disc;
}

TEST(RunBlank, ABlankDiscIsLeftAlone) {
    const Outcome run = on_zav("zavsim act drive gets blank CD-RW; zavctl disc blank");
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_TRUE(holds(run.out, "OK: the disc is blank already")) << run.out;
}

TEST(RunBlank, AWriteOnceDiscIsRefused) {
    const Outcome run = on_zav("zavsim act drive gets complete CD-R with 100 MB used; "
                               "zavctl disc blank --yes");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "it cannot be erased: CD-R, complete")) << run.out;
}

TEST(RunBlank, AnInterruptStopsIt) {
    const Outcome run = on_zav(
        "zavsim act drive gets complete DVD-RW sequential with 100 MB used; zavctl disc "
        "blank --yes >out 2>err & pid=$!; until zavctl disc progress | grep -q dvd+rw-format "
        "|| ! kill -0 $pid; do sleep 5; done; kill -TERM $pid; wait $pid; status=$?; "
        "cat out; exit $status");
    EXPECT_EQ(run.status, 2) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "the erasing was stopped; the disc is DVD-RW ")) << run.out;
}

TEST(RunBlank, AFailureIsTold) {
    const Outcome run = on_zav("zavsim act drive gets complete DVD+RW with 100 MB used; zavsim act "
                               "tool growisofs exits 5; zavctl disc blank --yes --json");
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(parsed(run.out)["outcome"]["error"]["code"], 0x2103);
}

TEST(RunFormat, IsDoneWithoutAProgress) {
    for (const char *disc : {"complete CD-RW with 100 MB used", "blank DVD+RW"}) {
        const Outcome run = on_zav(std::string("zavsim act drive gets ") + disc +
                                   "; zavctl disc format --yes --json");
        EXPECT_EQ(run.status, 0) << run.out << run.err;
        EXPECT_EQ(parsed(run.out)["outcome"]["outcome"], "done");
        EXPECT_TRUE(holds(run.err, " s  formatting\n")) << run.err;
        EXPECT_FALSE(holds(run.err, "formatting,")) << run.err;
    }
}

// The library's cancelling does not know the tool that formats.
TEST(RunFormat, AnInterruptStopsIt) {
    const Outcome run = on_zav(
        "zavsim act drive gets blank DVD+RW; zavsim act tool mkudffs hangs 100000s; zavctl "
        "disc format --yes >out 2>err & pid=$!; until zavctl disc progress | grep -q mkudffs "
        "|| ! kill -0 $pid; do sleep 5; done; kill -TERM $pid; wait $pid; status=$?; "
        "cat out; exit $status");
    EXPECT_EQ(run.status, 2) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "the formatting was stopped; the disc is DVD+RW, ")) << run.out;
}

TEST(RunFormat, AnotherDiscIsRefused) {
    const Outcome run = on_zav("zavsim act drive gets blank DVD+R; zavctl disc format --yes");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "only a DVD+RW or a CD-RW can be formatted")) << run.out;
}

TEST(RunFormat, AFailureIsToldByItsStep) {
    const auto error = [](const std::string &tool) {
        return parsed(on_zav("zavsim act drive gets blank DVD+RW; zavsim act tool " + tool +
                             " exits 1; zavctl disc format --yes --json")
                          .out)["outcome"]["error"]["code"];
    };
    EXPECT_EQ(error("pktsetup"), 0x2102);
    EXPECT_EQ(error("mkudffs"), 0x2104);
}
