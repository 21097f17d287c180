// Locks between processes: System V semaphores of one binary semaphore each.
#include "common/diag.h"
#include "zav_api.h"
#include "zav_private.h"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <sys/ipc.h>
#include <sys/sem.h>
#include <time.h>

namespace {

constexpr int kMode = 0666; // processes of any user share a lock
constexpr int kLogNumber = 3;
constexpr long kStepMillis = 10;
constexpr long kCreatorMillis =
    1000; // patience with whoever made a semaphore and is to set it free

// `format` takes the key, the identifier, the error number and its text.
#define LOG_FAILURE(format, key, sem_id)                                                           \
    do {                                                                                           \
        const int error = errno;                                                                   \
        ZAV_LOG(zav::kAlert, kLogNumber, format, static_cast<unsigned>(key), sem_id, error,        \
                strerror(error));                                                                  \
    } while (false)

// Holds SIGCHLD back from this thread. Where another thread runs a command, which it does with
// SIGCHLD blocked, the signal of its child would end this thread's wait.
class ChildSignalHeld {
  public:
    ChildSignalHeld() {
        sigset_t child;
        sigemptyset(&child);
        sigaddset(&child, SIGCHLD);
        pthread_sigmask(SIG_BLOCK, &child, &before_);
    }
    ChildSignalHeld(const ChildSignalHeld &) = delete;
    ChildSignalHeld &operator=(const ChildSignalHeld &) = delete;
    ~ChildSignalHeld() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }

  private:
    sigset_t before_ = {};
};

// The kernel takes the step back if this process dies before it does so itself.
bool change_value(int sem_id, short step) {
    sembuf operation = {0, step, SEM_UNDO};
    return semop(sem_id, &operation, 1) == 0;
}

// A new semaphore that was not set free would hold up everybody for ever; the next caller makes
// another.
void remove_unset(int created) {
    if (created >= 0)
        semctl(created, 0, IPC_RMID);
}

// At 0 without ever having been taken. Asked in this order, so that one which is set free and taken
// in between does not look like it.
bool is_unset(int sem_id) {
    semid_ds about = {};
    semun argument = {};
    argument.buf = &about;
    return semctl(sem_id, 0, GETVAL) == 0 && semctl(sem_id, 0, IPC_STAT, argument) == 0 &&
           about.sem_otime == 0;
}

// Whoever made it was killed before it could set it free.
bool stays_unset(int sem_id) {
    const timespec step = {0, kStepMillis * 1'000'000};
    for (long waited = 0; is_unset(sem_id); waited += kStepMillis) {
        if (waited >= kCreatorMillis)
            return true;
        nanosleep(&step, nullptr);
    }
    return false;
}

// The identifiers of the semaphore, and of the one that had to be made for it; -1 where there is
// none.
struct Opened {
    int found;
    int created;
};

Opened open_semaphore(int key, const char *caller) {
    const int created = semget(key, 1, IPC_CREAT | IPC_EXCL | kMode);
    if (created < 0) {
        ZAV_TRACE(zav::kTraceStep, "%s() - Semaphore[0x%x] Exist.\n", caller,
                  static_cast<unsigned>(key));
        return {semget(key, 1, kMode), created};
    }
    ZAV_TRACE(zav::kTraceStep, "%s() - Semaphore[%d][0x%x] Not Exist.\n", caller, created,
              static_cast<unsigned>(key));
    return {semget(key, 1, IPC_CREAT | kMode), created};
}

} // namespace

int semaphore_get(int key, int *sem_id) {
    if (sem_id == nullptr)
        return ZAV_RC_ERR;
    Opened set = open_semaphore(key, __func__);
    if (set.created < 0 && set.found >= 0 && stays_unset(set.found)) {
        remove_unset(set.found);
        set = open_semaphore(key, __func__);
    }
    const auto [found, created] = set;
    if (found < 0) {
        const int error = errno;
        ZAV_LOG(zav::kAlert, kLogNumber, "semget[0x%x] failed!!. errno[%d][%s]",
                static_cast<unsigned>(key), error, strerror(error));
        remove_unset(created);
        return ZAV_RC_ERR;
    }
    *sem_id = found;
    if (created < 0)
        return ZAV_RC_OK;
    const int rc = set_semvalue(found, key);
    if (rc != ZAV_RC_OK)
        remove_unset(created);
    return rc;
}

int set_semvalue(int sem_id, int key) {
    semun argument = {};
    argument.val = 1;
    if (semctl(sem_id, 0, SETVAL, argument) < 0) {
        LOG_FAILURE("set_semvalue Failed. key[0x%x] sem_id[%d] errno[%d][%s]\n", key, sem_id);
        return ZAV_RC_ERR;
    }
    return ZAV_RC_OK;
}

int del_semvalue(int sem_id, int key) {
    if (semctl(sem_id, 0, IPC_RMID) < 0) {
        LOG_FAILURE("del_semvalue Failed. key[0x%x] sem_id[%d] errno[%d][%s]\n", key, sem_id);
        return ZAV_RC_ERR;
    }
    return ZAV_RC_OK;
}

int semaphore_p(int sem_id, int key) {
    int value;
    semaphore_getvalue(sem_id, key, &value);
    const ChildSignalHeld held;
    if (!change_value(sem_id, -1)) {
        LOG_FAILURE("Failed to Lock Semaphore. key[0x%x] sem_id[%d] errno[%d][%s]\n", key, sem_id);
        return ZAV_RC_ERR;
    }
    return ZAV_RC_OK;
}

// A release without a lock is told, and done all the same.
int semaphore_v(int sem_id, int key) {
    int value;
    if (semaphore_getvalue(sem_id, key, &value) == ZAV_RC_OK && value == 1)
        ZAV_LOG(zav::kAlert, kLogNumber,
                "Error! in semaphore_v(), value[%d] key[0x%x] sem_id[%d]\n", value,
                static_cast<unsigned>(key), sem_id);
    if (!change_value(sem_id, 1)) {
        LOG_FAILURE("Failed to Unlock Semaphore. key[0x%x] sem_id[%d] errno[%d][%s]\n", key,
                    sem_id);
        return ZAV_RC_ERR;
    }
    return ZAV_RC_OK;
}

int semaphore_getvalue(int sem_id, int key, int *pValue) {
    if (pValue == nullptr)
        return ZAV_RC_ERR;
    const int value = semctl(sem_id, 0, GETVAL);
    if (value < 0) {
        LOG_FAILURE("Failed to semaphore_getvalue. key[0x%x] sem_id[%d] errno[%d][%s]\n", key,
                    sem_id);
        return ZAV_RC_ERR;
    }
    *pValue = value;
    return ZAV_RC_OK;
}
