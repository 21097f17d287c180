// /proc is an ordinary directory here, so that the appliance's files can stand in it. Programs
// that look at a process by its number (the leak checker among them) find it through a link.
#pragma once

namespace zavsim {

class ProcessLinks {
  public:
    // Links the numbers that the next processes will get. To be called often enough that no
    // program starts more than `ahead` processes in between.
    void extend();

  private:
    static constexpr int ahead = 3000;
    int linked_up_to_ = 0;
};

} // namespace zavsim
