// Lines of the system log.
#include "harness.h"

namespace {

using harness::record;
using harness::row;

class Log : public harness::Appliance {};

int log_line(const char *function, int priority, int number, const char *text) {
    return zavlogd(const_cast<char *>(function), priority, number, "%s", text);
}

TEST_F(Log, NamesTheReporterAndTheNumber) {
    EXPECT_EQ(log_line("zavGetModel", 4, 22, "Failed to call zavGetModelBIOS()."), 0);
    EXPECT_EQ(record().log,
              std::vector{row("zavGetModel", 4, "[22] Failed to call zavGetModelBIOS().")});
    EXPECT_FALSE(record().log_is_open);
}

TEST_F(Log, TakesNegativeNumbersAndPercentSigns) {
    log_line("f", 1, -1, "100% %s");
    EXPECT_EQ(record().log, std::vector{row("f", 1, "[-1] 100% %s")});
}

TEST_F(Log, CutsLongMessages) {
    log_line("f", 1, 0, std::string(2000, 'x').c_str());
    EXPECT_EQ(record().log, std::vector{row("f", 1, "[0] " + std::string(511, 'x'))});
}

} // namespace
