// What fuzzing has found, and the outputs of real tools, through every target again.
#include "targets.h"

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <vector>

namespace {

namespace fs = std::filesystem;

std::vector<std::uint8_t> bytes_of(const fs::path &file) {
    std::ifstream stream(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

class Replay : public testing::TestWithParam<fuzz::Target> {
  protected:
    static int replay(const fs::path &directory) {
        int files = 0;
        if (!fs::exists(directory))
            return 0;
        for (const auto &entry : fs::recursive_directory_iterator(directory))
            if (entry.is_regular_file()) {
                GetParam().run(bytes_of(entry.path()));
                ++files;
            }
        return files;
    }
};

TEST_P(Replay, OfRealOutputsHolds) {
    EXPECT_GT(replay(CAPTURES), 100);
}

TEST_P(Replay, OfEarlierFindingsHolds) {
    replay(fs::path(REGRESSIONS) / GetParam().name);
}

TEST_P(Replay, OfEveryByteAndNoneHolds) {
    GetParam().run({});
    std::vector<std::uint8_t> all(256);
    for (std::size_t i = 0; i < all.size(); ++i)
        all[i] = static_cast<std::uint8_t>(i);
    GetParam().run(all);
}

INSTANTIATE_TEST_SUITE_P(Targets, Replay, testing::ValuesIn(fuzz::targets()),
                         [](const auto &row) { return row.param.name; });

} // namespace
