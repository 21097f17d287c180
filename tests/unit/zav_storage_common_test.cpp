// Locks between processes.
#include "harness.h"

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstring>
#include <sys/sem.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

namespace {

using harness::record;
using harness::row;

constexpr int kKey = 0x6911;
constexpr int kNoSuchId = 0x7FFFFFFF;

class Locks : public harness::Appliance {
  protected:
    int get() {
        int id = -1;
        EXPECT_EQ(semaphore_get(kKey, &id), 0);
        return id;
    }

    static int value(int id) {
        int value = -1;
        EXPECT_EQ(semaphore_getvalue(id, kKey, &value), 0);
        return value;
    }

    // Runs `body` in a process of its own and gives its exit status.
    template <typename Body>
    static int in_child(Body body) {
        const pid_t child = fork();
        if (child == 0)
            _exit(body());
        int status = 0;
        waitpid(child, &status, 0);
        return WEXITSTATUS(status);
    }

    static void expect_failure(const char *function, const char *text, int error) {
        char message[256];
        snprintf(message, sizeof message, "[3] %s key[0x6911] sem_id[2147483647] errno[%d][%s]\n",
                 text, error, strerror(error));
        ASSERT_FALSE(record().log.empty());
        EXPECT_EQ(record().log.back(), row(function, 1, message));
    }
};

TEST_F(Locks, AreCreatedFreeAndForEveryone) {
    const int id = get();
    EXPECT_EQ(value(id), 1);
    semid_ds set = {};
    union {
        semid_ds *buf;
    } argument = {&set};
    ASSERT_EQ(semctl(id, 0, IPC_STAT, argument), 0);
    EXPECT_EQ(set.sem_perm.mode & 0777, 0666);
    EXPECT_EQ(set.sem_nsems, 1U);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Locks, AreFoundByTheNextProcess) {
    const int id = get();
    EXPECT_EQ(semaphore_p(id, kKey), 0);
    EXPECT_EQ(in_child([&] {
                  int found = -1;
                  return semaphore_get(kKey, &found) == 0 && found == id && value(found) == 0 ? 7
                                                                                              : 1;
              }),
              7);
}

TEST_F(Locks, ANullIdentifierPointerIsRefused) {
    EXPECT_EQ(semaphore_get(kKey, nullptr), 128);
    EXPECT_EQ(semget(kKey, 1, 0), -1);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Locks, TakeAndReleaseLeaveThemFree) {
    const int id = get();
    EXPECT_EQ(semaphore_p(id, kKey), 0);
    EXPECT_EQ(value(id), 0);
    EXPECT_EQ(semaphore_v(id, kKey), 0);
    EXPECT_EQ(value(id), 1);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Locks, AReleaseWithoutALockIsLoggedAndDone) {
    const int id = get();
    EXPECT_EQ(semaphore_v(id, 1), 0);
    EXPECT_EQ(value(id), 2);
    EXPECT_EQ(record().log,
              std::vector{row("semaphore_v", 1,
                              "[3] Error! in semaphore_v(), value[1] key[0x1] sem_id[" +
                                  std::to_string(id) + "]\n")});
}

TEST_F(Locks, ADyingHolderGivesTheLockBack) {
    const int id = get();
    EXPECT_EQ(in_child([&] { return semaphore_p(id, kKey) == 0 && value(id) == 0 ? 7 : 1; }), 7);
    EXPECT_EQ(value(id), 1);
}

TEST_F(Locks, AHeldLockIsWaitedFor) {
    const int id = get();
    ASSERT_EQ(semaphore_p(id, kKey), 0);
    bool released = false;
    std::thread waiter([&] {
        EXPECT_EQ(semaphore_p(id, kKey), 0);
        EXPECT_TRUE(released);
    });
    union {
        int val;
    } none = {0};
    while (semctl(id, 0, GETNCNT, none) == 0)
        std::this_thread::yield();
    released = true;
    EXPECT_EQ(semaphore_v(id, kKey), 0);
    waiter.join();
}

TEST_F(Locks, OneWhoseMakerWasKilledBeforeItSetItFreeIsMadeAnew) {
    const int made = semget(kKey, 1, IPC_CREAT | 0666);
    const int id = get();
    EXPECT_NE(id, made);
    EXPECT_EQ(value(id), 1);
}

TEST_F(Locks, OneThatItsMakerIsAboutToSetFreeIsWaitedFor) {
    const int made = semget(kKey, 1, IPC_CREAT | 0666);
    std::thread maker([&] {
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
        set_semvalue(made, kKey);
    });
    EXPECT_EQ(get(), made);
    EXPECT_EQ(value(made), 1);
    maker.join();
}

TEST_F(Locks, OneThatIsHeldIsTheSameForTheNext) {
    const int id = get();
    ASSERT_EQ(semaphore_p(id, kKey), 0);
    EXPECT_EQ(in_child([&] {
                  int found = -1;
                  return semaphore_get(kKey, &found) == 0 && found == id ? 7 : 8;
              }),
              7);
    EXPECT_EQ(semaphore_v(id, kKey), 0);
}

TEST_F(Locks, SetMakesThemFree) {
    const int id = get();
    ASSERT_EQ(semaphore_p(id, kKey), 0);
    EXPECT_EQ(set_semvalue(id, kKey), 0);
    EXPECT_EQ(value(id), 1);
}

TEST_F(Locks, CanBeRemoved) {
    const int id = get();
    EXPECT_EQ(del_semvalue(id, kKey), 0);
    EXPECT_EQ(semget(kKey, 1, 0), -1);
}

TEST_F(Locks, FailedSystemCallsAreLogged) {
    EXPECT_EQ(set_semvalue(kNoSuchId, kKey), 128);
    expect_failure("set_semvalue", "set_semvalue Failed.", EINVAL);
    EXPECT_EQ(del_semvalue(kNoSuchId, kKey), 128);
    expect_failure("del_semvalue", "del_semvalue Failed.", EINVAL);
    int value = 5;
    EXPECT_EQ(semaphore_getvalue(kNoSuchId, kKey, &value), 128);
    EXPECT_EQ(value, 5);
    expect_failure("semaphore_getvalue", "Failed to semaphore_getvalue.", EINVAL);
}

TEST_F(Locks, TakingReadsTheValueFirst) {
    EXPECT_EQ(semaphore_p(kNoSuchId, kKey), 128);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_EQ(record().log[0].ident, "semaphore_getvalue");
    expect_failure("semaphore_p", "Failed to Lock Semaphore.", EINVAL);
}

TEST_F(Locks, ReleasingReadsTheValueFirst) {
    EXPECT_EQ(semaphore_v(kNoSuchId, kKey), 128);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_EQ(record().log[0].ident, "semaphore_getvalue");
    expect_failure("semaphore_v", "Failed to Unlock Semaphore.", EINVAL);
}

TEST_F(Locks, ASetThatCannotBeOpenedIsLogged) {
    record().semget_fails = true;
    int id = 5;
    EXPECT_EQ(semaphore_get(kKey, &id), 128);
    EXPECT_EQ(id, 5);
    EXPECT_EQ(record().log,
              std::vector{row("semaphore_get", 1,
                              "[3] semget[0x6911] failed!!. errno[28][No space left on device]")});
}

TEST_F(Locks, AreAskedForWithTheirFlags) {
    get();
    get();
    EXPECT_EQ(record().semget_flags, (std::vector{0x7B6, 0x3B6, 0x7B6, 0x1B6}));
}

TEST_F(Locks, ANullValuePointerIsRefused) {
    EXPECT_EQ(semaphore_getvalue(get(), kKey, nullptr), 128);
}

// As system() and popen() do in another thread: with SIGCHLD blocked there, the signal goes to
// whichever thread has it not.
TEST_F(Locks, AreWaitedForWhileOtherThreadsRunCommands) {
    const int id = get();
    ASSERT_EQ(semaphore_p(id, kKey), 0);
    int taken = -1;
    std::thread waiter([&] { taken = semaphore_p(id, kKey); });
    while (semctl(id, 0, GETNCNT) == 0)
        std::this_thread::yield();
    sigset_t child;
    sigemptyset(&child);
    sigaddset(&child, SIGCHLD);
    sigset_t before;
    pthread_sigmask(SIG_BLOCK, &child, &before);
    for (int i = 0; i < 20; ++i)
        in_child([] { return 0; });
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
    EXPECT_EQ(semaphore_v(id, kKey), 0);
    waiter.join();
    EXPECT_EQ(taken, 0);
    EXPECT_EQ(value(id), 0);
    sigset_t now;
    pthread_sigmask(SIG_SETMASK, nullptr, &now);
    EXPECT_EQ(sigismember(&now, SIGCHLD), 0);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Locks, LeaveTheSignalMaskAsItWas) {
    const int id = get();
    ASSERT_EQ(semaphore_p(id, kKey), 0);
    sigset_t now;
    pthread_sigmask(SIG_SETMASK, nullptr, &now);
    EXPECT_EQ(sigismember(&now, SIGCHLD), 0);
}

} // namespace
