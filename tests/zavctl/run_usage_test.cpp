// Wrong usage and help.
#include "run.h"

namespace {

Outcome zavctl(const std::vector<std::string> &words) {
    std::vector<std::string> all = {ZAVCTL};
    all.insert(all.end(), words.begin(), words.end());
    return execute(all);
}

void expect_usage(const std::vector<std::string> &words, const std::string &message) {
    const Outcome run = zavctl(words);
    EXPECT_EQ(run.status, 64) << message;
    EXPECT_EQ(run.out, "") << message;
    EXPECT_TRUE(holds(run.err, message)) << run.err;
}

} // namespace

TEST(RunUsage, AloneItPrintsItsHelp) {
    expect_usage({}, "Usage: zavctl");
}

TEST(RunUsage, AnObjectAlonePrintsItsHelp) {
    expect_usage({"disk"}, "Usage: zavctl disk");
}

TEST(RunUsage, UnknownWordsSuggestTheNearest) {
    expect_usage({"dsik", "list"}, "unknown object 'dsik'. Did you mean 'disk'?");
    expect_usage({"disk", "lsit"}, "unknown verb 'lsit'. Did you mean 'list'?");
    expect_usage({"disk", "list", "--jsn"}, "unknown option '--jsn'. Did you mean '--json'?");
    expect_usage({"xyzzy"}, "unknown object 'xyzzy'. There are: status, ");
}

TEST(RunUsage, MissingAndExtraArgumentsAreRefused) {
    expect_usage({"disk", "show"}, "N is required");
    expect_usage({"disk", "show", "x"}, "x");
    expect_usage({"disk", "show", "0-1"}, "'0-1' is no disk");
    expect_usage({"disk", "show", "/dev/sata/disk1p1"}, "'/dev/sata/disk1p1' is no disk");
    expect_usage({"array", "show", "/dev/sata/disk1"}, "'/dev/sata/disk1' is no array");
    expect_usage({"unit", "show", "8"}, "8");
    expect_usage({"unit", "show"}, "N is required");
    expect_usage({"disk", "list", "more"}, "'more' is one word too many");
    expect_usage({"disk", "list", "--json", "--jsonl"}, "exclude each other");
    expect_usage({"disk", "list", "--timeout", "0"}, "--timeout");
    expect_usage({"lv", "show", "1"}, "'1' is no logical volume");
    expect_usage({"pv", "show", "/dev/DataVG1/LogVol1"}, "is no physical volume");
    expect_usage({"vg", "show", "-1"}, "-1");
    expect_usage({"vg", "add", "array", "3"}, "--group");
    expect_usage({"vg", "remove"}, "N is required");
    expect_usage({"disk", "remove"}, "N is required");
    expect_usage({"disk", "add", "three"}, "three");
    expect_usage({"disk", "remove", "3", "--force"}, "unknown option '--force'");
    expect_usage({"name", "hdd", "saat", "1"}, "Did you mean 'sata'?");
}

TEST(RunUsage, HostileWordsAreEscaped) {
    expect_usage({"\033[31m"}, "unknown object '\\x1b[31m'");
}

TEST(RunUsage, OptionsMayStandBeforeTheObject) {
    const Outcome run = zavctl({"--json", "--color", "never", "name", "eth0"});
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(parsed(run.out)["command"], "name");
}

TEST(RunUsage, EveryLevelHasItsHelp) {
    const std::vector<std::vector<std::string>> levels = {{},
                                                          {"status"},
                                                          {"model"},
                                                          {"disk"},
                                                          {"disk", "list"},
                                                          {"disk", "show"},
                                                          {"array"},
                                                          {"array", "list"},
                                                          {"disk", "remove"},
                                                          {"disk", "add"},
                                                          {"array", "show"},
                                                          {"vg"},
                                                          {"unit"},
                                                          {"unit", "list"},
                                                          {"unit", "show"},
                                                          {"report"},
                                                          {"report", "check"},
                                                          {"vg", "list"},
                                                          {"vg", "show"},
                                                          {"vg", "add"},
                                                          {"vg", "remove"},
                                                          {"lv"},
                                                          {"lv", "list"},
                                                          {"lv", "show"},
                                                          {"pv"},
                                                          {"pv", "list"},
                                                          {"pv", "show"},
                                                          {"bios"},
                                                          {"bios", "show"},
                                                          {"bios", "save"},
                                                          {"bios", "load"},
                                                          {"name"},
                                                          {"unit", "mark"},
                                                          {"unit", "check"},
                                                          {"sensor"},
                                                          {"sensor", "list"},
                                                          {"sensor", "show"},
                                                          {"sensor", "reset"},
                                                          {"port"},
                                                          {"port", "get"},
                                                          {"port", "set"},
                                                          {"load"},
                                                          {"nic"},
                                                          {"nic", "list"},
                                                          {"nic", "show"},
                                                          {"ups"},
                                                          {"led"},
                                                          {"led", "get"},
                                                          {"led", "set"},
                                                          {"led", "alarm"},
                                                          {"led", "poll"},
                                                          {"uart"},
                                                          {"sync"},
                                                          {"event"},
                                                          {"event", "poll"},
                                                          {"event", "wait"},
                                                          {"event", "push"},
                                                          {"event", "follow"},
                                                          {"watch"},
                                                          {"metrics"},
                                                          {"check"},
                                                          {"doctor"}};
    for (std::vector<std::string> words : levels) {
        words.emplace_back("--help");
        const Outcome run = zavctl(words);
        EXPECT_EQ(run.status, 0);
        EXPECT_TRUE(holds(run.out, "Exit status")) << run.out;
        EXPECT_EQ(run.err, "");
    }
    EXPECT_EQ(zavctl({"help", "disk"}).out, zavctl({"disk", "--help"}).out);
}

TEST(RunUsage, EveryVerbsHelpHasExamples) {
    for (const char *verb : {"status", "model", "name", "doctor"})
        EXPECT_TRUE(holds(zavctl({verb, "--help"}).out, "Examples:")) << verb;
}

TEST(RunUsage, TheVersionIsTold) {
    const Outcome run = zavctl({"--version"});
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(run.out.starts_with("zavctl 1.")) << run.out;
}
