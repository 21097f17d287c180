// What mdadm says of the array that a partition belongs to, and of a faulty member.
#pragma once

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

} // namespace zav
