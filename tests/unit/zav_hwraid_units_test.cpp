// The expansion units: which there are, and how they are.
#include "harness.h"

#include <cstring>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

constexpr const char *kReport = "/etc/Kiru/zav/.raidinfo";
constexpr const char *kList = "/etc/Kiru/zav/.RBODinfo";
constexpr const char *kScript = "/usr/bin/query_sas.sh";
constexpr int kKey = 0x6912;
const std::string kNone = "0000000000000000";

// Sixteen digits that name the expander `n`.
std::string digits(int n) {
    return "5001B4D5008FF0" + std::to_string(10 + n);
}

std::string line(const std::string &phy, const std::string &address, const std::string &more = "") {
    return "  phy  " + phy + ":S:attached:[" + address + ":02  " + more + "]  6 Gbps\n";
}

// What the script prints for one expander; a neighbour 0 is none.
std::string expander(int n, int parent, int upper, int lower) {
    const auto link = [](int to) { return to == 0 ? kNone : digits(to); };
    return line(" 0", digits(n) + "800") +
           (parent == 0 ? line(" 4", "500605B000C7F540", "i(SSP+STP+SMP)")
                        : line(" 4", digits(parent))) +
           line(" 8", link(lower)) + line("10", link(upper));
}

std::string section(int unit, const std::string &monitor) {
    const std::string n = std::to_string(unit);
    return "RBOD#" + n + "\nM:HBQE-T500\nS:SN" + n + "\nI:\nR:" + n +
           ":s:1:4:1234:0\nH:" + monitor + "\n";
}

class Units : public harness::Appliance {
  protected:
    Units() { put(kReport, "PCI\nM:card\nS:C\nI:\nH:1\n"); }

    static void prints_topology(const std::string &text) { tool(kScript, text); }

    // Unit 1 with 2 and 3 below it, 5 below 2 on the lower link.
    static void cascade_of_four() {
        prints_topology("some heading\n" + expander(5, 2, 0, 0) + expander(2, 1, 0, 5) +
                        expander(1, 0, 2, 3) + expander(3, 1, 0, 0));
        put(kReport, section(1, "45:1:2:3:1.20") + section(2, "46:1:2:3:1.21") +
                         section(3, "47:1:2:3:1.22") + section(5, "48:1:2:3:1.23"));
    }

    template <class Call>
    static int checked(const Call &call) {
        const int rc = Appliance::checked(call);
        EXPECT_NE(semaphore_value(kKey), 0) << "the turn at the report has ended";
        return rc;
    }

    int discover() {
        memset(&set, 0x55, sizeof set);
        return checked([&] { return zavGetRBODSet(&set); });
    }
    const sRBOD &unit(int n) const { return set.RBOD[n - 1]; }

    void expect_absent(int n) const {
        sRBOD absent;
        memset(&absent, 0xFF, sizeof absent);
        absent.iExist = 0;
        EXPECT_EQ(memcmp(&unit(n), &absent, sizeof absent), 0) << n;
    }

    sRBODSet set = {};
};

TEST_F(Units, AreNumberedByTheirPlacesInTheCascade) {
    cascade_of_four();
    EXPECT_EQ(discover(), ZAV_RC_OK);
    for (const int n : {1, 2, 3, 5}) {
        EXPECT_EQ(unit(n).iExist, 1);
        EXPECT_EQ(unit(n).id, n);
        EXPECT_EQ(unit(n).sasaddr, digits(n) + "800");
        EXPECT_EQ(unit(n).sn, "SN" + std::to_string(n));
        EXPECT_STREQ(unit(n).model, "HBQE-T500");
        EXPECT_EQ(unit(n).parentid, n / 2);
    }
    for (const int n : {4, 6, 7})
        expect_absent(n);
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(record().commands[0], "/usr/bin/query_sas.sh");
    EXPECT_EQ(record().commands[1], "cat /etc/Kiru/zav/.raidinfo");
    EXPECT_EQ(record().commands.size(), 5U);
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(Units, HaveTheNumbersOfTheirPlacesAsNeighbours) {
    prints_topology(expander(1, 0, 2, 0) + expander(2, 1, 0, 5));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(1).parentid, 0);
    EXPECT_EQ(unit(1).upperchildid, 2);
    EXPECT_EQ(unit(1).lowerchildid, -1);
    EXPECT_EQ(unit(2).parentid, 1);
    EXPECT_EQ(unit(2).upperchildid, -1);
    EXPECT_EQ(unit(2).lowerchildid, 5) << "though nothing was found there";
    expect_absent(5);
}

