// How people name a disk or an array.
#pragma once

#include "zav.h"

#include <optional>
#include <string>
#include <string_view>

namespace zavctl {

// "3": of the machine itself, its RAID controller included. "2-3": of expansion unit 2.
struct SlotId {
    int unit = 0; // 0: none
    int number = 0;
};

std::optional<SlotId> slot_id(std::string_view word);

// Unit and number of an address, whose type decides whether it holds both.
SlotId slot_id(const zavDevice &device);

// Both in one, as addresses behind an expansion unit have them.
int packed(const SlotId &id);

std::string in_words(const SlotId &id);

} // namespace zavctl
