#include "objects.h"

#include "../system/bios_file.h"
#include "../system/files.h"

#include <fmt/format.h>

#include <sys/stat.h>

#include <cstring>

namespace zavctl {

namespace {

constexpr VerbHelp show_help = {
    "Product name, serial number and model as the BIOS tells them",
    "Shown: also whether the BIOS settings (/dev/nvram) can be read.\n"
    "Warning: no serial number, or no readable settings. Could not tell: no known model.",
    "  zavctl bios show\n"
    "  zavctl bios show --json | jq .bios.settings_readable",
};

constexpr VerbHelp save_help = {
    "Saves the BIOS settings (114 bytes) into a file",
    "The file appears complete or not at all; its mode is 0600. A file that exists is only\n"
    "replaced with --force, and stays as it was when saving fails.\n"
    "Critical: the file could not be written. Could not tell: the settings could not be read;\n"
    "no file is left then.",
    "  zavctl bios save /root/bios.img\n"
    "  zavctl bios save --force /root/bios.img",
};

constexpr VerbHelp load_help = {
    "Writes saved BIOS settings back",
    "The file must have exactly 114 bytes. What will change is said first; then zavctl asks,\n"
    "or, without a terminal, refuses unless --yes is given. Afterwards the settings are read\n"
    "back and compared.\n"
    "Warning: not confirmed, nothing was changed; or the kernel stored its own checksum.\n"
    "Critical: the device does not hold the file's settings. Could not tell: they cannot be\n"
    "read back.",
    "  zavctl bios load /root/bios.img\n"
    "  zavctl bios load --yes /root/bios.img",
};

Answer outcome_answer(const BiosOutcome &outcome) {
    return {"bios " + outcome.action, "", {outcome_section(outcome)}};
}

void refuse_target(const std::string &file, bool force) {
    struct stat status {};
    if (lstat(file.c_str(), &status) != 0)
        return;
    if (S_ISDIR(status.st_mode))
        throw UsageError(fmt::format("'{}' is a directory", printable(file)));
    if (!force)
        throw UsageError(fmt::format("'{}' exists already; --force replaces it", printable(file)));
    if (!S_ISREG(status.st_mode) && !S_ISLNK(status.st_mode))
        throw UsageError(fmt::format("'{}' is no regular file", printable(file)));
}

Answer save(const std::string &file, bool force) {
    refuse_target(file, force);
    return outcome_answer(save_bios_file(file, force));
}

std::string image_to_load(const std::string &file) {
    struct stat status {};
    if (stat(file.c_str(), &status) == 0 && !S_ISREG(status.st_mode))
        throw UsageError(fmt::format("'{}' is no regular file", printable(file)));
    const FileFact image = read_file(file);
    if (image.error != 0)
        throw UsageError(fmt::format("'{}': {}", printable(file), std::strerror(image.error)));
    const std::string refusal = image_refusal(image.text);
    if (!refusal.empty())
        throw UsageError(fmt::format("'{}' is not loaded: {}", printable(file), refusal));
    return image.text;
}

std::string what_will_happen(const std::string &file, const std::string &image) {
    const NvramFact now = read_nvram();
    const std::string change =
        now.complete() ? fmt::format("{} of {} bytes change",
                                     differing_bytes(image, now.bytes).size(), bios_image_size)
                       : fmt::format("what changes is not known ({})", nvram_trouble(now));
    return fmt::format("The BIOS settings of this machine will be replaced by those in {}: {}.\n"
                       "They take effect when it starts the next time.\n",
                       printable(file), change);
}

bool confirmed(const Session &session) {
    if (!session.streams.can_ask())
        throw UsageError("nobody to ask here; --yes loads without asking");
    return session.streams.confirm("Load them?");
}

Answer load(const Session &session, const std::string &file, bool yes) {
    const std::string image = image_to_load(file);
    session.streams.say(what_will_happen(file, image));
    if (!yes && !confirmed(session))
        return outcome_answer({"load", file, "not_confirmed", Severity::warning,
                               "not confirmed, nothing was changed"});
    return outcome_answer(load_bios_file(file, image));
}

void add_show(Command bios, Session &session) {
    add_verb(bios, session, "show", show_help).callback([&session] {
        session.action = [] {
            return Answer{"bios show", "", {bios_section(read_model(), read_nvram())}};
        };
    });
}

void add_save(Command bios, Session &session) {
    const auto file = std::make_shared<std::string>();
    const auto force = std::make_shared<bool>(false);
    const Command verb = add_verb(bios, session, "save", save_help);
    verb.add_option("FILE", *file, "The file to save into").required();
    verb.add_flag("--force", *force, "Replace a file that exists");
    verb.callback([&session, file, force] {
        session.action = [file, force] { return save(*file, *force); };
    });
}

void add_load(Command bios, Session &session) {
    const auto file = std::make_shared<std::string>();
    const auto yes = std::make_shared<bool>(false);
    const Command verb = add_verb(bios, session, "load", load_help);
    verb.add_option("FILE", *file, "A file written by 'zavctl bios save'").required();
    verb.add_flag("-y,--yes", *yes, "Do not ask");
    verb.callback([&session, file, yes] {
        session.action = [&session, file, yes] { return load(session, *file, *yes); };
    });
}

} // namespace

void add_bios(Command root, Session &session) {
    const Command bios = add_object(root, "bios", "BIOS identity and settings: show, save, load");
    add_show(bios, session);
    add_save(bios, session);
    add_load(bios, session);
}

} // namespace zavctl
