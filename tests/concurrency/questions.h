// What the library is asked, and told, by many at once.
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace concurrency {

struct Question {
    const char *name;
    std::function<std::string()>
        ask;           // what the answer is worth, byte by byte; equal if the answers are
    std::string right; // what one who asks alone is told
};

// Those that this model answers.
std::vector<Question> questions();

// One of the changes after which every answer stays what it was, chosen by `number`.
void change(unsigned number);

} // namespace concurrency
