// Runs zavsim as a user would and catches what it shows.
#pragma once

#include <string>
#include <vector>

struct Outcome {
    int status = -1; // exit status; 128 + signal when a signal ended it
    std::string out;
    std::string err;
};

// `words` behind "zavsim".
Outcome zavsim(const std::vector<std::string> &words);

// A shell script on an appliance.
Outcome on_appliance(const std::string &script, std::vector<std::string> options = {});

// Any program of this machine.
Outcome execute(const std::vector<std::string> &words);

// A file for the time of one test, in a directory of its own.
class ScratchFile {
  public:
    explicit ScratchFile(const std::string &text);
    ~ScratchFile();
    ScratchFile(const ScratchFile &) = delete;
    ScratchFile &operator=(const ScratchFile &) = delete;
    const std::string &path() const { return path_; }
    const std::string &directory() const { return directory_; }

  private:
    std::string directory_;
    std::string path_;
};
