// The pure part of a volume group's query: its metadata backup.
#include "storage/zav_lvm_backup.h"

#include "texts.h"

#include <algorithm>
#include <benchmark/benchmark.h>
#include <cstring>
#include <string>

namespace {

// Lines of a text; devices and file systems cost nothing.
class Text final : public zav::BackupSource {
  public:
    explicit Text(const std::string &text) : text_(text) {}

    bool line(char *buffer, int size) override {
        if (at_ == text_.size())
            return false;
        const std::size_t end = std::min(text_.find('\n', at_), text_.size() - 1) + 1;
        const std::size_t length = std::min(end - at_, static_cast<std::size_t>(size) - 1);
        memcpy(buffer, text_.data() + at_, length);
        buffer[length] = '\0';
        at_ += length;
        return true;
    }

    Found find_device(const char *, zavDevice &device) override {
        device = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
        return Found::kYes;
    }

    void measure(lvmLV &) override {}

  private:
    const std::string &text_;
    std::size_t at_ = 0;
};

void read(benchmark::State &state) {
    const int physical = static_cast<int>(state.range(0));
    const int logical = static_cast<int>(state.range(1));
    const std::string text = bench::backup_text(physical, logical);
    for (auto _ : state) {
        lvmVG group = {};
        group.pvcount = physical;
        group.lvcount = logical;
        Text source(text);
        if (zav::read_backup(source, group) != ZAV_RC_OK ||
            group.lvdev[logical - 1].lvmdev.disk != logical)
            state.SkipWithError("read as another group");
        benchmark::DoNotOptimize(group);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK(read)->Name("read_backup")->Args({1, 2})->Args({9, 6});

} // namespace
