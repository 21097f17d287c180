#include "core/name_report.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

zavDevice only_address(const std::vector<std::string> &words) {
    const std::vector<NameQuery> queries = name_queries(words);
    EXPECT_EQ(queries.size(), 1U);
    return std::get<zavDevice>(queries.at(0));
}

std::string complaint(const std::vector<std::string> &words) {
    try {
        name_queries(words);
    } catch (const BadWords &bad) {
        return bad.what();
    }
    return "";
}

} // namespace

TEST(NameWords, AnAddressIsTypeMinorNumberAndPart) {
    const zavDevice device = only_address({"hdd", "sata", "3", "2"});
    EXPECT_EQ(device.type, ZAV_DEV_HDD);
    EXPECT_EQ(device.minor_type, ZAV_MINDEV_HDD_SATA);
    EXPECT_EQ(device.disk, 3);
    EXPECT_EQ(device.part, 2);
}

TEST(NameWords, EveryMinorTypeIsTaken) {
    for (const MinorType &minor : minor_types())
        EXPECT_EQ(only_address({minor.type_word, minor.word, "1"}).minor_type, minor.code);
}

TEST(NameWords, ThePartMayBeLeftOut) {
    const auto queries = name_queries({"hdd", "sata", "3", "/dev/sata/disk1", "nic", "eth", "1"});
    ASSERT_EQ(queries.size(), 3U);
    EXPECT_EQ(std::get<zavDevice>(queries[0]).part, 0);
    EXPECT_EQ(std::get<std::string>(queries[1]), "/dev/sata/disk1");
    EXPECT_EQ(std::get<zavDevice>(queries[2]).disk, 1);
}

TEST(NameWords, ASasNumberPacksTheUnit) {
    EXPECT_EQ(only_address({"hdd", "sas", "1:2"}).disk, 258);
    EXPECT_EQ(only_address({"raid", "sas", "2:5", "1"}).disk, 517);
    EXPECT_NE(complaint({"hdd", "sas", "1:256"}), "");
    EXPECT_NE(complaint({"hdd", "sata", "1:2"}), "");
}

TEST(NameWords, WrongWordsAreNamedWithWhatWasMeant) {
    EXPECT_EQ(complaint({"hdd", "saat", "1"}), "'saat' is no kind of 'hdd'. Did you mean 'sata'?");
    EXPECT_EQ(complaint({"hd", "sata", "1"}), "'hd' is no type of device. Did you mean 'hdd'?");
    EXPECT_EQ(complaint({"hdd", "sata", "x"}), "'x' is no number of a SATA disk");
    EXPECT_NE(complaint({"hdd"}), "");
    EXPECT_NE(complaint({"hdd", "sata"}), "");
    EXPECT_NE(complaint({"hdd", "sata", "99999999999"}), "");
}

TEST(NameWords, AddressesAreToldInWords) {
    EXPECT_EQ(in_words(only_address({"hdd", "sata", "3", "2"})), "partition 2 of SATA disk 3");
    EXPECT_EQ(in_words(only_address({"raid", "sas", "2:5"})), "SAS volume 5 of unit 2");
    EXPECT_EQ(in_words(only_address({"lvm", "vg", "0"})), "volume group PrimaryOSVG");
    EXPECT_EQ(in_words(only_address({"lvm", "lv", "3", "2"})), "logical volume 3 of group DataVG2");
    EXPECT_EQ(in_words(only_address({"nic", "bond", "1"})), "bond bond0");
}
