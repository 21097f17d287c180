#include "times.h"

#include <fmt/format.h>

#include <cstdlib>

namespace zavctl {

namespace {

std::tm local(std::time_t moment) {
    std::tm parts{};
    localtime_r(&moment, &parts);
    return parts;
}

// "+01:00" east of Greenwich.
std::string offset(const std::tm &parts) {
    const long minutes = std::labs(parts.tm_gmtoff) / 60;
    return fmt::format("{}{:02}:{:02}", parts.tm_gmtoff < 0 ? '-' : '+', minutes / 60,
                       minutes % 60);
}

} // namespace

std::string rfc3339(std::time_t moment) {
    const std::tm parts = local(moment);
    return fmt::format("{:04}-{:02}-{:02}T{}{}", parts.tm_year + 1900, parts.tm_mon + 1,
                       parts.tm_mday, time_of_day(moment), offset(parts));
}

std::string time_of_day(std::time_t moment) {
    const std::tm parts = local(moment);
    return fmt::format("{:02}:{:02}:{:02}", parts.tm_hour, parts.tm_min, parts.tm_sec);
}

} // namespace zavctl
