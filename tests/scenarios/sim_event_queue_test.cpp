// The event driver's queue through the library: the driver's own events, and many processes at
// once.
#include "sim_runner.hpp"

#include <gtest/gtest.h>
#include <set>
#include <sstream>

namespace {

Outcome with_probe(const std::string &script, std::vector<std::string> options = {}) {
    return on_appliance("probe=" EVENT_PROBE "\n" + script, std::move(options));
}

TEST(EventQueue, IsEmptyAtFirst) {
    EXPECT_EQ(with_probe("$probe poll; $probe private").out, "nothing\nnothing\n");
}

TEST(EventQueue, HoldsWhatTheDriverTells) {
    EXPECT_EQ(with_probe("zavsim act temperature 1 is 78; zavsim act fan 2 slows 700\n"
                         "$probe poll; $probe poll; $probe poll")
                  .out,
              "0: 12010 1 3\n0: 11010 2 2\nnothing\n");
}

TEST(EventQueue, HoldsWhatAToolDidToAnArray) {
    EXPECT_EQ(
        with_probe("mdadm /dev/md1 -f /dev/sdb2 2>/dev/null; $probe poll | cut -d ' ' -f 1-2\n"
                   "$probe poll")
            .out,
        "0: 15010\nnothing\n");
}

TEST(EventQueue, HoldsWhatASentencePuts) {
    EXPECT_EQ(with_probe("zavsim act event voltage 3; zavsim act event 'fan 1'\n"
                         "$probe poll; $probe poll")
                  .out,
              "0: 13010 3 1\n0: 11010 1 1\n");
}

TEST(EventQueue, EndsAWaitWithTheNextEvent) {
    EXPECT_EQ(
        with_probe("$probe wait & sleep 3; zavsim act fan 4 stops; wait", {"--time-scale", "20"})
            .out,
        "0: 11010 4 3\n");
}

TEST(EventQueue, GivesPrivateEventsToWhoAsksForThem) {
    EXPECT_EQ(with_probe("{ printf '\\002\\053\\000\\000\\001\\000\\000\\000'\n"
                         "  head -c 864 /dev/zero; } > /run/zavsim/queues/private-events\n"
                         "$probe poll; $probe private; $probe private")
                  .out,
              "nothing\n0: 11010 1 0\nnothing\n");
}

TEST(EventQueue, LosesWhatFindsItFullAndSaysSo) {
    EXPECT_EQ(with_probe("$probe push 1 64; zavsim act fan 1 stops\n"
                         "until grep -q 'an event about fan 1 is lost: the queue is full' "
                         "/var/log/messages; do :; done; $probe poll | cut -d ' ' -f 1-2")
                  .out,
              "0: 10010\n");
}

TEST(LedQueue, GivesAnAlarmBack) {
    EXPECT_EQ(with_probe("$probe led").out, "pending 1201\nalarm 0\npoll 0: 1 2 3\n");
}

struct Taken {
    std::set<std::string> numbers;
    int lines = 0;
};

Taken taken_of(const std::string &text) {
    Taken taken;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line); ++taken.lines)
        taken.numbers.insert(line);
    return taken;
}

// Some put events, some take them, all at once; whoever is refused tries again.
Taken exchange(int pushers, int takers, int count) {
    const Outcome run =
        with_probe("for taker in $(seq " + std::to_string(takers) +
                   "); do $probe take > /tmp/taken.$taker 2>/dev/null & done\n"
                   "for who in $(seq " +
                   std::to_string(pushers) + "); do $probe push $who " + std::to_string(count) +
                   " & pushers=\"$pushers $!\"; done; wait $pushers\n"
                   "for taker in $(seq " +
                   std::to_string(takers) + "); do $probe end; done; wait; cat /tmp/taken.*");
    EXPECT_EQ(run.status, 0) << run.err;
    return taken_of(run.out);
}

std::set<std::string> all_numbers(int pushers, int count) {
    std::set<std::string> numbers;
    for (int who = 1; who <= pushers; ++who)
        for (int i = 0; i < count; ++i)
            numbers.insert(std::to_string(who * 1000 + i));
    return numbers;
}

TEST(EventQueue, GivesEveryEventOfManyProcessesToOneOfThemWhole) {
    const Taken taken = exchange(3, 3, 100);
    EXPECT_EQ(taken.numbers, all_numbers(3, 100));
    EXPECT_EQ(taken.lines, 300);
}

TEST(EventQueue, KeepsUpWithMorePushersThanTakers) {
    const Taken taken = exchange(4, 1, 50);
    EXPECT_EQ(taken.numbers, all_numbers(4, 50));
    EXPECT_EQ(taken.lines, 200);
}

} // namespace
