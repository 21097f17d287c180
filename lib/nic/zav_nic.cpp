// Link and speed of an Ethernet port, or of the active port of a bond.
#include "common/diag.h"
#include "common/shell.h"
#include "zav_api.h"
#include "zav_nic_parse.h"

#include <cstddef>

namespace {

using zav::Command;
using zav::CommandOutput;

constexpr int kPorts = 4;
constexpr int kBonds = 2;
constexpr int kLine = 80; // lines are read in pieces of at most 79 characters
constexpr size_t kName = 50;

// Silent, whatever their type.
#define TRACE(...) zavdbgmsg(zav::kTraceStep, 0, __VA_ARGS__)

int refuse(const char *message) {
    zavlogd(const_cast<char *>("zavGetStateNic"), zav::kAlert, ZAV_RC_ERR_EINVAL, "%s", message);
    return ZAV_RC_ERR_EINVAL;
}

// What is known before anybody was asked, and what stays where ethtool tells no link.
zavNetState undecided(const zavDevice &dev) {
    return {.type = ZAV_EVENT_NET, .dev = dev, .value = 0, .state = ZAV_NET_ERR};
}

int interface_name(const char *function, zavDevice *dev, char (&name)[kName]) {
    const int rc = zavDevToStr(name, sizeof name, dev);
    if (rc == ZAV_RC_OK)
        TRACE("%s() - device name returned from zavDevToStr: %s.\n", function, name);
    return rc;
}

bool exists(const char *function, const Command &command) {
    TRACE("%s() - cmd1: %s\n", function, command.text());
    return command.run() == 0;
}

int not_existing(zavNetState *info) {
    info->value = 0;
    info->state = ZAV_NET_NOT_EXIST;
    return ZAV_RC_OK;
}

// The driver's line about the active port. The code of a line that is missing is not that of one
// that cannot be understood.
int ask_active_port(const char *function, const char *bond, int &port) {
    const Command command("cat /proc/net/bonding/%s | grep \"Currently Active Slave\" 2>&1",
                          {bond});
    TRACE("%s() - cmd2: %s\n", function, command.text());
    CommandOutput output(command);
    if (!output)
        return ZAV_RC_ERR_ESTRPIPE;
    char line[kLine];
    if (!output.finished_line(line, sizeof line))
        return ZAV_RC_ERR_ENODEV;
    port = zav::active_port(line);
    return port == zav::kUnknownPort ? ZAV_RC_ERR_NIC : ZAV_RC_OK;
}

} // namespace

int zavGetStateNic(zavDevice *dev, zavNetState *info) {
    TRACE("%s() - Enter %s().\n", __func__, __func__);
    if (dev == nullptr || info == nullptr)
        return refuse("Arguments can't be null.");
    if (dev->type != ZAV_DEV_NIC)
        return refuse("Device's type is not ZAV_DEV_NIC. Return ZAV_RC_ERR_EINVAL.");
    if (dev->minor_type != ZAV_MINDEV_NIC_ETH && dev->minor_type != ZAV_MINDEV_NIC_BOND)
        return refuse("Input device's minor_type is neither ZAV_MINDEV_NIC_ETH nor "
                      "ZAV_MINDEV_NIC_BOND. Return ZAV_RC_ERR_EINVAL.");
    const zavDevice asked = *dev; // may be the one in the record
    *info = undecided(asked);
    return asked.minor_type == ZAV_MINDEV_NIC_ETH ? getNicStateETH(&info->dev, info)
                                                  : getNicStateBOND(&info->dev, info);
}

int getNicStateETH(zavDevice *dev, zavNetState *info) {
    if (dev == nullptr || info == nullptr || dev->disk < 1 || dev->disk > kPorts)
        return ZAV_RC_ERR_EINVAL;
    char name[kName];
    if (const int rc = interface_name(__func__, dev, name); rc != ZAV_RC_OK)
        return rc;
    if (!exists(__func__, Command("/sbin/ethtool %s > /dev/null  2>&1", {name})))
        return not_existing(info);

    const Command command("/sbin/ethtool %s 2>&1", {name});
    TRACE("%s() - cmd2: %s\n", __func__, command.text());
    CommandOutput output(command);
    if (!output)
        return ZAV_RC_ERR_ESTRPIPE;
    for (char line[kLine]; output.finished_line(line, sizeof line);)
        if (!zav::read_port_line(line, *info))
            return ZAV_RC_ERR_NIC;
    TRACE("%s() - eth's speed: %d.\n", __func__, info->value);
    TRACE("%s() - Link status: %d.\n", __func__, info->state);
    return ZAV_RC_OK;
}

int getNicStateBOND(zavDevice *dev, zavNetState *info) {
    if (dev == nullptr || info == nullptr || dev->disk < 1 || dev->disk > kBonds)
        return ZAV_RC_ERR_EINVAL;
    char name[kName];
    if (const int rc = interface_name(__func__, dev, name); rc != ZAV_RC_OK)
        return rc;
    if (!exists(__func__, Command("cat /proc/net/bonding/%s  >/dev/null 2>&1", {name})))
        return not_existing(info);

    int port = zav::kNoPort;
    if (const int rc = ask_active_port(__func__, name, port); rc != ZAV_RC_OK)
        return rc;
    if (port == zav::kNoPort) {
        info->state = ZAV_NET_DOWN;
        return ZAV_RC_OK;
    }
    zavDevice address = {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, port, 0};
    zavNetState state = undecided(address);
    const int rc = getNicStateETH(&address, &state);
    if (rc == ZAV_RC_OK) {
        info->value = state.value;
        info->state = state.state;
    }
    return rc;
}
