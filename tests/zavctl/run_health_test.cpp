// Network, UPS, load, LEDs, sensor ports and marks on the simulated appliance.
#include "run.h"

namespace {

const std::vector<std::string> two_units = {"--model", "2980", "--units", "2"};

nlohmann::json nic_named(const nlohmann::json &answer, const std::string &name) {
    for (const nlohmann::json &nic : answer["nics"])
        if (nic["nic"] == name)
            return nic;
    return nullptr;
}

} // namespace

TEST(RunNic, PortsAndBondAreUp) {
    const Outcome run = on_zav("zavctl nic list --json");
    EXPECT_EQ(run.status, 0) << run.out;
    const nlohmann::json json = parsed(run.out);
    EXPECT_EQ(json["nics"].size(), 3U) << run.out;
    EXPECT_EQ(nic_named(json, "eth1")["speed_mbit"], 1000);
    EXPECT_EQ(nic_named(json, "bond0")["link"], "up");
}

TEST(RunNic, ALostLinkIsAWarning) {
    const Outcome run = on_zav("zavsim act port 1 loses its link; zavctl nic list");
    EXPECT_EQ(run.status, 1);
    EXPECT_TRUE(holds(run.out, "WARNING: port eth0 has no link\n")) << run.out;
}

TEST(RunNic, ASpeedThatIsNotKnownCannotBeTold) {
    const Outcome run = on_zav("zavsim act port 2 runs at 10000; zavctl nic show eth1");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "ZAV_RC_ERR_NIC")) << run.out;
}

TEST(RunNic, APortThatIsAskedForHasToExist) {
    const Outcome run = on_zav("zavctl nic show eth3");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "CRITICAL: port eth3 does not exist\n")) << run.out;
    EXPECT_EQ(on_zav("zavctl nic show eth9").status, 64);
}

TEST(RunNic, WithoutPortsNothingIsWrong) {
    const Outcome run = on_zav("zavctl nic list", {"--nics", "none"});
    EXPECT_EQ(run.status, 0) << run.out;
}

TEST(RunNic, WithoutEthtoolPortsCannotBeTold) {
    const Outcome run = on_zav("zavsim act tool ethtool is missing; zavctl nic list");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "/sbin/ethtool is missing")) << run.out;
}

TEST(RunUps, OnLineIsWell) {
    const Outcome run = on_zav("zavctl ups --json");
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_EQ(parsed(run.out)["ups"]["state"], "online");
}

TEST(RunUps, APowerCutIsAWarning) {
    const Outcome run = on_zav("zavsim act power fails; zavctl ups", {"--time-scale", "1"});
    EXPECT_EQ(run.status, 1);
    EXPECT_TRUE(holds(run.out, "WARNING: the UPS is on battery, charged ")) << run.out;
}

TEST(RunUps, WithoutAUpsNothingIsWrong) {
    const Outcome run = on_zav("zavctl ups", {"--bare"});
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "OK: no UPS\n")) << run.out;
}

TEST(RunUps, ADaemonsOldWordCannotBeTold) {
    const Outcome run =
        on_zav("touch -d '2 hours ago' /var/log/apcupsd.status; zavctl ups --json", {"--bare"});
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(parsed(run.out)["ups"]["error"]["name"], "ZAV_RC_ERR_ENODEV");
}

TEST(RunLoad, ProcessorAndFileSystemsAreMeasured) {
    const Outcome run = on_zav("zavctl load --json", {"--time-scale", "10"});
    const nlohmann::json json = parsed(run.out);
    ASSERT_EQ(json["load"].size(), 8U) << run.out;
    EXPECT_EQ(json["load"][0]["probe"], "processor");
    EXPECT_TRUE(json["load"][0]["processor"]["idle"].is_number());
    EXPECT_EQ(json["load"][1]["state"], "");
}

TEST(RunLoad, AFullFileSystemIsCritical) {
    const Outcome run = on_zav("zavsim act file system /var fills 96%; zavctl load --no-processor");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "CRITICAL: file system /var is 96.")) << run.out;
}

TEST(RunLoad, UsedSwapIsCritical) {
    const Outcome run = on_zav("zavsim act swap use 12%; zavctl load --no-processor");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "CRITICAL: swap is 12.")) << run.out;
}

TEST(RunLoad, WhatIsNotMountedIsAWarningOnlyIfItShouldBe) {
    const std::string without_var =
        "cp -L /etc/mtab m; rm /etc/mtab; grep -v ' /var ' m >/etc/mtab; ";
    const Outcome well = on_zav(without_var + "zavctl load --no-processor");
    EXPECT_EQ(well.status, 0) << well.out;
    EXPECT_TRUE(holds(well.out, "not mounted")) << well.out;
    const Outcome missed = on_zav(without_var + "echo '/dev/sda5 /var ext3 defaults 1 2' "
                                                ">/etc/fstab; zavctl load --no-processor");
    EXPECT_EQ(missed.status, 1);
    EXPECT_TRUE(holds(missed.out, "WARNING: file system /var is not mounted\n")) << missed.out;
}

TEST(RunPort, TheByteIsReadAndWritten) {
    const Outcome run = on_zav("zavsim act input is 3F; zavctl port get --hex; "
                               "zavctl port set 0xa5 >/dev/null; cat /proc/zav/sys/dev/serio/out");
    EXPECT_TRUE(run.out.starts_with("OK: the sensor ports read 0x3F\nA5")) << run.out;
    EXPECT_EQ(on_zav("zavctl port set 256").status, 64);
}

