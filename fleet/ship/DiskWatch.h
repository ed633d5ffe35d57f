// Warns when a disk or the stream has little room left.
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

    // `say` gets a line when less than `leastFree` per cent are free, and another when there is room again.
    DiskWatch(unsigned leastFree, Say say) : leastFree_(leastFree), say_(std::move(say)) {}

    // Looks at the disk that a folder is on. Does nothing if the system gives no figures of it.
    void look(const std::string& folder);
    // Looks at anything else that can become full: "the stream LAPD_SITE". `of` is its limit; 0: it has none.
    void look(const std::string& name, std::uint64_t used, std::uint64_t of);

    // What was seen last of each folder's disk, without what is reserved for root.
    const std::map<std::string, Filling>& disks() const { return disks_; }

  private:
    unsigned leastFree_;
    Say say_;
    std::map<std::string, Filling> disks_;
    std::map<std::string, bool> isScarce_;
};

}  // namespace fleet

#endif
