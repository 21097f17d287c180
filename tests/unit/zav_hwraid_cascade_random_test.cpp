// Thousands of cascades, sound and damaged, against a second way to number them.
#include "storage/zav_hwraid_cascade.h"
#include "zav_api.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace {

using Random = std::mt19937;

int below(Random &random, int limit) {
    return static_cast<int>(random() % static_cast<unsigned>(limit));
}

const std::string kNoLink = "0000000000000000";

struct Expander {
    std::string digits; // sixteen
    std::string upper = kNoLink;
    std::string lower = kNoLink;
    bool at_controller = false;
};

std::string digits_of(int i) {
    return "5001B4D5008FF0" + std::to_string(10 + i);
}

// Up to eight expanders. Links lead to others, to nothing, back into a loop, or to a stranger.
std::vector<Expander> cascade(Random &random) {
    std::vector<Expander> expanders(static_cast<size_t>(below(random, 9)));
    const int count = static_cast<int>(expanders.size());
    const bool wild = below(random, 2) == 0;
    int next = 1;
    for (int i = 0; i < count; ++i) {
        Expander &expander = expanders[static_cast<size_t>(i)];
        expander.digits = digits_of(i);
        for (std::string *link : {&expander.upper, &expander.lower}) {
            if (wild && below(random, 2) == 0)
                *link = digits_of(below(random, count + 1));
            else if (!wild && next < count && below(random, 4) != 0)
                *link = digits_of(next++);
        }
    }
    if (!expanders.empty() && below(random, 10) != 0)
        expanders.front().at_controller = true;
    if (wild)
        std::shuffle(expanders.begin(), expanders.end(), random);
    return expanders;
}

std::vector<std::string> lines_of(const Expander &expander) {
    return {"  phy   0:D:attached:[" + expander.digits + "800:00]\n",
            "  phy   1:S:attached:[" + kNoLink + ":00]\n",
            "  phy   4:S:attached:[500605B000C7F540:02  " +
                std::string(expander.at_controller ? "i(SSP+STP+SMP)" : "t(SMP)") + "]\n",
            "  phy   8:S:attached:[" + expander.lower + ":02]\n",
            "  phy  10:S:attached:[" + expander.upper + ":02]\n"};
}

// From the top, level by level; a place that comes later wins, as the upper branch is walked to its
// end before the lower one.
using Places = std::map<std::string, int>; // by the digits

void place(const std::vector<Expander> &known, Places &places, const std::string &digits, int id) {
    if (id > 7 || digits == kNoLink)
        return;
    for (const Expander &expander : known) {
        if (expander.digits != digits)
            continue;
        places[digits] = id;
        place(known, places, expander.upper, 2 * id);
        place(known, places, expander.lower, 2 * id + 1);
        return;
    }
}

Places places_of(std::vector<Expander> expanders) {
    if (expanders.size() > 7)
        expanders.resize(7);
    Places places;
    for (const Expander &expander : expanders)
        if (expander.at_controller)
            place(expanders, places, expander.digits, 1);
    return places;
}

TEST(RandomCascades, AreNumberedByTheirPlaces) {
    Random random(20'261'121);
    int units = 0;
    for (int i = 0; i < 10'000; ++i) {
        const std::vector<Expander> expanders = cascade(random);
        zav::Cascade read;
        std::string text;
        for (const Expander &expander : expanders)
            for (const std::string &line : lines_of(expander)) {
                ASSERT_TRUE(read.take(line.c_str()));
                text += line;
            }
        EXPECT_EQ(SetRBODID(read.expanders, nullptr, 0), 0);

        const Places places = places_of(expanders);
        for (const sExpander &expander : read.expanders) {
            const std::string digits = std::string(expander.sasaddr).substr(0, 16);
            const auto found = places.find(digits);
            ASSERT_EQ(expander.id, found == places.end() ? 0 : found->second) << digits << "\n"
                                                                              << text;
            units += expander.id != 0 ? 1 : 0;
        }
    }
    EXPECT_GT(units, 20'000) << "the generator makes cascades of several units";
}

} // namespace
