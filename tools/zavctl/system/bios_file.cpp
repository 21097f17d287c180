#include "bios_file.h"

#include "files.h"
#include "library.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <sys/stat.h>
#include <unistd.h>

namespace zavctl {

namespace {

std::string directory_of(const std::string &file) {
    const std::string parent = std::filesystem::path(file).parent_path().string();
    return parent.empty() ? "." : parent;
}

// A new file beside the one to be written; gone at the end unless it was given its name.
class NewFile {
  public:
    explicit NewFile(const std::string &beside) : name_(directory_of(beside) + "/.zavctl-XXXXXX") {
        descriptor_ = mkostemp(name_.data(), O_CLOEXEC);
        error_ = descriptor_ < 0 ? errno : 0;
    }
    ~NewFile() {
        if (descriptor_ >= 0)
            close(descriptor_);
        if (error_ == 0 && !published_)
            unlink(name_.c_str());
    }
    NewFile(const NewFile &) = delete;
    NewFile &operator=(const NewFile &) = delete;

    int error() const { return error_; }
    const std::string &name() const { return name_; }

    // Brings the bytes to the disk and gives the file its name. 0, or errno.
    int publish(const std::string &file, bool replace) {
        if (fsync(descriptor_) != 0)
            return errno;
        const int error = replace ? renamed(file) : renamed_if_free(file);
        published_ = error == 0;
        return error;
    }

  private:
    int renamed(const std::string &file) const {
        return rename(name_.c_str(), file.c_str()) == 0 ? 0 : errno;
    }

    int renamed_if_free(const std::string &file) const {
        if (renameat2(AT_FDCWD, name_.c_str(), AT_FDCWD, file.c_str(), RENAME_NOREPLACE) == 0)
            return 0;
        if (errno != EINVAL && errno != ENOSYS)
            return errno;
        struct stat status {}; // a file system that cannot look and rename in one step
        return lstat(file.c_str(), &status) == 0 ? EEXIST : renamed(file);
    }

    std::string name_;
    int descriptor_ = -1;
    int error_ = 0;
    bool published_ = false;
};

BiosOutcome not_saved(const std::string &file, Severity severity, const std::string &why) {
    return {"save", file, "not_saved", severity, "nothing was saved: " + why};
}

BiosOutcome published(NewFile &image, const std::string &file, bool replace) {
    const int error = image.publish(file, replace);
    if (error == EEXIST)
        return {"save", file, "exists", Severity::critical, file + " exists already"};
    if (error != 0)
        return not_saved(file, Severity::critical, fmt::format("{}: {}", file, strerror(error)));
    return {"save", file, "saved", Severity::ok,
            fmt::format("{} bytes of BIOS settings saved in {}", bios_image_size, file)};
}

} // namespace

NvramFact read_nvram() {
    FileFact file = read_file("/dev/nvram");
    return {file.error, std::move(file.text)};
}

BiosOutcome save_bios_file(const std::string &file, bool replace) {
    const std::string trouble = nvram_trouble(read_nvram());
    if (!trouble.empty())
        return not_saved(file, Severity::unknown, trouble);
    NewFile image(file);
    if (image.error() != 0)
        return not_saved(file, Severity::critical,
                         fmt::format("no file can be made in {}: {}", directory_of(file),
                                     strerror(image.error())));
    if (const auto failure = library::failure_of(library::save_bios(image.name())))
        return not_saved(file, Severity::critical,
                         "the device or the file could not be used: " + in_words(*failure));
    const std::string saved = read_file(image.name()).text;
    if (saved.size() != bios_image_size)
        return not_saved(
            file, Severity::critical,
            fmt::format("the image has {} bytes instead of {}", saved.size(), bios_image_size));
    if (!image_refusal(saved).empty())
        return not_saved(file, Severity::unknown,
                         "the image is all zeros, so /dev/nvram could not be read");
    return published(image, file, replace);
}

BiosOutcome load_bios_file(const std::string &file, const std::string &image) {
    if (const auto failure = library::failure_of(library::load_bios(file)))
        return {"load", file, "not_loaded", Severity::critical,
                "the file or /dev/nvram could not be used: " + in_words(*failure)};
    return load_verdict(file, image, read_nvram());
}

} // namespace zavctl
