// What mdadm says of the array that a partition belongs to, and of a faulty member; and what it is
// told to create an array anew.
#pragma once

#include <cstddef>

namespace zav {

struct ArrayQuery {
    char array[32]; // "" if there is none, or a name that does not fit
    char level[8];  // "" if none is told that the appliance knows

    bool is_complete() const { return array[0] != '\0' && level[0] != '\0'; }
    bool is_redundant() const;
};

// From "mdadm --query --examine --scan"; takes the text apart.
ArrayQuery read_array_query(char *text);

struct DeviceNumbers {
    int major;
    int minor;
};

// From a row of mdadm's device table; false if it has no such columns. Takes the row apart.
bool read_member_numbers(char *row, DeviceNumbers &numbers);

constexpr size_t kLongestCreation = 256;

// The command's form, with places for the array's name and its level, for a model of two to four
// disks; false, and nothing written, for another number. Whichever array it is, the members are the
// partitions 2 and the name is MD1: only the data array is ever created anew.
bool creation_form(char (&form)[kLongestCreation], int disks);

} // namespace zav
