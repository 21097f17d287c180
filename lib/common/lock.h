// A semaphore between processes, given back on every path.
#pragma once

#include "zav_api.h"

namespace zav {

class Lock {
  public:
    explicit Lock(int key) : key_(key) {}
    Lock(const Lock &) = delete;
    Lock &operator=(const Lock &) = delete;
    ~Lock() {
        if (held_)
            release(key_);
    }

    // Codes are those of semaphore_get, semaphore_p and semaphore_v. `told_key` is the key that
    // their log lines name.
    int get() { return semaphore_get(key_, &id_); }

    int take(int told_key) {
        const int rc = semaphore_p(id_, told_key);
        held_ = rc == ZAV_RC_OK;
        return rc;
    }

    int release(int told_key) {
        held_ = false;
        return semaphore_v(id_, told_key);
    }

    // Gives the lock up early and once more at the end.
    void release_early() { semaphore_v(id_, key_); }

  private:
    int key_;
    int id_ = -1;
    bool held_ = false;
};

} // namespace zav
