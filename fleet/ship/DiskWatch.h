// Says that room gets scarce, before there is none.
#ifndef FLEET_SHIP_DISKWATCH_H
#define FLEET_SHIP_DISKWATCH_H

#include <cstdint>
#include <functional>
#include <map>
#include <string>

namespace fleet {

class DiskWatch {
  public:
    using Say = std::function<void(const std::string&)>;

    struct Filling {
        std::uint64_t used = 0;
        std::uint64_t of = 0;  // octets both
    };

    // Less than `leastFree` per cent is said: once, and again when it has got better in between.
    DiskWatch(unsigned leastFree, Say say) : leastFree_(leastFree), say_(std::move(say)) {}

    // Looks at the disk that a folder is on.
    void look(const std::string& folder);
    // Anything that is filled: "the stream LAPD_SITE". Without a limit (0) it is never full.
    void look(const std::string& name, std::uint64_t used, std::uint64_t of);

    // What was seen last of each folder's disk.
    const std::map<std::string, Filling>& disks() const { return disks_; }

  private:
    unsigned leastFree_;
    Say say_;
    std::map<std::string, Filling> disks_;
    std::map<std::string, bool> isScarce_;
};

}  // namespace fleet

#endif
