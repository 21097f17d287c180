#include "../core/action_report.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "asking.h"
#include "health_objects.h"

namespace zavctl {

namespace {

constexpr VerbHelp get_help = {
    "The byte of the digital sensor ports",
    "Shown: the byte in hexadecimal and decimal, its bits from 7 to 0, and which are set; with\n"
    "--hex the byte alone. Could not tell: /proc/zav/sys/dev/serio/in cannot be read, or holds no\n"
    "number.",
    "  zavctl port get\n"
    "  zavctl port get --json | jq '.port.set_bits | index(3) != null'",
};

constexpr VerbHelp set_help = {
    "Sets the byte of the digital sensor ports",
    "Shown: what was written to /proc/zav/sys/dev/serio/out. What the ports make of it cannot be\n"
    "read back. Critical: it was not written.",
    "  zavctl port set 0x3F\n"
    "  zavctl port set 63",
};

std::optional<Failure> port_failure(int result, const char *meaning) {
    std::optional<Failure> failure = library::failure_of(result);
    if (failure && result == ZAV_RC_ERR_EACCES)
        failure->meaning = meaning;
    return failure;
}

Answer get(bool hex_alone) {
    const library::PortAnswer answer = library::sensor_port();
    const PortReport report{answer.value,
                            port_failure(answer.result, "/proc/zav/sys/dev/serio/in cannot be read "
                                                        "or holds no hexadecimal number")};
    return {"port get", "", {port_section(report, hex_alone)}};
}

Answer set(const std::string &word) {
    const std::optional<int> byte = byte_of(word);
    if (!byte)
        throw UsageError("'" + printable(word) + "' is no byte: 0 to 255, or 0x00 to 0xFF");
    const int result = library::set_sensor_port(*byte);
    return {"port set",
            "",
            {action_section(port_set_report(
                *byte, port_failure(result, "/proc/zav/sys/dev/serio/out cannot be opened, or "
                                            "does not take the byte")))}};
}

} // namespace

void add_port(Command root, Session &session) {
    const Command port = add_object(root, "port", "The digital sensor ports: get, set");
    const auto hex = std::make_shared<bool>(false);
    const Command get_verb = add_verb(port, session, "get", get_help);
    get_verb.add_flag("--hex", *hex, "Show the byte in hexadecimal alone");
    get_verb.callback([&session, hex] { session.action = [hex] { return get(*hex); }; });
    const auto byte = std::make_shared<std::string>();
    const Command set_verb = add_verb(port, session, "set", set_help);
    set_verb.add_option("BYTE", *byte, "0 to 255, or 0x00 to 0xFF").required();
    set_verb.callback([&session, byte] { session.action = [byte] { return set(*byte); }; });
}

} // namespace zavctl
