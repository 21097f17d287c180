#include "model/texts_optical.hpp"

#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr int kib_per_second_dvd = 1385; // at single speed

std::string state_text(DiscState state) {
    static constexpr std::array<const char *, 4> names = {"blank", "appendable", "complete",
                                                          "other"};
    return names.at(static_cast<std::size_t>(state));
}

std::string last_session_text(const Medium &medium) {
    if (medium.state == DiscState::complete && last_session_is_complete(medium))
        return "complete";
    return last_session_is_complete(medium) ? "empty" : "incomplete";
}

// A disc that can still take a session has one more, which is empty.
std::size_t session_count(const Medium &medium) {
    const bool open = medium.state != DiscState::complete && last_session_is_complete(medium);
    return medium.sessions.size() + (open ? 1 : 0);
}

std::string structure_text(const Medium &medium) {
    const MediumKind &kind = kind_of(medium.type);
    const auto sectors = kind.read_only ? used_sectors(medium) : kind.sectors;
    return fmt::format("READ DVD STRUCTURE[#0h]:\n"
                       " Media Book Type:       00h, DVD-ROM book [revision 0]\n"
                       " Legacy lead-out at:    {}*2KB={}\n",
                       sectors, sectors * 2048);
}

std::string disc_information_text(const Medium &medium) {
    std::string text =
        fmt::format("READ DISC INFORMATION:\n"
                    " Disc status:           {}\n"
                    " Number of Sessions:    {}\n"
                    " State of Last Session: {}\n",
                    state_text(medium.state), session_count(medium), last_session_text(medium));
    if (medium.state != DiscState::complete)
        text += fmt::format(" \"Next\" Track:          {}\n", session_count(medium));
    return text + fmt::format(" Number of Tracks:      {}\n", session_count(medium));
}

std::string track_text(const Medium &medium) {
    std::string text;
    std::size_t number = 0;
    for (const DiscSession &session : medium.sessions)
        text += fmt::format("READ TRACK INFORMATION[#{}]:\n"
                            " Track State:           {}\n"
                            " Track Start Address:   {}*2KB\n"
                            " Free Blocks:           0*2KB\n"
                            " Track Size:            {}*2KB\n",
                            ++number, session.complete ? "complete" : "partial/complete",
                            session.start, session.sectors);
    if (medium.state == DiscState::complete || !last_session_is_complete(medium))
        return text;
    return text + fmt::format("READ TRACK INFORMATION[#{}]:\n"
                              " Track State:           {}\n"
                              " Track Start Address:   {}*2KB\n"
                              " Next Writable Address: {}*2KB\n"
                              " Free Blocks:           {}*2KB\n"
                              " Track Size:            {}*2KB\n",
                              number + 1, number == 0 ? "blank" : "invisible", next_session(medium),
                              next_session(medium), free_sectors(medium), free_sectors(medium));
}

// A disc that is written over is its whole size from the first writing on.
std::uint64_t capacity(const Medium &medium) {
    const MediumKind &kind = kind_of(medium.type);
    const bool whole = kind.overwritable && medium.state == DiscState::complete;
    return whole ? kind.sectors : used_sectors(medium);
}

std::string column(const char *name, bool present, int value) {
    return present ? fmt::format("{}{}\n", name, value) : fmt::format("{}\n", name);
}

} // namespace

std::string mediainfo_head() {
    return "INQUIRY:                [QEMU    ][QEMU DVD-ROM    ][2.5+]\n"
           "GET [CURRENT] CONFIGURATION:\n";
}

std::string mediainfo_text(const State &state, const Medium &medium) {
    const MediumKind &kind = kind_of(medium.type);
    std::string text = mediainfo_head() + fmt::format(" Mounted Media:         {:02X}h, {}\n",
                                                      kind.profile, kind.text);
    if (kind.read_only)
        return text + structure_text(medium) + "DVD-ROM media detected, exiting...\n";
    const double speed = kind.speed / static_cast<double>(kib_per_second_dvd);
    if (!state.drive.combo)
        text += fmt::format(" Current Write Speed:   {:.1f}x{}={}KB/s\n", speed, kib_per_second_dvd,
                            kind.speed);
    text += structure_text(medium) + disc_information_text(medium) + track_text(medium);
    return text + fmt::format("READ CAPACITY:          {}*2048={}\n", capacity(medium),
                              capacity(medium) * 2048);
}

