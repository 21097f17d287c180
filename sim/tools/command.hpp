// The simulated tools and the inner commands, one function each: words in, exit status out.
#pragma once

#include <string>
#include <vector>

namespace zavsim {

int run_mdadm(const std::vector<std::string> &words);
int run_smartctl(const std::vector<std::string> &words);
int run_mknod(const std::vector<std::string> &words);

// mdadm --create, with all of mdadm's words.
int run_mdadm_create(const std::vector<std::string> &words);

int run_vgs(const std::vector<std::string> &words);
int run_lvs(const std::vector<std::string> &words);
int run_pvs(const std::vector<std::string> &words);
int run_vgdisplay(const std::vector<std::string> &words);
int run_lvdisplay(const std::vector<std::string> &words);
int run_pvdisplay(const std::vector<std::string> &words);
int run_vgcfgbackup(const std::vector<std::string> &words);
int run_pvcreate(const std::vector<std::string> &words);
int run_pvremove(const std::vector<std::string> &words);
int run_vgcreate(const std::vector<std::string> &words);
int run_vgextend(const std::vector<std::string> &words);
int run_vgremove(const std::vector<std::string> &words);
int run_vgchange(const std::vector<std::string> &words);
int run_lvcreate(const std::vector<std::string> &words);
int run_lvremove(const std::vector<std::string> &words);
int run_lvchange(const std::vector<std::string> &words);

int run_df(const std::vector<std::string> &words);
int run_mount(const std::vector<std::string> &words);
int run_umount(const std::vector<std::string> &words);
int run_mkfs(const std::vector<std::string> &words);
int run_udevinfo(const std::vector<std::string> &words);
int run_sfdisk(const std::vector<std::string> &words);
int run_dd(const std::vector<std::string> &words);
int run_setup_script(const std::vector<std::string> &words);
int run_query_sas(const std::vector<std::string> &words);
int run_ethtool(const std::vector<std::string> &words);

int run_mediainfo(const std::vector<std::string> &words);
int run_cdrecord(const std::vector<std::string> &words);
int run_mkisofs(const std::vector<std::string> &words);
int run_growisofs(const std::vector<std::string> &words);
int run_dvd_format(const std::vector<std::string> &words);
int run_pktsetup(const std::vector<std::string> &words);
int run_mkudffs(const std::vector<std::string> &words);
int run_cdrwtool(const std::vector<std::string> &words);
int run_du(const std::vector<std::string> &words);
int run_killall(const std::vector<std::string> &words);

int run_act(const std::vector<std::string> &words);
int run_state(const std::vector<std::string> &words);

} // namespace zavsim
