#include "asking.h"
#include "disc_verbs.h"

#include <fmt/format.h>

#include <sys/stat.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <optional>
#include <unistd.h>

namespace zavctl {

namespace {

namespace fs = std::filesystem;

constexpr VerbHelp burn_help = {
    "Burns a directory, or one file, to the disc in the drive",
    "What the directory holds comes into the root of the disc, or into the directory NAME of it; "
    "a\n"
    "link is burned as what it leads to. Sessions:\n"
    "  open       the disc takes more later; what is on it stays (but an appendable DVD-RW for\n"
    "             restricted overwrite is written over); the free room counts\n"
    "  close      the first and last session of a blank disc; the total room counts\n"
    "  overwrite  a DVD+RW, or a DVD-RW for restricted overwrite, from its start: what was on it\n"
    "             is lost; the total room counts\n"
    "Without --session: open where the disc takes it, else close. A file is always an open "
    "session.\n"
    "First said: how large the source is (du -sL), the room and which of it counts, and what\n"
    "becomes of the disc. Then zavctl asks, or, without a terminal, refuses unless --yes is "
    "given.\n"
    "Progress is told on standard error: percent, time, and what is left at this speed. In the "
    "end\n"
    "the disc is asked for anew.\n"
    "Ctrl-C and SIGTERM stop the burn in order: the tools are ended and waited for, and it is "
    "said\n"
    "what the disc is then; once more within a minute does nothing, after it ends zavctl.\n"
    "Refused, with nothing written (critical): no disc, no drive, a disc that does not take this\n"
    "session, too little room, a tool is missing, the burner is at work. Critical too: the burn\n"
    "failed or was stopped. Could not tell: the library ended instead of answering.",
    "  zavctl disc burn /srv/export --dry-run\n"
    "  zavctl disc burn /srv/export --to 2026-11 --session open\n"
    "  zavctl disc burn /var/log/messages --yes --json",
};

struct BurnWords {
    std::string source;
    std::optional<std::string> name;
    std::optional<std::string> session;
};

std::optional<SessionType> session_of(const BurnWords &words) {
    for (const SessionType session : all_sessions())
        if (words.session == session_word(session))
            return session;
    return std::nullopt;
}

// The library removes these before and after each burn.
bool is_work_file(const fs::path &path) {
    for (const char *work : {"/tmp/burnDir", "/tmp/linkDir", "/tmp/zav.iso"}) {
        const fs::path relative = path.lexically_relative(work);
        if (!relative.empty() && *relative.begin() != "..")
            return true;
    }
    return false;
}

void refuse_place(const fs::path &path, const std::string &source, bool linked) {
    if (is_work_file(path))
        throw UsageError(fmt::format("'{}' is where the library keeps its work files, which it "
                                     "removes",
                                     printable(source)));
    if (linked && (path == "/" || path == "/tmp"))
        throw UsageError(fmt::format("'{}' holds the link by which the library would burn it; "
                                     "burn it without --to",
                                     printable(source)));
}

[[noreturn]] void refuse_source(const std::string &source, const std::string &why) {
    throw UsageError(fmt::format("'{}': {}", printable(source), why));
}

SourceFact source_of(const BurnWords &words) {
    const std::string &source = words.source;
    struct stat status {};
    SourceFact fact;
    std::error_code error;
    if (source.empty() || stat(source.c_str(), &status) != 0)
        refuse_source(source, std::strerror(source.empty() ? ENOENT : errno));
    fact.is_file = S_ISREG(status.st_mode);
    if (!fact.is_file && !S_ISDIR(status.st_mode))
        refuse_source(source, "neither a directory nor a regular file");
    if (access(source.c_str(), fact.is_file ? R_OK : R_OK | X_OK) != 0)
        refuse_source(source, std::strerror(errno));
    refuse_place(fs::canonical(source, error), source, words.name.has_value() && !fact.is_file);
    fact.path = fs::absolute(source, error).string();
    return fact;
}

void refuse_name(const std::string &name) {
    if (name.empty() || name == "." || name == ".." ||
        name.find_first_of("/\\") != std::string::npos)
        throw UsageError(
            fmt::format("'{}' is no name of a directory in the root of a disc", printable(name)));
}

BurnRequest request_of(const BurnWords &words) {
    BurnRequest request;
    if (words.name)
        refuse_name(*words.name);
    request.source = source_of(words);
    request.name = words.name.value_or("");
    request.session = session_of(words);
    if (request.source.is_file && request.session && *request.session != SessionType::open)
        throw UsageError(fmt::format("a file is always burned as an open session, never '{}'; burn "
                                     "the directory that holds it",
                                     *words.session));
    return request;
}

Question ask_size(const Session &session, const Shared<SourceFact> &sources, SourceFact source) {
    const std::chrono::seconds limit(session.options.timeout);
    source.trouble = no_answer(session).meaning;
    return question("the size of the source", source, sources, [limit](SourceFact answer) {
        answer.trouble.clear();
        measure(answer, limit);
        return answer;
    });
}

DiscWork work_of(const Session &session, const BurnRequest &request, const DiscReport &disc) {
    const SessionType type = chosen_session(request, disc);
    DiscWork work;
    work.session = type;
    work.doing = "writing";
    work.call = [request, type] { return library::burn(request, type); };
    if (is_cd(disc.media.discType) && type == SessionType::open) // elsewhere the tools see to it
        work.image_kib = image_size(request.source, std::chrono::seconds(session.options.timeout));
    return work;
}

Answer burn(Session &session, const BurnWords &words, const ChangeOptions &options) {
    BurnRequest request = request_of(words);
    const auto sources = no_reports<SourceFact>();
    const DiscReport disc = ask_drive(session, {ask_size(session, sources, request.source)});
    request.source = sources->front();
    const Plan plan = burn_plan(request, read_burner(disc));
    const DiscWork work = plan.refused() ? DiscWork() : work_of(session, request, disc);
    Answer answer = carry_out_job(session, plan, options, "Burn it?", work, disc);
    answer.sections.push_back(
        room_section(burn_room(request, disc), chosen_session(request, disc)));
    return answer;
}

} // namespace

void add_disc_burn(Command disc, Session &session) {
    const auto words = std::make_shared<BurnWords>();
    const Command verb = add_verb(disc, session, "burn", burn_help);
    verb.add_option("SOURCE", words->source, "A directory, or a regular file").required();
    verb.add_option("--to", words->name, "The directory of the disc that it comes into")
        .type_name("NAME");
    verb.add_option("--session", words->session, "close, open or overwrite, see below")
        .type_name("SESSION")
        .one_of({"close", "open", "overwrite"});
    const auto options = add_change_options(verb);
    verb.callback([&session, words, options] {
        session.action = [&session, words, options] { return burn(session, *words, *options); };
    });
}

} // namespace zavctl
