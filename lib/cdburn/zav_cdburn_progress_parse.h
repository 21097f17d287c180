// What the progress file and a process's status file say.
#pragma once

#include <cstdio>

namespace zav {

// Lines of the progress file, each at most 79 characters of it; the last that tells something wins.
class Progress {
  public:
    void read_line(char *line);

    // 0 to 100 for the tools' own output.
    int percent() const { return percent_; }

  private:
    void read_estimate(char *line);

    bool begun_ = false;
    int begin_ = 0; // the percentage from which is counted
    int percent_ = 0;
};

// Does the process's own line, "Name:" and its name, say exactly this?
bool process_has_name(FILE *status, const char *name);

} // namespace zav
