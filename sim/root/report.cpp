#include "root/report.hpp"

#include "launcher/sandbox.hpp"
#include "model/texts_controller.hpp"
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

std::string remembered(const std::optional<std::string> &report) {
    return report ? "report\n" + *report : "none\n";
}

// In place, as the agent does it: who reads without the semaphore may find nothing, or a part.
void rewrite(const std::string &text) {
    const Descriptor file(open(report_path, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644));
    if (file.get() < 0 ||
        write(file.get(), text.data(), text.size()) != static_cast<ssize_t>(text.size()))
        throw std::system_error(errno, std::generic_category(), report_path);
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
        rewrite(*report);
    else
        fs::remove(report_path);
    write_text(written_path, remembered(report));
    return true;
}

} // namespace zavsim
