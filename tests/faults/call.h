// A call of an exported function, watched: what it leaves behind, what it answers, what it writes.
#pragma once

#include "board.h"

#include <cstring>
#include <exception>
#include <string>
#include <tuple>
#include <type_traits>
#include <unistd.h>
#include <vector>

namespace faults {

// An exported function and what its description says that it answers.
struct Function {
    const char *name;
    std::vector<long> codes; // empty: any number
    int number;
};

// The number of the exported function that a test has called, -1 outside of one.
int running_function();

int blocks_held();
void begin_call();

const std::vector<Function> &functions();
const Function &function_named(const char *name);

// The library has ended the process. Some queries may.
void ended_by_library();

// From before to after the outermost call that a test makes.
class Watch {
  public:
    explicit Watch(const Function &function);
    ~Watch();
    Watch(const Watch &) = delete;
    Watch &operator=(const Watch &) = delete;

    void answered(long code) const;
    void overrun(bool intact) const;

  private:
    void look() const;

    const Function &function_;
    bool outermost_;
    bool other_threads_;
    int descriptors_;
    std::vector<std::string> files_;
    std::vector<int> semaphores_;
};

constexpr unsigned char kGuard = 0xA5;

// An argument as it is; a record between bytes that must not change.
template <class Argument>
struct Guarded {
    explicit Guarded(Argument argument) : value(argument) {}
    Argument given() { return value; }
    bool give_back() { return true; }
    Argument value;
};

// Not for records whose size the caller does not know, and those of which a table is handed over.
template <class Record>
constexpr bool is_table = false;

template <class Record>
requires(std::is_class_v<Record> &&requires { sizeof(Record); } &&
         !is_table<Record>) struct Guarded<Record *> {
    explicit Guarded(Record *record) : original(record) {
        std::memset(before, kGuard, sizeof before);
        std::memset(after, kGuard, sizeof after);
        if (original != nullptr)
            std::memcpy(copy, original, sizeof copy);
    }
    Record *given() { return original == nullptr ? nullptr : reinterpret_cast<Record *>(copy); }
    bool give_back() {
        if (original != nullptr)
            std::memcpy(original, copy, sizeof copy);
        for (std::size_t i = 0; i < sizeof before; ++i)
            if (before[i] != kGuard || after[i] != kGuard)
                return false;
        return true;
    }
    Record *original;
    alignas(16) unsigned char before[64];
    alignas(16) unsigned char copy[sizeof(Record)];
    unsigned char after[64];
};

template <class Result, class... Parameters, class... Arguments>
Result watched(const Function &function, Result (*real)(Parameters...), Arguments... arguments) {
    Watch watch(function);
    std::tuple<Guarded<Arguments>...> guarded{Guarded<Arguments>(arguments)...};
    const auto call = [&](auto &...guard) -> Result { return real(guard.given()...); };
    const auto intact = [](auto &...guard) { return (guard.give_back() & ... & true); };
    if constexpr (std::is_void_v<Result>) {
        std::apply(call, guarded);
        watch.overrun(std::apply(intact, guarded));
    } else {
        const Result result = std::apply(call, guarded);
        watch.overrun(std::apply(intact, guarded));
        if constexpr (std::is_integral_v<Result>)
            watch.answered(static_cast<long>(result));
        return result;
    }
}

} // namespace faults
