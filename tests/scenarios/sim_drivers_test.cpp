// The preloaded shim, as a program of either word size meets it.
#include "sim_runner.hpp"

#include <gtest/gtest.h>

namespace {

// On a compiler without 32-bit support only the program's own word size is there to be tried.
std::vector<std::string> probes() {
    std::vector<std::string> list = {SIM_PROBE};
    if (std::string(SIM_PROBE32) != "")
        list.emplace_back(SIM_PROBE32);
    return list;
}

class Shim : public testing::TestWithParam<std::string> {
  protected:
    static Outcome probe(const std::vector<std::string> &words,
                         std::vector<std::string> options = {}) {
        options.insert(options.end(), {"--", GetParam()});
        options.insert(options.end(), words.begin(), words.end());
        return zavsim(options);
    }
};

TEST_P(Shim, ShortensEverySleepByTheTimeScale) {
    const Outcome run = probe({"sleep"}, {"--time-scale", "20"});
    EXPECT_EQ(run.err, "");
    const double seconds = std::stod(run.out);
    EXPECT_GE(seconds, 4.0 / 20);
    EXPECT_LT(seconds, 4.0); // what they take on a clock that is not scaled
}

TEST_P(Shim, LeavesTimeAloneWithoutAScale) {
    EXPECT_GE(std::stod(probe({"sleep"}).out), 3.99);
}

TEST_P(Shim, GivesADeviceToOneHolderAtATime) {
    for (const char *device : {"/dev/zavevent0", "/dev/zavledevent"})
        EXPECT_EQ(probe({"exclusive", device}).out,
                  "first ok\nsecond Device or resource busy\nafter closing ok\n");
}

TEST_P(Shim, QueuesSixtyFourEventsInOrder) {
    EXPECT_EQ(probe({"queue", "/dev/zavevent0", "872"}).out,
              "empty Resource temporarily unavailable\nput 64, then Cannot allocate memory\n"
              "taken in order 64\nthen Resource temporarily unavailable\n");
}

TEST_P(Shim, QueuesLedEventsOfTwelveBytes) {
    EXPECT_EQ(probe({"queue", "/dev/zavledevent", "12"}).out,
              "empty Resource temporarily unavailable\nput 64, then Cannot allocate memory\n"
              "taken in order 64\nthen Resource temporarily unavailable\n");
}

TEST_P(Shim, CountsAndTakesPrivateEvents) {
    EXPECT_EQ(probe({"private"}).out, "count ok 0\ntake Resource temporarily unavailable 0\n");
    const Outcome run = on_appliance(
        "head -c 1744 /dev/zero | tr '\\0' '\\7' > /run/zavsim/queues/private-events; " +
        GetParam() + " private");
    EXPECT_EQ(run.out, "count ok 2\ntake ok 7\n");
}

std::string four_times(const std::string &line) {
    return line + line + line + line;
}

TEST_P(Shim, GivesAMountedVolumesOwnNumbers) {
    EXPECT_EQ(probe({"statfs", "/mnt/internal/data1-2"}).out, four_times("ok 56037 56023 51437\n"));
    const Outcome run = on_appliance("zavsim act volume 1-2 fills 95%; mkdir "
                                     "/mnt/internal/data1-2/deep; ln -s /mnt/internal /tmp/way; " +
                                     GetParam() + " statfs /tmp/way/data1-2/deep");
    EXPECT_EQ(run.out, four_times("ok 56037 7387 2801\n"));
}

TEST_P(Shim, GivesThePlainDirectorysNumbersOfAVolumeThatIsNotMounted) {
    const std::string probe = GetParam() + " statfs ";
    const Outcome run = on_appliance("cut -d ' ' -f 2 <<< \"$(" + probe + "/mnt)\" > /tmp/below; " +
                                     "umount /mnt/internal/data1-2; cut -d ' ' -f 2 <<< \"$(" +
                                     probe + "/mnt/internal/data1-2)\" | cmp - /tmp/below && " +
                                     "grep -c 56037 /tmp/below; " + probe + "/no/such | head -n 1");
    EXPECT_EQ(run.out, "0\nNo such file or directory 0 0 0\n");
}

TEST_P(Shim, IsNotThereInABareRoot) {
    const Outcome run = probe({"exclusive", "/dev/zavevent0"}, {"--bare"});
    EXPECT_EQ(run.out.rfind("first No such file or directory\n", 0), 0U) << run.out;
}

INSTANTIATE_TEST_SUITE_P(WordSizes, Shim, testing::ValuesIn(probes()),
                         [](const testing::TestParamInfo<std::string> &each) {
                             return each.index == 0 ? "native" : "bits32";
                         });

} // namespace
