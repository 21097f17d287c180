#include "zav_cdburn_progress_parse.h"

#include "common/diag.h"
#include "common/text.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <strings.h>

namespace zav {

namespace {

// How far it is from `begin` to 100; a job that begins at its end is done.
int percent_from(int64_t begin, int64_t now) {
    if (begin == 100)
        return 100;
    const int64_t percent = (now - begin) * 100 / (100 - begin);
    return static_cast<int>(std::clamp<int64_t>(percent, INT_MIN, INT_MAX));
}

} // namespace

void Progress::read_line(char *line) {
    const bool is_done = strncmp(line, "100", 3) == 0;
    const int done = to_int(line);
    if (contains(line, "done, estimate finish"))
        read_estimate(line);
    if (is_done)
        percent_ = done;
}

// The whole part of the percentage at the start of the line.
void Progress::read_estimate(char *line) {
    const char *number = Fields(line).next(".%");
    const int now = number == nullptr ? 0 : to_int(number);
    if (!begun_)
        begin_ = now;
    begun_ = true;
    percent_ = percent_from(begin_, now);
    ZAV_TRACE(kTraceParser, "initProgress: %d%%\n", begin_);
    ZAV_TRACE(kTraceParser, "currProgress: %d%%\n\n", now);
}

bool process_has_name(FILE *status, const char *name) {
    char line[200];
    while (fgets(line, sizeof line, status) != nullptr) {
        char *end = strchr(line, '\n');
        if (end == nullptr || strncasecmp(line, "name:", 5) != 0)
            continue;
        *end = '\0';
        const char *own_name = line + 5;
        own_name += strspn(own_name, " \t\v\f\r");
        return strcmp(own_name, name) == 0;
    }
    return false;
}

} // namespace zav
