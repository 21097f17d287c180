#include "tools/disc_writer.hpp"

#include "root/store.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <unistd.h>

namespace zavsim {

namespace {

constexpr double lead_in_seconds = 10;
constexpr double lead_out_seconds = 10;
constexpr std::size_t chunk = 32768;

// One chunk, or the rest; empty at the end and when a signal came.
std::string read_chunk(int fd) {
    std::string bytes(chunk, '\0');
    std::size_t got = 0;
    while (got < chunk && !is_signalled()) {
        const ssize_t length = read(fd, bytes.data() + got, chunk - got);
        if (length < 0 && errno == EINTR)
            continue;
        if (length <= 0)
            break;
        got += static_cast<std::size_t>(length);
    }
    bytes.resize(got);
    return bytes;
}

class Writer {
  public:
    explicit Writer(const WriteOrder &order) : order_(order), fault_(fails_at(order.tool)) {}

    Written run() {
        Written written;
        if (fault_ == 0)
            return {JobEnd::failed, 0, false};
        written.end = read_head();
        written.sectors = expected();
        if (written.end != JobEnd::done)
            return written;
        written.begun = true;
        written.end = write_all();
        written.sectors = sectors_of(bytes_);
        return written;
    }

  private:
    std::uint64_t expected() const { return order_.told != 0 ? order_.told : image_.sectors; }

    JobEnd read_head() {
        for (;;) {
            const std::string bytes = read_chunk(order_.input);
            if (is_signalled())
                return JobEnd::signalled;
            head_ += bytes;
            const auto image = read_image_head(head_);
            if (image)
                image_ = *image;
            if (head_.empty() || (!image && bytes.empty()))
                return JobEnd::cut_short;
            if (image)
                return expected() > order_.room ? JobEnd::full : JobEnd::done;
        }
    }

    DiscJob job() {
        Turn turn;
        const OpticalDrive &drive = turn.state().drive;
        speed_ = writing_speed(drive, kind_of(drive.medium->type));
        DiscJob job;
        job.tool = order_.tool;
        job.kind = order_.kind;
        job.closes = order_.closes;
        job.session.start = order_.start;
        job.session.sectors = expected();
        job.session.merges = image_.merges;
        job.seconds = lead_in_seconds + data_seconds(expected() * disc_sector) + lead_out_seconds;
        return job;
    }

    double data_seconds(std::uint64_t bytes) const {
        return static_cast<double>(bytes) / 1024 / speed_;
    }

    bool is_to_fail() const {
        return fault_ && expected() != 0 &&
               bytes_ * 100 >= expected() * disc_sector * static_cast<std::uint64_t>(*fault_);
    }

    JobEnd take(const std::string &bytes, JobRun &run) {
        bytes_ += bytes.size();
        if (sectors_of(bytes_) > order_.room)
            return JobEnd::full;
        const JobEnd end = run.wait_until(lead_in_seconds + data_seconds(bytes_));
        if (end == JobEnd::done && is_to_fail())
            return JobEnd::failed;
        const std::uint64_t step = std::max<std::uint64_t>(expected() / 20, 1) * disc_sector;
        if (end == JobEnd::done && order_.show && bytes_ / step != shown_) {
            shown_ = bytes_ / step;
            order_.show(sectors_of(bytes_));
        }
        return end;
    }

    JobEnd write_all() {
        JobRun run(job());
        JobEnd end = take(head_, run);
        while (end == JobEnd::done) {
            const std::string bytes = read_chunk(order_.input);
            if (is_signalled())
                return JobEnd::signalled;
            if (bytes.empty())
                break;
            end = take(bytes, run);
        }
        if (end == JobEnd::done &&
            (order_.whole_image ? expected() : order_.told) > sectors_of(bytes_))
            end = JobEnd::cut_short;
        if (end == JobEnd::done)
            end = run.wait_until(lead_in_seconds + data_seconds(bytes_) + lead_out_seconds);
        if (end == JobEnd::done)
            run.finish(session());
        return end;
    }

    DiscSession session() const {
        DiscSession session;
        session.start = order_.start;
        session.merges = image_.merges;
        session.sectors =
            (sectors_of(bytes_) + order_.multiple - 1) / order_.multiple * order_.multiple;
        session.files = files_within(image_, sectors_of(bytes_));
        return session;
    }

    const WriteOrder &order_;
    std::optional<int> fault_;
    DiscImage image_;
    std::string head_;
    std::uint64_t bytes_ = 0;
    std::uint64_t shown_ = 0;
    int speed_ = 1;
};

} // namespace

int writing_speed(const OpticalDrive &drive, const MediumKind &kind) {
    return drive.speed > 0 ? std::min(drive.speed, kind.speed) : kind.speed;
}

Written write_disc(const WriteOrder &order) {
    return Writer(order).run();
}

} // namespace zavsim
