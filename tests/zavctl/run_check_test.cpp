// What schedulers and collectors get of a simulated appliance.
#include "run.h"

TEST(RunCheck, TheWorstFindingIsTheFirstLineAndTheStatus) {
    const Outcome run = on_zav("zavsim act disk 3 fails; zavctl check disk array");
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.out, "CRITICAL: disk 3 has failed, and 1 more\n"
                       "WARNING: arrays 1 (md0), 2 (md1) and 3 (md2) are degraded\n");
}

TEST(RunCheck, WhatTheApplianceDoesNotHaveIsUnknown) {
    const Outcome run = on_zav("zavctl check unit");
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(run.out, "UNKNOWN: this appliance has no expansion unit\n");
}

TEST(RunCheck, WrongUsageIsUnknownOnStandardOutput) {
    const Outcome run = on_zav("zavctl check --bogus");
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(run.out, "UNKNOWN: unknown option '--bogus'.\n");
}

TEST(RunCheck, AToolThatHangsIsUnknown) {
    const Outcome run =
        on_zav("zavsim act tool smartctl hangs 100000s; zavctl check disk --timeout 2");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(run.out.starts_with("UNKNOWN: ")) << run.out;
}

TEST(RunMetrics, AFileIsReplacedWholeWhateverTheState) {
    const Outcome run = on_zav("zavsim act disk 3 fails; echo old >m.prom; "
                               "zavctl metrics --output m.prom; echo $?; ls; cat m.prom");
    EXPECT_TRUE(run.out.starts_with("0\nm.prom\n# HELP zav_up ")) << run.out;
    EXPECT_TRUE(holds(run.out, "zav_disk_state{disk=\"3\",state=\"failed\"} 1\n")) << run.out;
}

TEST(RunCheck, TheProcessorIsMeasuredForTheLoadAlone) {
    EXPECT_TRUE(holds(on_zav("zavctl check load").out, " processor="));
    EXPECT_FALSE(holds(on_zav("zavctl check").out, "processor"));
}

TEST(RunMetrics, TheProcessorIsMeasuredUnlessItIsLeftOut) {
    EXPECT_TRUE(holds(on_zav("zavctl metrics").out, "\nzav_processor_used_ratio 0"));
    const Outcome run = on_zav("zavctl metrics --no-processor");
    EXPECT_TRUE(holds(run.out, "\nzav_memory_used_ratio 0"));
    EXPECT_FALSE(holds(run.out, "processor"));
}

TEST(RunMetrics, AFileThatCannotBeWrittenIsTold) {
    const Outcome run = on_zav("zavctl metrics --output /nonexistent/m.prom");
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(run.err, "zavctl: cannot write /nonexistent/m.prom: No such file or directory\n");
}
