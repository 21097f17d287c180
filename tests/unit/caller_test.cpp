// Callers that are not as a program usually is: answers stay right, or are the described failure.
#include "harness.h"

#include <clocale>
#include <csignal>
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using harness::record;

class Caller : public harness::Appliance {
  protected:
    Caller() {
        four_disk_model();
        put("/dev/sata/disk3", "");
        tool("/bin/smartctl", "", 0);
        put("/tmp/progress.outfile", "  0.00% done, estimate finish Sun Nov 22\n"
                                     " 37.50% done, estimate finish Sun Nov 22\n");
        put("/proc/zav/sys/sensor/tempLT", "42.5\n");
        put("/proc/zav/sys/sensor/statusLT", "0\n");
    }

    // What a disk's query answers, which runs a command.
    static int disk_state() {
        zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};
        zavHddState state = {};
        const int rc = checked([&] { return zavGetStateDisk(&disk, &state); });
        return rc == ZAV_RC_OK ? state.state : -rc;
    }

    // The code that a child ends with after `act`, -1 if it was killed.
    template <class Act>
    static int in_child(const Act &act) {
        const pid_t child = fork();
        if (child == 0) {
            alarm(30);
            _exit(act());
        }
        int status = 0;
        waitpid(child, &status, 0);
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
};

TEST_F(Caller, WithoutStandardDescriptorsIsAnswered) {
    EXPECT_EQ(in_child([] {
                  for (const int descriptor : {0, 1, 2})
                      close(descriptor);
                  return disk_state() == ZAV_HDD_FOUND && zavCDProgress() == 37 ? 7 : 1;
              }),
              7);
}

TEST_F(Caller, WithAThousandDescriptorsIsAnswered) {
    EXPECT_EQ(in_child([] {
                  const rlimit many = {4096, 4096};
                  setrlimit(RLIMIT_NOFILE, &many);
                  for (int i = 0; i < 1000; ++i)
                      if (open("/dev/null", O_RDONLY) < 0)
                          return 2;
                  return disk_state() == ZAV_HDD_FOUND && zavCDProgress() == 37 ? 7 : 1;
              }),
              7);
}

TEST_F(Caller, WithoutAFreeDescriptorIsToldSo) {
    EXPECT_EQ(in_child([] {
                  zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};
                  zavHddState state = {};
                  while (open("/dev/null", O_RDONLY) >= 0) {
                  }
                  return zavGetStateDisk(&disk, &state) == 0x1301 && zavCDProgress() == 0 ? 7 : 1;
              }),
              7); // the model is not known, nor any progress
}

// The exit status of a command cannot be had then; what is read through a pipe can.
TEST_F(Caller, ThatIgnoresItsChildrenIsToldThatNoShellCouldBeStarted) {
    EXPECT_EQ(in_child([] {
                  signal(SIGCHLD, SIG_IGN);
                  return disk_state() == -ZAV_RC_ERR && zavCDProgress() == 37 ? 7 : 1;
              }),
              7);
}

TEST_F(Caller, WithADecimalCommaIsAnswered) {
    ASSERT_NE(setlocale(LC_ALL, "de_DE.UTF-8"), nullptr);
    zavThermalState state = {};
    EXPECT_EQ(checked([&] { return zavGetStateThermal(1, &state); }), ZAV_RC_OK);
    setlocale(LC_ALL, "C");
    EXPECT_FLOAT_EQ(state.value, 42.5F);
}

} // namespace