TEST_F(Units, KeepTheRestOfTheRecordFilled) {
    cascade_of_four();
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(1).model[sizeof "HBQE-T500"], '\xFF');
    EXPECT_EQ(unit(1).sasaddr[19], '\0');
}

TEST_F(Units, ArePublishedInTheirOrder) {
    cascade_of_four();
    put(kList, "what was there before, and was longer than what comes now ....................\n"
               ".......................................................................\n");
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(get(kList), "1:" + digits(1) + "800\n2:" + digits(2) + "800\n3:" + digits(3) +
                              "800\n5:" + digits(5) + "800\n");
}

TEST_F(Units, AreNoneWithoutAnyAtTheController) {
    prints_topology(expander(1, 9, 2, 0) + expander(2, 1, 0, 0));
    put(kList, "1:old\n");
    EXPECT_EQ(discover(), ZAV_RC_OK);
    for (int n = 1; n <= 7; ++n)
        expect_absent(n);
    EXPECT_TRUE(exists(kList));
    EXPECT_EQ(get(kList), "");
    EXPECT_EQ(record().commands.size(), 1U);
}

TEST_F(Units, AreNoneWhereTheScriptIsMissingOrSilent) {
    EXPECT_EQ(discover(), ZAV_RC_OK);
    expect_absent(1);
    prints_topology("");
    EXPECT_EQ(discover(), ZAV_RC_OK);
    expect_absent(1);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Units, ThatUnit1DoesNotLeadToAreLeftOut) {
    prints_topology(expander(4, 9, 0, 0) + expander(1, 0, 0, 0));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(1).iExist, 1);
    for (int n = 2; n <= 7; ++n)
        expect_absent(n);
}

TEST_F(Units, BelowTheThirdLevelAreLeftOut) {
    prints_topology(expander(1, 0, 2, 0) + expander(2, 1, 4, 0) + expander(4, 2, 8, 9) +
                    expander(8, 4, 0, 0) + expander(9, 4, 0, 0));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(4).upperchildid, 8);
    EXPECT_EQ(unit(4).lowerchildid, 9);
    EXPECT_EQ(get(kList),
              "1:" + digits(1) + "800\n2:" + digits(2) + "800\n4:" + digits(4) + "800\n");
}

TEST_F(Units, ThatLoopComeToAnEnd) {
    prints_topology(expander(1, 0, 2, 1) + expander(2, 1, 1, 2));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    prints_topology(expander(1, 0, 1, 1));
    EXPECT_EQ(discover(), ZAV_RC_OK);
}

TEST_F(Units, AreSevenAtMost) {
    std::string text;
    for (int i = 10; i < 17; ++i)
        text += expander(i, 9, 0, 0);
    prints_topology(text + expander(1, 0, 0, 0) + line(" 4", kNone));
    EXPECT_EQ(discover(), ZAV_RC_OK) << "nothing of an eighth is looked at";
    expect_absent(1);
}

TEST_F(Units, NeedAnUpstreamLink) {
    cascade_of_four();
    prints_topology(expander(1, 0, 2, 0) + line(" 0", digits(2) + "800") + line(" 4", kNone) +
                    line("10", kNone));
    put(kList, "1:old\n");
    EXPECT_EQ(discover(), ZAV_RC_ERR);
    EXPECT_EQ(record().log, std::vector{row("zavGetRBODSet", 4,
                                            "[128] Error!! HBQE-T500 " + digits(2) +
                                                "800 can't get parent connection!")});
    EXPECT_EQ(get(kList), "1:old\n");
    const std::string filled(sizeof set, '\xFF');
    EXPECT_EQ(memcmp(&set, filled.data(), sizeof set), 0);
    EXPECT_EQ(record().pcloses, 1);
}

TEST_F(Units, ReadTheLinesByTheirFirstMark) {
    // A line that has the marks of two is the first of them, in this order: 0, 4, 10, 8.
    prints_topology(line(" 0", digits(1) + "800", "phy   4") +
                    line(" 4", "500605B000C7F540", "SSP+STP+SMP") + line(" 8", digits(3)) +
                    line("10", digits(2), "phy   8"));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(1).sasaddr, digits(1) + "800");
    EXPECT_EQ(unit(1).upperchildid, 2);
    EXPECT_EQ(unit(1).lowerchildid, 3);
}

