// The process table, read to its end for a name that no process has.
#include "growth.h"
#include "require.h"
#include "zav_api.h"

#include <cstdio>
#include <dirent.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>

namespace fs = std::filesystem;

namespace bench {

namespace {

constexpr int kFirst = 1'000'001;

std::string directory_of(int number) {
    return "/proc/" + std::to_string(number);
}

// Made processes in /proc, which is the private root's own: none but these.
class ProcessTable {
  public:
    ProcessTable() {
        std::vector<fs::path> others;
        for (const fs::directory_entry &entry : fs::directory_iterator("/proc"))
            if (entry.path().filename().string().find_first_not_of("0123456789") ==
                std::string::npos)
                others.push_back(entry.path());
        std::ifstream own("/proc/self/status");
        std::ofstream(kStatus) << std::string(std::istreambuf_iterator<char>(own), {});
        for (const fs::path &path : others)
            fs::remove(path);
    }

    void resize(int processes) {
        for (; size_ < processes; ++size_) {
            const std::string directory = directory_of(kFirst + size_);
            fs::create_directory(directory);
            fs::create_hard_link(kStatus, directory + "/status");
        }
        while (size_ > processes)
            fs::remove_all(directory_of(kFirst + --size_));
    }

  private:
    static constexpr const char *kStatus = "/run/zav_bench_status";
    int size_ = 0;
};

// As any program has to, with the C library alone.
void read_bare() {
    DIR *processes = opendir("/proc");
    require(processes != nullptr, "/proc");
    while (const dirent *entry = readdir(processes)) {
        if (entry->d_name[0] < '0' || entry->d_name[0] > '9')
            continue;
        FILE *status = fopen(("/proc/" + std::string(entry->d_name) + "/status").c_str(), "re");
        char line[200] = "";
        require(status != nullptr && fgets(line, sizeof line, status) != nullptr, entry->d_name);
        fclose(status);
    }
    closedir(processes);
}

void look_for_none() {
    require(PIDOF("no_such", 1) == 1, "PIDOF");
}

Growth growth(const char *name, const std::shared_ptr<ProcessTable> &table, void (*call)()) {
    return {name,
            "process",
            {10, 100, 1000, 10000, 30000},
            [=](int size) {
                table->resize(size);
                return call;
            },
            3};
}

} // namespace

std::vector<Growth> growth_of_processes() {
    const auto table = std::make_shared<ProcessTable>();
    return {growth("PIDOF: the process table", table, look_for_none),
            growth("the same table read bare, the kernel's own growth", table, read_bare)};
}

} // namespace bench
