#include "zav_hwraid_cascade.h"

#include "common/raid_report.h"
#include "common/text.h"
#include "zav_api.h"

#include <cstdio>
#include <cstring>

namespace {

constexpr const char *kNoLink = "0000000000000000";

bool is_no_link(const char *address) {
    return strcmp(address, kNoLink) == 0;
}

using Address = char[sizeof(sExpander::sasaddr)];

// A link names its device by the first 16 digits; "800" makes an expander's own address of them. A
// line without an address leaves the link as it is.
void read_link(const char *line, Address &link) {
    Address address = "";
    getsasaddr(const_cast<char *>(line), address);
    if (is_no_link(address))
        memcpy(link, address, sizeof link);
    else if (*address != '\0')
        snprintf(link, sizeof link, "%.16s800", address);
}

sExpander *expander_at(sExpander *expanders, const char *address) {
    for (int i = 0; i < zav::Cascade::kExpanders; ++i)
        if (strncmp(expanders[i].sasaddr, address, sizeof(Address)) == 0)
            return &expanders[i];
    return nullptr;
}

sExpander *first_unit(sExpander *expanders) {
    for (int i = 0; i < zav::Cascade::kExpanders; ++i)
        if (expanders[i].id == zav::kFirstUnit)
            return &expanders[i];
    return nullptr;
}

} // namespace

namespace zav {

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

void getsasaddr(char *line, char *sasaddr) {
    if (line == nullptr || sasaddr == nullptr)
        return;
    constexpr const char *kSeparators = ":[]";
    const char *field = line + strspn(line, kSeparators);
    for (int skipped = 0; skipped < 3; ++skipped) {
        field += strcspn(field, kSeparators);
        field += strspn(field, kSeparators);
    }
    const size_t length = strcspn(field, kSeparators);
    if (length != 0)
        snprintf(sasaddr, sizeof(Address), "%.*s", static_cast<int>(length), field);
}

int SetRBODID(sExpander *sep, char *sasaddr, int id) {
    if (sep == nullptr)
        return ZAV_RC_OK;
    sExpander *expander = nullptr;
    if (id == 0) {
        expander = first_unit(sep);
        id = zav::kFirstUnit;
    } else if (sasaddr != nullptr && *sasaddr != '\0' && !is_no_link(sasaddr) &&
               id >= zav::kFirstUnit && id <= zav::kLastUnit) { // a loop of links ends here
        expander = expander_at(sep, sasaddr);
    }
    if (expander == nullptr)
        return ZAV_RC_OK;
    expander->iExist = 1;
    expander->id = id;
    SetRBODID(sep, expander->upperchild, 2 * id);
    return SetRBODID(sep, expander->lowerchild, 2 * id + 1);
}

int fillinfo(int id, sExpander *expander, sRBOD *rbod) {
    if (expander == nullptr || rbod == nullptr)
        return ZAV_RC_ERR_EINVAL;
    rbod->iExist = 1;
    rbod->id = id;
    memcpy(rbod->sasaddr, expander->sasaddr, sizeof rbod->sasaddr);
    rbod->parentid = id / 2;
    // By the place in the cascade, whatever was found there.
    rbod->upperchildid = is_no_link(expander->upperchild) ? -1 : 2 * id;
    rbod->lowerchildid = is_no_link(expander->lowerchild) ? -1 : 2 * id + 1;

    sRBODMap identity = {};
    identity.rbodid = id;
    if (zavGetRBODSN(&identity) != ZAV_RC_OK)
        return ZAV_RC_ERR;
    zav::copy_text(rbod->sn, sizeof rbod->sn, identity.sn);
    zav::copy_text(rbod->model, sizeof rbod->model, identity.model);
    return ZAV_RC_OK;
}