TEST_F(Units, ReadOtherLinesNot) {
    prints_topology(line(" 0", digits(1) + "800") + line(" 4", "500605B000C7F540", "SSP+STP+SMP") +
                    line(" 1", kNone) + line("14", kNone) + "phy  4:S:attached:[" + kNone + "]\n" +
                    line("11", digits(9)) + "phy 10\n" + line(" 8", kNone) + line("10", kNone));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(1).iExist, 1);
    EXPECT_EQ(unit(1).upperchildid, -1);
}

TEST_F(Units, WithoutAnAddressInALineKeepAnEmptyLink) {
    // Fewer than four fields: nothing is taken from the line, and the numbering ends there.
    prints_topology(line(" 0", digits(1) + "800") + "phy   4 SSP+STP+SMP\n" +
                    "phy   8:S:attached\n" + "phy  10\n" +
                    "phy   0:x\nphy   4:S:attached:[500605B000C7F540]\nphy  10\n");
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(get(kList), "1:" + digits(1) + "800\n");
    EXPECT_EQ(unit(1).upperchildid, 2) << "an empty link is not the address of no link";
    expect_absent(2);
}

TEST_F(Units, TurnALinkIntoAnAddressByItsFirst16Digits) {
    prints_topology(line(" 0", digits(1) + "800") + line(" 4", "500605B000C7F540", "SSP+STP+SMP") +
                    line(" 8", digits(3) + "FFFF") + line("10", "500A") + expander(3, 1, 0, 0) +
                    line(" 0", "500A800") + line(" 4", digits(1)) + line("10", kNone));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(3).sasaddr, digits(3) + "800");
    EXPECT_STREQ(unit(2).sasaddr, "500A800");
}

TEST_F(Units, TakeAPercentSignAsItIs) {
    prints_topology(expander(1, 0, 0, 0));
    put(kReport, "RBOD#1\nM:%s%n%d\nS:100%\nI:\n");
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_STREQ(unit(1).model, "%s%n%d");
    EXPECT_STREQ(unit(1).sn, "100%");
}

TEST_F(Units, ThatTheReportLacksHaveNoSerialNumber) {
    prints_topology(expander(1, 0, 0, 0));
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_STREQ(unit(1).sn, "");
    EXPECT_STREQ(unit(1).model, "");
    remove(kReport);
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_STREQ(unit(1).sn, "");
}

TEST_F(Units, CannotBeFoundOutWithoutAPipe) {
    record().popen_fails = true;
    EXPECT_EQ(discover(), 32);
    const std::string filled(sizeof set, '\xFF');
    EXPECT_EQ(memcmp(&set, filled.data(), sizeof set), 0);
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(zavGetRBODSet(nullptr), ZAV_RC_ERR_EINVAL);
}

TEST_F(Units, FailWhereTheReportCannotBeRead) {
    cascade_of_four();
    put(kList, "1:old\n");
    record().semget_fails = true;
    EXPECT_EQ(discover(), ZAV_RC_ERR);
    EXPECT_EQ(record().log.back(), row("zavGetRBODSN", 1, "[3] Get Semaphore [26898] failed!!"));
    EXPECT_EQ(get(kList), "1:old\n");
    EXPECT_EQ(unit(5).iExist, 1) << "the first that the script told";
    EXPECT_EQ(unit(1).iExist, 0);
}

TEST_F(Units, ThatCannotBePublishedAreAnsweredAllTheSame) {
    cascade_of_four();
    put(std::string(kList) + "/x", "");
    EXPECT_EQ(discover(), ZAV_RC_ERR);
    EXPECT_EQ(unit(5).iExist, 1);
    EXPECT_EQ(unit(1).sn, std::string("SN1"));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Units, OfADiskThatIsFullAreAnswered) {
    cascade_of_four();
    record().fprintf_fails = true;
    EXPECT_EQ(discover(), ZAV_RC_OK);
    EXPECT_EQ(unit(5).iExist, 1);
}

// ---- The parts ----

