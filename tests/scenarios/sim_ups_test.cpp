// The UPS in the model: its daemon's status, the hook's word of power events, its charge.
#include "sim_machines.hpp"

#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/json.hpp"
#include "model/sentences.hpp"
#include "model/ups.hpp"

#include <gtest/gtest.h>
#include <sstream>

using namespace zavsim;

namespace {

State later(State state, double seconds) {
    advance(state, state.now + seconds);
    return state;
}

// The text behind "KEY : ".
std::string told(const State &state, const std::string &key) {
    std::istringstream in(ups_status_text(state));
    for (std::string line; std::getline(in, line);)
        if (line.rfind(key, 0) == 0)
            return line.substr(line.find(": ") + 2);
    return "nothing";
}

TEST(Ups, IsOnlineAndFullAtFirst) {
    const State state = four_disks();
    EXPECT_EQ(told(state, "STATUS"), "ONLINE ");
    EXPECT_EQ(told(state, "LINEV"), "230.0 Volts");
    EXPECT_EQ(told(state, "LOADPCT"), " 12.0 Percent");
    EXPECT_EQ(told(state, "BCHARGE"), "100.0 Percent");
    EXPECT_EQ(told(state, "TIMELEFT"), " 42.0 Minutes");
    EXPECT_EQ(ups_event_text(state), "");
}

TEST(Ups, TellsTheLengthOfItsStatusInTheFirstLine) {
    for (const State &state : {four_disks(), later(after(four_disks(), {"power fails"}), 300)}) {
        const std::string text = ups_status_text(state);
        int lines = 0;
        int bytes = 0;
        ASSERT_EQ(sscanf(text.c_str(), "APC      : 001,%d,%d\n", &lines, &bytes), 2);
        EXPECT_EQ(lines, std::count(text.begin(), text.end(), '\n'));
        EXPECT_EQ(bytes, static_cast<int>(text.size()));
    }
}

TEST(Ups, WritesItsStatusEveryMinute) {
    const State first = four_disks();
    EXPECT_EQ(later(first, 59).ups.statuses, first.ups.statuses);
    EXPECT_EQ(later(first, 60).ups.statuses, first.ups.statuses + 1);
    EXPECT_EQ(later(first, 601).ups.statuses, first.ups.statuses + 10);
    EXPECT_EQ(told(first, "DATE"), "Mon Mar 14 08:00:00 2011");
    EXPECT_EQ(told(later(first, 601), "DATE"), "Mon Mar 14 08:10:00 2011");
}

TEST(Ups, WritesItsStatusEveryMinuteOfItsReadersToo) {
    State slow = four_disks();
    slow.time_scale = 0.1;
    EXPECT_EQ(later(slow, 6).ups.statuses, slow.ups.statuses + 1);
}

TEST(Ups, TellsAPowerCutAtOnceByTheHookAndLaterInItsStatus) {
    const State cut = after(later(four_disks(), 30), {"power fails"});
    EXPECT_EQ(ups_event_text(cut), "5 100.0\n");
    EXPECT_EQ(told(cut, "STATUS"), "ONLINE ");
    const State written = later(cut, 30);
    EXPECT_EQ(told(written, "STATUS"), "ONBATT ");
    EXPECT_EQ(told(written, "LINEV"), "000.0 Volts");
    EXPECT_EQ(told(written, "BCHARGE"), "097.0 Percent");
}

TEST(Ups, LosesAPercentInTenSecondsAndGetsItBackInThirty) {
    State state = after(four_disks(), {"power fails"});
    EXPECT_DOUBLE_EQ(charge_of(later(state, 100)), 90);
    EXPECT_DOUBLE_EQ(charge_of(later(state, 5000)), 0);
    state = after(later(state, 100), {"power returns"});
    EXPECT_EQ(ups_event_text(state), "7 90.0\n");
    EXPECT_DOUBLE_EQ(charge_of(later(state, 60)), 92);
    EXPECT_DOUBLE_EQ(charge_of(later(state, 5000)), 100);
}

TEST(Ups, HasAnEventForEachChangeOfPowerOnly) {
    State state = after(four_disks(), {"power fails"});
    EXPECT_EQ(perform_sentence(state, "power fails"), "the power has failed already");
    EXPECT_EQ(state.ups.events, 1);
    state = after(state, {"power returns"});
    EXPECT_EQ(perform_sentence(state, "power returns"), "the power is there");
    EXPECT_EQ(state.ups.events, 2);
}

TEST(Ups, WritesNoStatusWhileItIsSilent) {
    const State silent = after(four_disks(), {"ups is silent"});
    EXPECT_EQ(later(silent, 600).ups.statuses, silent.ups.statuses);
    const State again = after(later(silent, 600), {"ups works again"});
    EXPECT_EQ(again.ups.statuses, silent.ups.statuses + 1);
    EXPECT_EQ(told(again, "DATE"), "Mon Mar 14 08:10:00 2011");
}

TEST(Ups, IsKeptInTheStateFile) {
    const State state = later(after(four_disks(), {"power fails"}), 77);
    EXPECT_EQ(to_text(state_from_text(to_text(state))), to_text(state));
}

TEST(UpsSentences, RefuseWhatTheyDoNotMean) {
    for (const char *text : {"power", "power is off", "power fails now", "ups", "ups is",
                             "ups is loud", "ups works", "ups 1 is silent"})
        EXPECT_NE(parse_sentence(text).error, "") << text;
}

} // namespace
