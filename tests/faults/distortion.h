// Answers of tools as they should not be.
#pragma once

#include "board.h"

#include <vector>

namespace faults {

// The wrong answers that differ from what a command has printed, which is so many bytes.
std::vector<Fate> wrong_answers(std::size_t output);

void distort_answer(harness::Outcome &outcome, Fate fate, std::size_t cut);

} // namespace faults
