#include "root/semaphore.hpp"

#include <cerrno>
#include <sys/sem.h>
#include <system_error>

namespace zavsim {

namespace {

constexpr key_t report_key = 0x6912;

union Argument {
    int value;
};

int open_semaphore() {
    const int made = semget(report_key, 1, IPC_CREAT | IPC_EXCL | 0666);
    if (made >= 0) {
        Argument free_now{1};
        semctl(made, 0, SETVAL, free_now);
        return made;
    }
    const int found = semget(report_key, 1, 0);
    if (found < 0)
        throw std::system_error(errno, std::generic_category(), "semaphore of the report");
    return found;
}

bool step(int id, int direction, int flags) {
    sembuf operation{0, static_cast<short>(direction), static_cast<short>(flags)};
    while (semop(id, &operation, 1) != 0)
        if (errno != EINTR)
            return false;
    return true;
}

} // namespace

ReportSemaphore::ReportSemaphore(Patience patience)
    : id_(open_semaphore()),
      held_(step(id_, -1, SEM_UNDO | (patience == Patience::none ? IPC_NOWAIT : 0))) {}

ReportSemaphore::~ReportSemaphore() {
    if (held_)
        step(id_, 1, SEM_UNDO);
}

} // namespace zavsim
