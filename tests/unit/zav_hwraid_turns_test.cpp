// The report of the RAID controller is rewritten while it is read: by processes and by threads.
#include "harness.h"

#include <array>
#include <cstring>
#include <sys/mman.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

namespace {

constexpr const char *kReport = "/etc/Kiru/zav/.raidinfo";
constexpr int kReaders = 4;
constexpr int kRounds = 150;

// Two states of the whole machine; nothing of one is in the other.
const std::string kBefore = "PCI\nM:card A\nS:CA\nI:\nR:1:Set A:1500:4:1234:0\n"
                            "V:1:A1:3:500:11:1\nV:2:A2:3:1000:11:1\n"
                            "D:1:501:1\nD:2:501:1\nD:3:501:1\nD:4:501:1\nH:11:12:13:14:15\n"
                            "RBOD#1\nM:unit A\nS:UA\nI:\nR:2:Set a:3000:4:1234:0\n"
                            "V:1:a1:1:3000:21:1\nD:1:1001:1\nH:21:22:23:24:25\n";
const std::string kAfter = "PCI\nM:card B\nS:CB\nI:\nR:5:Set B:2500:3:123:0\n"
                           "V:1:B1:1:600:77:4\nV:2:B2:0:2000:77:2\n"
                           "D:1:502:4\nD:2:502:4\nD:3:502:4\nH:71:72:73:74:75\n"
                           "RBOD#1\nM:unit B\nS:UB\nI:\nR:6:Set b:4000:3:123:0\n"
                           "V:1:b1:3:4000:88:8\nD:1:1002:4\nH:81:82:83:84:85\n";

struct Answers {
    sRaidSetInfo card = {};
    sRaidSetInfo unit = {};
    zavRaidState volume = {};
    sRBODMap identity = {1, "", "", ""};
    float temperature = 0;
    double card_voltage = 0;
};

zavDevice card_address() {
    return {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0};
}
zavDevice unit_address() {
    return {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x101, 0};
}
zavDevice volume_address() {
    return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 0x101, 0};
}

bool ask_all(Answers &answers) {
    zavDevice card = card_address();
    zavDevice unit = unit_address();
    zavDevice volume = volume_address();
    return updateData(&card, &answers.card) == ZAV_RC_OK &&
           updateData(&unit, &answers.unit) == ZAV_RC_OK &&
           zavGetStateRaid(&volume, &answers.volume) == ZAV_RC_OK &&
           zavGetRBODSN(&answers.identity) == ZAV_RC_OK &&
           zavGetRBODHwMon(1, 0, &answers.temperature) == ZAV_RC_OK &&
           zavGetRaidCardHwMon(3, &answers.card_voltage) == ZAV_RC_OK;
}

template <class Record>
bool is_either(const Record &record, const Record &before, const Record &after) {
    return memcmp(&record, &before, sizeof record) == 0 ||
           memcmp(&record, &after, sizeof record) == 0;
}

// Every answer by itself is of one of the states.
bool unmixed(const Answers &asked, const Answers &before, const Answers &after) {
    return is_either(asked.card, before.card, after.card) &&
           is_either(asked.unit, before.unit, after.unit) &&
           is_either(asked.volume, before.volume, after.volume) &&
           is_either(asked.identity, before.identity, after.identity) &&
           is_either(asked.temperature, before.temperature, after.temperature) &&
           is_either(asked.card_voltage, before.card_voltage, after.card_voltage);
}

void pause() {
    const timespec moment = {0, 100'000};
    nanosleep(&moment, nullptr);
}

// As the agent does it: in place, and not at once.
void rewrite(const std::string &text) {
    int id = 0;
    if (semaphore_get(0x6912, &id) != ZAV_RC_OK || semaphore_p(id, 0x6912) != ZAV_RC_OK)
        _exit(2);
    FILE *report = fopen(kReport, "w");
    if (report == nullptr)
        _exit(3);
    setvbuf(report, nullptr, _IONBF, 0);
    const size_t half = text.size() / 2;
    fwrite(text.data(), 1, half, report);
    pause();
    fwrite(text.data() + half, 1, text.size() - half, report);
    fclose(report);
    semaphore_v(id, 0x6912);
}

class Turns : public harness::Appliance {
  protected:
    Turns() {
        model("SV-2980\n", "raidtype=5;0;4\n");
        put("/dev/sasraid/r1disk1", "");
        put(kReport, kAfter);
        EXPECT_TRUE(ask_all(after));
        put(kReport, kBefore);
        EXPECT_TRUE(ask_all(before));
    }

    int read_on() const {
        for (int round = 0; round < kRounds; ++round) {
            Answers asked;
            if (!ask_all(asked) || !unmixed(asked, before, after))
                return 1;
        }
        return 0;
    }

    template <class Work>
    static pid_t start(const Work &work) {
        const pid_t child = fork();
        if (child == 0)
            _exit(work());
        return child;
    }

    static int status_of(pid_t child) {
        int status = 0;
        waitpid(child, &status, 0);
        return status;
    }

    Answers before;
    Answers after;
};

TEST_F(Turns, OfFourProcessesAndTheAgentNeverMixTwoStates) {
    auto *stop = static_cast<volatile bool *>(
        mmap(nullptr, sizeof(bool), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));
    *stop = false;
    const pid_t agent = start([stop] {
        while (!*stop) {
            rewrite(kAfter);
            pause();
            rewrite(kBefore);
            pause();
        }
        return 0;
    });
    std::array<pid_t, kReaders> readers = {};
    for (pid_t &reader : readers)
        reader = start([this] { return read_on(); });
    for (const pid_t reader : readers)
        EXPECT_EQ(status_of(reader), 0);
    *stop = true;
    EXPECT_EQ(status_of(agent), 0);
    EXPECT_EQ(semaphore_value(0x6912), 1);
    EXPECT_EQ(get(kReport), kBefore);
}

TEST_F(Turns, OfAProcessThatDiesAreGivenBack) {
    const pid_t agent = start([] {
        int id = 0;
        semaphore_get(0x6912, &id);
        semaphore_p(id, 0x6912);
        return 0;
    });
    EXPECT_EQ(status_of(agent), 0);
    EXPECT_EQ(read_on(), 0);
}

TEST_F(Turns, OfThreadsKeepTheirAnswersApart) {
    tool("/usr/bin/query_sas.sh", "phy   0:D:attached:[5001B4D5008FF011800:00]\n"
                                  "phy   4:S:attached:[500605B000C7F540:02 i(SSP+STP+SMP)]\n"
                                  "phy   8:S:attached:[0000000000000000:00]\n"
                                  "phy  10:S:attached:[0000000000000000:00]\n");
    std::array<bool, kReaders> right = {};
    std::array<std::thread, kReaders> threads;
    for (size_t i = 0; i < threads.size(); ++i)
        threads[i] = std::thread([&, i] {
            right[i] = true;
            for (int round = 0; round < 25; ++round) {
                Answers asked;
                sRBODSet set;
                right[i] = right[i] && ask_all(asked) && unmixed(asked, before, before) &&
                           zavGetRBODSet(&set) == ZAV_RC_OK &&
                           strcmp(set.RBOD[0].sasaddr, "5001B4D5008FF011800") == 0 &&
                           strcmp(set.RBOD[0].sn, "UA") == 0;
            }
        });
    for (std::thread &thread : threads)
        thread.join();
    for (const bool each : right)
        EXPECT_TRUE(each);
}

} // namespace
