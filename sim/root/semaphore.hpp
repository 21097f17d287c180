// The System V semaphore under which the RAID controller's report is read and written. Whoever
// comes first makes it.
#pragma once

namespace zavsim {

class ReportSemaphore {
  public:
    enum class Patience { none, endless };

    // Takes it, or finds it held; gives it back in the end, also when the process dies.
    explicit ReportSemaphore(Patience patience);
    ~ReportSemaphore();
    ReportSemaphore(const ReportSemaphore &) = delete;
    ReportSemaphore &operator=(const ReportSemaphore &) = delete;
    bool is_held() const { return held_; }

  private:
    int id_;
    bool held_;
};

} // namespace zavsim