std::string recorder_text(const State &state) {
    const bool has_disc = medium_in(state.drive) != nullptr;
    return fmt::format("Device type    : Removable CD-ROM\n"
                       "Version        : 5\n"
                       "Response Format: 2\n"
                       "Capabilities   : \n"
                       "Vendor_info    : 'QEMU    '\n"
                       "Identification : 'QEMU DVD-ROM    '\n"
                       "Revision       : '2.5+'\n"
                       "Device seems to be: Generic {}.\n"
                       "Using generic SCSI-3/mmc   CD-R/CD-RW driver (mmc_cdr).\n"
                       "Driver flags   : MMC-3 SWABAUDIO BURNFREE \n"
                       "Supported modes: {}\n",
                       state.drive.combo ? "mmc CD-RW" : "mmc2 DVD-R/DVD-RW",
                       has_disc ? "TAO PACKET SAO SAO/R96P SAO/R96R RAW/R16 RAW/R96P RAW/R96R"
                                : "");
}

std::string atip_text(const Medium &medium) {
    const MediumKind &kind = kind_of(medium.type);
    if (kind.read_only)
        return "";
    return fmt::format("ATIP info from disk:\n"
                       "  Indicated writing power: 5\n"
                       "{}  Is not unrestricted\n"
                       "  {}\n"
                       "  Disk sub type: Medium Type A, high Beta category (A+) (3)\n"
                       "  ATIP start of lead in:  -11634 (97:26/66)\n"
                       "  ATIP start of lead out: {} (79:59/74)\n"
                       "Disk type:    Short strategy type (Phthalocyanine or similar)\n",
                       kind.write_once ? "" : "  Reference speed: 2\n",
                       kind.write_once ? "Is not erasable" : "Is erasable", kind.sectors);
}

std::string no_disc_text() {
    return "Errno: 5 (Input/output error), test unit ready scsi sendcmd: no error\n"
           "CDB:  00 00 00 00 00 00\n"
           "status: 0x2 (CHECK CONDITION)\n"
           "Sense Bytes: F0 00 02 00 00 00 00 0A 00 00 00 00 3A 00 00 00\n"
           "Sense Key: 0x2 Not Ready, Segment 0\n"
           "Sense Code: 0x3A Qual 0x00 (medium not present) Fru 0x0\n"
           "Sense flags: Blk 0 (valid) \n"
           "cmd finished after 0.031s timeout 40s\n"
           "wodim: No disk / Wrong disk!\n";
}

std::string session_offsets(const Medium &medium) {
    if (medium.state != DiscState::appendable || !last_session_is_complete(medium))
        return "";
    return fmt::format("{},{}", medium.sessions.back().start, next_session(medium));
}

std::string cdrom_info_text(const State &state) {
    const bool there = drive_answers(state.drive);
    const int dvd = state.drive.combo ? 0 : 1;
    return fmt::format("CD-ROM information, Id: cdrom.c 3.20 2003/12/17\n\ndrive name:\t\t{}\n",
                       there ? "sr0" : "") +
           column("drive speed:\t\t", there, 48) + column("drive # of slots:\t", there, 1) +
           column("Can close tray:\t\t", there, 1) + column("Can open tray:\t\t", there, 1) +
           column("Can lock tray:\t\t", there, 1) + column("Can change speed:\t", there, 1) +
           column("Can select disk:\t", there, 0) + column("Can read multisession:\t", there, 1) +
           column("Can read MCN:\t\t", there, 1) + column("Reports media changed:\t", there, 1) +
           column("Can play audio:\t\t", there, 1) + column("Can write CD-R:\t\t", there, 1) +
           column("Can write CD-RW:\t", there, 1) + column("Can read DVD:\t\t", there, 1) +
           column("Can write DVD-R:\t", there, dvd) + column("Can write DVD-RAM:\t", there, dvd) +
           column("Can read MRW:\t\t", there, 1) + column("Can write MRW:\t\t", there, dvd) +
           column("Can write RAM:\t\t", there, dvd) + "\n\n";
}

std::string disc_information(const State &state) {
    const Medium *medium = medium_in(state.drive);
    if (medium == nullptr)
        return "";
    const auto sessions = static_cast<char>(session_count(*medium));
    const bool erasable = !kind_of(medium->type).write_once && !kind_of(medium->type).read_only;
    // The last session: 0 empty, 1 incomplete, 3 complete.
    const int last = medium->state == DiscState::complete ? 3
                     : last_session_is_complete(*medium)  ? 0
                                                          : 1;
    std::string reply(34, '\0');
    reply[1] = 32; // bytes behind the length
    reply[2] =
        static_cast<char>((erasable ? 0x10 : 0) | last << 2 | static_cast<int>(medium->state));
    reply[3] = 1;
    reply[4] = reply[5] = reply[6] = sessions;
    return reply;
}

std::string disc_mount_text(const State &state) {
    const Medium *medium = medium_in(state.drive);
    if (medium == nullptr || !is_mountable(*medium))
        return "";
    return fmt::format("/dev/sr0 {} iso9660 ro,relatime,nojoliet,check=s,map=n,blocksize=2048,"
                       "iocharset=utf8 0 0\n",
                       disc_mount_point);
}

} // namespace zavsim
