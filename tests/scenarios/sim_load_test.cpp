// Load of the appliance's own computer in the model.
#include "sim_machines.hpp"

#include "model/advance.hpp"
#include "model/json.hpp"
#include "model/load.hpp"
#include "model/sentences.hpp"
#include "model/texts_volumes.hpp"

#include <gtest/gtest.h>
#include <sstream>

using namespace zavsim;

namespace {

struct Ticks {
    long user = 0;
    long nice = 0;
    long system = 0;
    long idle = 0;
    long busy() const { return user + nice + system; }
};

Ticks ticks_of(const State &state) {
    std::istringstream in(stat_text(state));
    std::string word;
    Ticks ticks;
    in >> word >> ticks.user >> ticks.nice >> ticks.system >> ticks.idle;
    EXPECT_EQ(word, "cpu");
    return ticks;
}

// Percent of the time in which the processor worked, over ten seconds.
double measured_load(State state) {
    const Ticks before = ticks_of(state);
    advance(state, state.now + 10);
    const Ticks later = ticks_of(state);
    const long busy = later.busy() - before.busy();
    return 100.0 * static_cast<double>(busy) / static_cast<double>(busy + later.idle - before.idle);
}

std::string line_of(const std::string &text, const std::string &beginning) {
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        if (line.rfind(beginning, 0) == 0)
            return line;
    return {};
}

TEST(Load, CountsAHundredTicksASecond) {
    State state = four_disks();
    const Ticks before = ticks_of(state);
    advance(state, 10);
    const Ticks later = ticks_of(state);
    EXPECT_NEAR(static_cast<double>(later.busy() + later.idle - before.busy() - before.idle), 1000,
                3);
}

TEST(Load, OfTheProcessorIsLowAtFirst) {
    EXPECT_NEAR(measured_load(four_disks()), 3, 0.5);
}

TEST(Load, OfTheProcessorIsWhatASentenceSays) {
    EXPECT_NEAR(measured_load(after(four_disks(), {"processor load 97%"})), 97, 0.5);
    EXPECT_NEAR(measured_load(after(four_disks(), {"processor load 100%"})), 100, 0.1);
    EXPECT_NEAR(measured_load(after(four_disks(), {"processor load 0%"})), 0, 0.1);
}

TEST(Load, ThatChangesCountsFromThenOn) {
    State state = four_disks();
    state.scenario = parse_scenario("at 5s processor load 100%\nat 5s swap use 1%\n", "").events;
    EXPECT_NEAR(measured_load(state), 51.5, 1);
}

TEST(Load, OfSwapIsWhatASentenceSays) {
    EXPECT_EQ(line_of(meminfo_text(four_disks()), "SwapFree:"), "SwapFree:        2000000 kB");
    const std::string text = meminfo_text(after(four_disks(), {"swap use 12%"}));
    EXPECT_EQ(line_of(text, "SwapTotal:"), "SwapTotal:       2000000 kB");
    EXPECT_EQ(line_of(text, "SwapFree:"), "SwapFree:        1760000 kB");
}

TEST(FileSystems, OfTheApplianceAreMounted) {
    const std::string mounts = mtab_text(four_disks());
    for (const char *path : {"/", "/etc/Kiru", "/var", "/tmp", "/mnt/buffer"})
        EXPECT_NE(mounts.find(std::string(" ") + path + " "), std::string::npos) << path;
}

TEST(FileSystems, FillAsASentenceSays) {
    const State state =
        after(four_disks(), {"file system /var fills 96%", "file system / fills 100%"});
    const std::string list = file_systems_text(state);
    EXPECT_EQ(line_of(list, "/var "), "/var 1024 4000000 160000 160000");
    EXPECT_EQ(line_of(list, "/ "), "/ 1024 4000000 0 0");
    EXPECT_EQ(line_of(list, "/tmp "), line_of(file_systems_text(four_disks()), "/tmp "));
}

TEST(FileSystems, AreListedBehindTheVolumesThatMayLieInThem) {
    const std::string list = file_systems_text(four_disks());
    EXPECT_LT(list.find("/mnt/internal/data1-1 "), list.find("/mnt/buffer "));
    EXPECT_LT(list.find("/var "), list.find("\n/ "));
}

TEST(Load, IsKeptInTheStateFile) {
    State state = after(four_disks(), {"processor load 50%", "swap use 3%"});
    advance(state, 7);
    EXPECT_EQ(to_text(state_from_text(to_text(state))), to_text(state));
}

TEST(LoadSentences, TellWhatTheyWant) {
    EXPECT_EQ(parse_sentence("file system /home fills 3%").error,
              "file system wants one of: /, /etc/Kiru, /var, /tmp, /mnt/buffer");
    EXPECT_EQ(parse_sentence("file system /var fills 101%").error,
              "file system /var fills N% (0 to 100)");
    EXPECT_EQ(parse_sentence("processor load 97").error, "processor load N% (0 to 100)");
    EXPECT_EQ(parse_sentence("swap load 97%").error, "swap use N% (0 to 100)");
}

TEST(LoadSentences, RefuseWhatTheyDoNotMean) {
    for (const char *text :
         {"file", "file system", "file system /var", "file /var fills 3%", "file system /var fills",
          "file system /var fills 3% now", "processor", "processor load", "processor load high",
          "processor load 101%", "swap", "swap use", "swap use 12"})
        EXPECT_NE(parse_sentence(text).error, "") << text;
}

} // namespace
