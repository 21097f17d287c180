// The report of the RAID controller, and the turns that its readers and the agent that writes it
// take.
#pragma once

#include "lock.h"

namespace zav {

constexpr const char *kReportPath = "/etc/Kiru/zav/.raidinfo";

class ReportTurn {
  public:
    static constexpr int kKey = 26898; // 0x6912

    // Waits for the turn. It ends with this object. ZAV_RC_ERR, logged under the name `reporter`,
    // without one. `told_key` is the key that semaphore_p's own log lines name.
    int take(const char *reporter, int told_key);

    void end() { lock_.release(kKey); }

  private:
    Lock lock_ = Lock(kKey);
};

} // namespace zav