TEST(RunPort, WithoutTheDriverAByteCannotBeToldNorWritten) {
    EXPECT_EQ(on_zav("zavctl port get", {"--bare"}).status, 3);
    EXPECT_EQ(on_zav("zavctl port set 1", {"--bare"}).status, 2);
}

TEST(RunLed, IsSetAndReadBack) {
    const Outcome run = on_zav("zavctl led set panel-5 value2 && zavctl led set disk-3 first-2 && "
                               "zavctl led get 5 disk-3 --json");
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "OK: LED panel 5 is value2\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "\"state\": \"first-2\"")) << run.out;
}

TEST(RunLed, AStateOfAnotherLedIsRefusedBeforeItsLineIsTouched) {
    const Outcome run = on_zav("zavctl led set panel-1 on >/dev/null; zavctl led set panel-1 "
                               "value2; echo $?; zavctl led get panel-1 --json");
    EXPECT_TRUE(run.out.starts_with("64\n")) << run.out;
    EXPECT_EQ(parsed(run.out.substr(3))["leds"][0]["state"], "on");
}

TEST(RunLed, TheDisksLedsAreTheRaidControllersWhereThereIsOne) {
    const Outcome run = on_zav("zavctl led get disk-1", two_units);
    EXPECT_EQ(run.status, 64);
    EXPECT_TRUE(holds(run.err, "the LEDs of the disks are the RAID controller's")) << run.err;
    EXPECT_EQ(parsed(on_zav("zavctl led get --json", two_units).out)["leds"].size(), 6U);
}

TEST(RunLed, AnAlarmIsHandedOverAndTaken) {
    const Outcome run = on_zav("zavctl led alarm --priority 2 --code 7 --state 1 >/dev/null && "
                               "zavctl led poll --jsonl; zavctl led poll");
    EXPECT_TRUE(holds(run.out, "\"priority\":2,\"code\":7,\"state\":1")) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "OK: no LED alarm is pending\n")) << run.out;
}

TEST(RunUart, TheLinesAreSet) {
    const Outcome run = on_zav("zavctl uart 2; cd /proc/zav/sys/dev/gpio/ich9; cat 34 35 49");
    EXPECT_TRUE(holds(run.out, "OK: serial port in mode 2: GPIO line 34 to 0, line 35 to 0 and "
                               "line 49 to 1\n"))
        << run.out;
    EXPECT_TRUE(run.out.ends_with("\n0\n0\n1\n") || run.out.ends_with("\n001")) << run.out;
    EXPECT_EQ(on_zav("zavctl uart 5").status, 64);
    EXPECT_EQ(on_zav("zavctl uart 1", {"--bare"}).status, 2);
}

TEST(RunSync, TheScriptDecides) {
    const std::string script = "printf '#!/bin/sh\\necho copied; exit %s\\n' $code "
                               ">/usr/bin/syncConf.sh; chmod +x /usr/bin/syncConf.sh; zavctl sync";
    const Outcome done = on_zav("code=0; " + script);
    EXPECT_EQ(done.status, 0) << done.out << done.err;
    EXPECT_TRUE(holds(done.err, "copied")) << done.err;
    const Outcome failed = on_zav("code=1; " + script);
    EXPECT_EQ(failed.status, 2);
    EXPECT_TRUE(holds(failed.out, "/usr/bin/syncConf.sh has failed")) << failed.out;
    EXPECT_TRUE(holds(on_zav("rm -f /usr/bin/syncConf.sh; zavctl sync").out, "is missing"));
}

TEST(RunMark, AUnitIsMarkedAndKnown) {
    const Outcome run = on_zav("zavctl unit check 2; echo $?; zavctl unit mark 2 && "
                               "zavctl unit check 2",
                               two_units);
    EXPECT_TRUE(holds(run.out, "WARNING: unit 2 carries no mark\n1\n")) << run.out << run.err;
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "OK: 1 unit marked by this chassis\n")) << run.out;
}

TEST(RunMark, AnothersMarkIsOverwrittenOnlyWhenAskedFor) {
    const std::string foreign = "printf '\\1\\2\\3\\4' | dd of=/dev/sasraid/r1disk1 bs=1 seek=440 "
                                "conv=notrunc 2>/dev/null; ";
    const Outcome asked =
        on_zav(foreign + "zavctl unit mark 1; echo $?; zavctl unit check 1", two_units);
    EXPECT_TRUE(asked.out.starts_with("64\n")) << asked.out;
    EXPECT_EQ(asked.status, 2);
    EXPECT_TRUE(holds(asked.out, "CRITICAL: unit 1 carries the mark of another chassis\n"));
    const Outcome told = on_zav(foreign + "zavctl unit mark 1 --yes", two_units);
    EXPECT_EQ(told.status, 0) << told.out << told.err;
}

TEST(RunMark, AUnitWithoutAVolumeIsNotMarked) {
    const Outcome run = on_zav("zavctl unit mark 5", two_units);
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "there is no volume /dev/sasraid/r5disk1")) << run.out;
    EXPECT_EQ(on_zav("zavctl unit check").status, 64);
}
