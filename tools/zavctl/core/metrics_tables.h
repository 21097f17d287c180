// Which numbers and states of the answers' records are metrics.
#pragma once

#include <span>

namespace zavctl {

// A label and the record's field that gives its value; both null for none.
struct LabelField {
    const char *label;
    const char *field;
};

// A number of each record, such as the reading of a sensor.
struct Measure {
    const char *family;
    const char *help;
    const char *key;    // of the records
    const char *filter; // the field that tells whether a record is meant, "" for all
    const char *word;   // what it then says
    LabelField labels[2];
    const char *object; // of the record that holds the number, "" for the record itself
    const char *field;
    double divisor; // to the base unit
};

// One series for each state that a thing can have: 1 for the one that it has.
struct StateSet {
    const char *family;
    const char *help;
    const char *key;
    LabelField labels[2];
    const char *field;
    const char *states[6]; // and "unknown"; null behind the last
};

std::span<const Measure> measures();
std::span<const StateSet> state_sets();

} // namespace zavctl
