#include "zav_hwraid_cascade.h"

#include "common/raid_report.h"
#include "common/text.h"
#include "zav_api.h"

#include <cstdio>
#include <cstring>

namespace {

using Address = char[sizeof(sExpander::sasaddr)];

// A link names its device by the first 16 digits; "800" makes an expander's own address of them. A
// line without an address leaves the link as it is.
void read_link(const char *line, Address &link) {
    Address address = "";
    getsasaddr(const_cast<char *>(line), address);
    if (zav::is_no_link(address))
        memcpy(link, address, sizeof link);
    else if (*address != '\0')
        snprintf(link, sizeof link, "%.16s800", address);
}

} // namespace

namespace zav {

bool is_no_link(const char *address) {
    return strcmp(address, "0000000000000000") == 0;
}

bool Cascade::take(const char *line) {
    if (current == kExpanders) // more than the appliance can have
        return true;
    sExpander &expander = expanders[current];
    if (contains(line, "phy   0")) {
        expander.iExist = 1;
        getsasaddr(const_cast<char *>(line), expander.sasaddr);
    } else if (contains(line, "phy   4")) {
        if (contains(line, "SSP+STP+SMP"))
            expander.id = kFirstUnit;
        read_link(line, expander.parent);
        return !is_no_link(expander.parent);
    } else if (contains(line, "phy  10")) {
        read_link(line, expander.upperchild);
        ++current;
    } else if (contains(line, "phy   8")) {
        read_link(line, expander.lowerchild);
    }
    return true;
}

} // namespace zav
