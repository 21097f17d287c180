// What is in the optical drive, judged and shown.
#pragma once

#include "disc.h"

namespace zavctl {

Severity severity(const DiscReport &report);
std::string disc_note(const DiscReport &report);
Json disc_json(const DiscReport &report);
Section disc_section(const DiscReport &report);

} // namespace zavctl