TEST_F(Units, HaveAnAddressInTheFourthField) {
    char address[24] = "old";
    const auto address_in = [&](std::string text) {
        getsasaddr(text.data(), address);
        return std::string(address);
    };
    EXPECT_EQ(address_in("phy   4:S:attached:[500605B000C7F540:02 x]"), "500605B000C7F540");
    EXPECT_EQ(address_in("::a[]b:c]d[e"), "d") << "runs of separators count as one";
    EXPECT_EQ(address_in("a:b:c:0123456789012345678901234"), "0123456789012345678");
    EXPECT_EQ(address_in("a:b:c:d"), "d");
    for (const char *text : {"", "a:b:c", "a:b:c:", ":::", "a b c d", "a:b:c[]:"})
        EXPECT_EQ(address_in(text), "d") << text << " leaves what was there";
    char line[] = "a:b:c:d";
    getsasaddr(line, nullptr);
    getsasaddr(nullptr, address);
    EXPECT_STREQ(line, "a:b:c:d");
}

TEST_F(Units, AreNumberedFromTheOneAtTheController) {
    sExpander table[7] = {};
    table[3] = {0, 1, "A800", "", "B800", "0000000000000000"};
    table[0] = {0, 0, "B800", "", "", "C800"};
    table[6] = {0, 0, "C800", "", "0000000000000000", ""};
    EXPECT_EQ(SetRBODID(table, nullptr, 0), 0);
    EXPECT_EQ(+table[3].iExist, 1);
    EXPECT_EQ(+table[3].id, 1);
    EXPECT_EQ(+table[0].iExist, 1);
    EXPECT_EQ(+table[0].id, 2);
    EXPECT_EQ(+table[6].id, 5);
    for (const int other : {1, 2, 4, 5}) {
        EXPECT_EQ(+table[other].iExist, 0) << "an empty link leads to no empty entry";
        EXPECT_EQ(+table[other].id, 0);
    }
}

TEST_F(Units, AreNumberedFromAnAddressOn) {
    sExpander table[7] = {};
    table[1] = {0, 0, "B800", "", "C800", ""};
    table[2] = {0, 0, "C800", "", "", ""};
    char address[20] = "B800";
    EXPECT_EQ(SetRBODID(table, address, 3), 0);
    EXPECT_EQ(+table[1].id, 3);
    EXPECT_EQ(+table[2].id, 6);
    for (const int number : {8, -1, INT32_MIN, INT32_MAX}) {
        EXPECT_EQ(SetRBODID(table, address, number), 0);
        EXPECT_EQ(+table[1].id, 3) << "no number " << number;
    }
    char stranger[20] = "B80";
    EXPECT_EQ(SetRBODID(table, stranger, 2), 0);
    char none[20] = "0000000000000000";
    table[5] = {0, 0, "0000000000000000", "", "", ""};
    EXPECT_EQ(SetRBODID(table, none, 2), 0);
    EXPECT_EQ(+table[5].id, 0);
    EXPECT_EQ(SetRBODID(nullptr, address, 1), 0);
    EXPECT_EQ(SetRBODID(table, nullptr, 4), 0);
}

