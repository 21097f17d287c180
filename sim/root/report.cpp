#include "root/report.hpp"

#include "launcher/sandbox.hpp"
#include "model/texts_controller.hpp"
#include "root/clock.hpp"
#include "root/files.hpp"
#include "root/semaphore.hpp"

#include <cerrno>
#include <fcntl.h>
#include <filesystem>
#include <string>
#include <system_error>
#include <unistd.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

constexpr const char *report_path = "/etc/Kiru/zav/.raidinfo";

// What was written last. A program's own text in the report's place stays until the agent has
// something new to say.
const std::string written_path = place::run + "/report";

constexpr const char *report_mark = "report\n";

std::string remembered(const std::optional<std::string> &report) {
    return report ? report_mark + *report : "none\n";
}

// The latest rewrite that has begun.
const std::string begun_path = place::run + "/rewrites";

// In place, as the agent does it: who reads without the semaphore may find nothing, or a part.
class ReportFile {
  public:
    ReportFile() : file_(open(report_path, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644)) {}
    void add(const std::string &text) {
        if (write(file_.get(), text.data(), text.size()) != static_cast<ssize_t>(text.size()))
            throw std::system_error(errno, std::generic_category(), report_path);
    }

  private:
    Descriptor file_;
};

void rewrite_slowly(int number, double seconds) {
    const ReportSemaphore semaphore(ReportSemaphore::Patience::endless);
    const std::string text = read_text(written_path).value_or("");
    if (text.rfind(report_mark, 0) != 0)
        return;
    const std::string report = text.substr(std::string(report_mark).size());
    const std::string half = first_half(report);
    ReportFile file;
    file.add(half);
    write_text(begun_path, std::to_string(number));
    sleep_unscaled(seconds);
    file.add(report.substr(half.size()));
}

} // namespace

bool publish_report(const State &state) {
    if (!state.controller)
        return true;
    const auto report = report_file(state);
    if (read_text(written_path) == remembered(report))
        return true;
    const ReportSemaphore semaphore(ReportSemaphore::Patience::none);
    if (!semaphore.is_held())
        return false;
    if (report)
        ReportFile().add(*report);
    else
        fs::remove(report_path);
    write_text(written_path, remembered(report));
    return true;
}

void start_slow_rewrite(const State &state) {
    const int number = state.controller->slow_rewrites;
    const double seconds = state.controller->rewrite_seconds / state.time_scale;
    const pid_t agent = fork();
    if (agent < 0)
        throw std::system_error(errno, std::generic_category(), "fork");
    if (agent > 0)
        return;
    int status = 0;
    try {
        rewrite_slowly(number, seconds);
    } catch (const std::exception &) {
        status = 1;
    }
    _exit(status);
}

bool slow_rewrite_has_begun(int number) {
    const auto text = read_text(begun_path);
    return number == 0 || (text && std::stoi(*text) >= number);
}

} // namespace zavsim
