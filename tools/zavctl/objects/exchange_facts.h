// Everything that an exchange of a disk is decided by, asked and read.
#pragma once

#include "../core/exchange.h"
#include "objects.h"

namespace zavctl {

ExchangeFacts removal_facts(Session &session, int slot);
ExchangeFacts addition_facts(Session &session, int slot);

Aftermath read_aftermath(const ExchangeFacts &before);

// Waits for a disk's device while the kernel makes it; false if none comes.
bool wait_for_device(int slot);
// ... and for it to go.
bool wait_until_gone(int slot);

// The volumes of the group with who uses them. They must have been asked.
std::vector<VolumeFact> volume_facts(const std::vector<VolumeReport> &volumes, int group);

} // namespace zavctl
