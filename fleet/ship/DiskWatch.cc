#include "fleet/ship/DiskWatch.h"

#include <sys/statvfs.h>

#include <algorithm>
#include <utility>

namespace fleet {

void DiskWatch::look(const std::string& folder) {
    struct statvfs status {};
    if (statvfs(folder.c_str(), &status) != 0 || status.f_blocks == 0)
        return;
    const std::uint64_t reserved = status.f_bfree - status.f_bavail;  // for the administrator
    const std::uint64_t all = status.f_blocks - std::min<std::uint64_t>(reserved, status.f_blocks);
    const std::uint64_t used = all - std::min<std::uint64_t>(status.f_bavail, all);
    disks_[folder] = {used * status.f_frsize, all * status.f_frsize};
    look("the disk of " + folder, used, all);
}

void DiskWatch::look(const std::string& name, std::uint64_t used, std::uint64_t of) {
    if (of == 0)
        return;
    const std::uint64_t free = 100 * (of - std::min(used, of)) / of;
    const bool isScarce = free < leastFree_;
    if (std::exchange(isScarce_[name], isScarce) != isScarce)
        say_(name + (isScarce ? " has only " : " has room again: ") + std::to_string(free) + "% free");
}

}  // namespace fleet