TEST_F(Units, FillTheirRecordFromExpanderAndReport) {
    put(kReport, section(3, "1"));
    sExpander table = {1, 3, "A800", "", "B800", "0000000000000000"};
    sRBOD unit;
    memset(&unit, 0x55, sizeof unit);
    EXPECT_EQ(checked([&] { return fillinfo(3, &table, &unit); }), ZAV_RC_OK);
    EXPECT_EQ(+unit.iExist, 1);
    EXPECT_EQ(+unit.id, 3);
    EXPECT_STREQ(unit.sasaddr, "A800");
    EXPECT_STREQ(unit.sn, "SN3");
    EXPECT_STREQ(unit.model, "HBQE-T500");
    EXPECT_EQ(+unit.parentid, 1);
    EXPECT_EQ(+unit.upperchildid, 6);
    EXPECT_EQ(+unit.lowerchildid, -1);
    EXPECT_EQ(fillinfo(3, nullptr, &unit), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(fillinfo(3, &table, nullptr), ZAV_RC_ERR_EINVAL);
    record().popen_fails = true;
    EXPECT_EQ(checked([&] { return fillinfo(3, &table, &unit); }), ZAV_RC_ERR);
}

class UnitSerialNumber : public Units {
  protected:
    int ask(int id) {
        map = {id, "addr", "old", "old"};
        return checked([&] { return zavGetRBODSN(&map); });
    }
    sRBODMap map = {};
};

TEST_F(UnitSerialNumber, IsReadWithTheModel) {
    cascade_of_four();
    EXPECT_EQ(ask(5), ZAV_RC_OK);
    EXPECT_STREQ(map.sn, "SN5");
    EXPECT_STREQ(map.model, "HBQE-T500");
    EXPECT_STREQ(map.sasaddr, "addr");
    EXPECT_EQ(record().commands, std::vector<std::string>{"cat /etc/Kiru/zav/.raidinfo"});
    EXPECT_EQ(record().pcloses, 1);
}

TEST_F(UnitSerialNumber, StaysWhereTheReportHasNoneOfIt) {
    for (const int id : {4, 0, -7}) {
        EXPECT_EQ(ask(id), ZAV_RC_OK);
        EXPECT_STREQ(map.sn, "old");
        EXPECT_STREQ(map.model, "old");
    }
    remove(kReport);
    EXPECT_EQ(ask(1), ZAV_RC_OK);
    EXPECT_STREQ(map.sn, "old");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(UnitSerialNumber, ReadsALongReportOnlyAsFarAsItMust) {
    std::string text = section(1, "1");
    for (int i = 0; i < 20000; ++i)
        text += "X:a line that nobody needs\n";
    put(kReport, text);
    EXPECT_EQ(ask(1), ZAV_RC_OK);
    EXPECT_STREQ(map.sn, "SN1");
}

TEST_F(UnitSerialNumber, NeedsItsArgumentTheTurnAndAPipe) {
    EXPECT_EQ(zavGetRBODSN(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(semaphore_value(kKey), -1);
    record().popen_fails = true;
    EXPECT_EQ(ask(1), 32);
    EXPECT_EQ(semaphore_value(kKey), 1);
    record().semop_fails = [](short step) { return step < 0; };
    EXPECT_EQ(ask(1), ZAV_RC_ERR);
    EXPECT_EQ(record().log.back(), row("zavGetRBODSN", 1, "[3] semaphore_p [26898] failed!!"));
    EXPECT_NE(record().log[0].text.find("key[0x1]"), std::string::npos);
}

// ---- State ----

class UnitState : public Units {
  protected:
    UnitState() { cascade_of_four(); }

    int ask(int id, int sensor) {
        sRBOD asked = {};
        asked.id = id;
        memset(&info, 0x55, sizeof info);
        return checked([&] { return zavGetStateRBOD(&asked, sensor, &info); });
    }

    void expect(int sensor, int state, float value) const {
        EXPECT_EQ(+info.type, ZAV_EVENT_RBOD);
        EXPECT_EQ(+info.id, sensor);
        EXPECT_EQ(+info.state, state);
        EXPECT_EQ(+info.value, value);
        EXPECT_EQ(+info.priority, 0);
    }

    void expect_untouched() const { EXPECT_EQ(+info.type, 0x55555555); }

    zavRBODState info = {};
};

TEST_F(UnitState, TellsThatAUnitIsThere) {
    EXPECT_EQ(ask(5, ZAV_RBOD_EXPANDER), ZAV_RC_OK);
    expect(ZAV_RBOD_EXPANDER, ZAV_RBOD_EXIST, 0.0F);
    EXPECT_EQ(+info.rbod.iExist, 1);
    EXPECT_EQ(+info.rbod.id, 5);
    EXPECT_EQ(info.rbod.sasaddr, digits(5) + "800");
    EXPECT_STREQ(info.rbod.sn, "SN5");
    EXPECT_EQ(+info.rbod.parentid, 2);
}

TEST_F(UnitState, TellsThatAUnitIsNotThere) {
    EXPECT_EQ(ask(4, ZAV_RBOD_EXPANDER), ZAV_RC_OK);
    expect(ZAV_RBOD_EXPANDER, ZAV_RBOD_NOTEXIST, 0.0F);
    sRBOD cleared = {};
    cleared.id = 4;
    EXPECT_EQ(memcmp(&info.rbod, &cleared, sizeof cleared), 0);
}

TEST_F(UnitState, JudgesTheTemperature) {
    struct Row {
        const char *degrees;
        int state;
    };
    for (const Row &row : {Row{"74.9", ZAV_RBOD_NORMAL},
                           {"75.0", ZAV_RBOD_WARN},
                           {"84.9", ZAV_RBOD_WARN},
                           {"85.0", ZAV_RBOD_ALARM},
                           {"200", ZAV_RBOD_ALARM},
                           {"-40", ZAV_RBOD_NORMAL},
                           {"74.9999999", ZAV_RBOD_WARN},
                           {"0", ZAV_RBOD_NORMAL}}) {
        put(kReport, section(3, std::string(row.degrees) + ":1:2:3:9"));
        EXPECT_EQ(ask(3, ZAV_RBOD_TEMP_CPU), ZAV_RC_OK);
        expect(ZAV_RBOD_TEMP_CPU, row.state, std::stof(row.degrees));
    }
}

TEST_F(UnitState, JudgesTheVoltage) {
    struct Row {
        const char *volts;
        int state;
    };
    for (const Row &row : {Row{"1.20", ZAV_RBOD_NORMAL},
                           {"1.08", ZAV_RBOD_NORMAL},
                           {"1.0799", ZAV_RBOD_WARN},
                           {"1.31", ZAV_RBOD_NORMAL},
                           {"1.32", ZAV_RBOD_WARN},
                           {"1.43", ZAV_RBOD_WARN},
                           {"1.44", ZAV_RBOD_ALARM},
                           {"9", ZAV_RBOD_ALARM},
                           {"0.97", ZAV_RBOD_WARN},
                           {"0.96", ZAV_RBOD_ALARM},
                           {"0", ZAV_RBOD_ALARM}}) {
        put(kReport, section(3, std::string("99:1:2:3:") + row.volts));
        EXPECT_EQ(ask(3, ZAV_RBOD_VOLT_CPU), ZAV_RC_OK);
        expect(ZAV_RBOD_VOLT_CPU, row.state, std::stof(row.volts));
    }
    put(kReport, section(3, "99:1:2:3:nan"));
    EXPECT_EQ(ask(3, ZAV_RBOD_VOLT_CPU), ZAV_RC_OK);
    EXPECT_EQ(+info.state, ZAV_RBOD_NORMAL) << "no limit is passed";
}

TEST_F(UnitState, OfASensorThatThereIsNotIsNormal) {
    for (const int sensor : {0, 0x0FFF, 0x1003, -1}) {
        EXPECT_EQ(ask(4, sensor), ZAV_RC_OK);
        expect(sensor, ZAV_RBOD_NORMAL, 0.0F);
    }
}

TEST_F(UnitState, IsAskedOfTheReportAlsoForAUnitThatIsNotThere) {
    EXPECT_EQ(ask(4, ZAV_RBOD_TEMP_CPU), ZAV_RC_ERR_ENODEV);
    expect(ZAV_RBOD_TEMP_CPU, ZAV_RBOD_NORMAL, 0.0F);
    put(kReport, get(kReport) + section(4, "50"));
    EXPECT_EQ(ask(4, ZAV_RBOD_TEMP_CPU), ZAV_RC_OK);
    EXPECT_EQ(+info.rbod.iExist, 0);
}

TEST_F(UnitState, NeedsAUnitFrom1To7) {
    for (const int id : {0, 8, -1, INT32_MIN}) {
        EXPECT_EQ(ask(id, ZAV_RBOD_EXPANDER), ZAV_RC_ERR_EINVAL);
        expect_untouched();
    }
    sRBOD asked = {};
    asked.id = 1;
    EXPECT_EQ(zavGetStateRBOD(nullptr, ZAV_RBOD_EXPANDER, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetStateRBOD(&asked, ZAV_RBOD_EXPANDER, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(UnitState, WithoutMemoryIsRefused) {
    record().calloc_fails = true;
    EXPECT_EQ(ask(1, ZAV_RBOD_EXPANDER), ZAV_RC_ERR_ENOMEM);
    record().calloc_fails = false;
    expect_untouched();
}

TEST_F(UnitState, PassesOnWhatFails) {
    remove(kReport);
    EXPECT_EQ(ask(1, ZAV_RBOD_VOLT_CPU), ZAV_RC_ERR_ENOENT);
    expect(ZAV_RBOD_VOLT_CPU, ZAV_RBOD_NORMAL, 0.0F);
    record().popen_fails = true;
    EXPECT_EQ(ask(1, ZAV_RBOD_EXPANDER), 32);
    expect(ZAV_RBOD_EXPANDER, ZAV_RBOD_NORMAL, 0.0F);
    EXPECT_EQ(+info.rbod.id, 1);
}

TEST_F(UnitState, TakesTheNumberFromItsOwnAnswer) {
    info.rbod.id = 5;
    EXPECT_EQ(zavGetStateRBOD(&info.rbod, ZAV_RBOD_EXPANDER, &info), ZAV_RC_OK);
    EXPECT_EQ(+info.rbod.id, 5);
    EXPECT_EQ(+info.state, ZAV_RBOD_EXIST);
}

} // namespace
