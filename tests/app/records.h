// Trace records as the board sends them.
#ifndef TESTS_APP_RECORDS_H
#define TESTS_APP_RECORDS_H

#include <algorithm>
#include <atomic>
#include <memory>
#include <vector>

#include "vela/CCS.h"

namespace app::testing {

using Record = vela::CCS::EvtL2Trace_t;
using Octets = std::vector<unsigned char>;

inline constexpr unsigned int frameLabel = 2;
inline constexpr unsigned int received = 0;
inline constexpr unsigned int transmitted = 1;

// A frame of a layer-2 header only.
inline const Octets unnumberedAcknowledgment{0x00, 0x01, 0x73};

inline void fill(Record& rec, unsigned int direction, unsigned int timestamp, const Octets& octets) {
    rec.Label = frameLabel;
    rec.Direction = direction;
    rec.Timestamp = timestamp;
    rec.Length = static_cast<unsigned int>(octets.size());
    rec.List->realloc(static_cast<unsigned int>(octets.size()));
    std::copy(octets.begin(), octets.end(), rec.List->begin());
}

// A record whose end is noticed.
class CountedRecord : public Record {
  public:
    explicit CountedRecord(std::atomic<int>& destroyed) : destroyed_(destroyed) {}
    CountedRecord(const CountedRecord&) = delete;
    CountedRecord& operator=(const CountedRecord&) = delete;
    ~CountedRecord() override {
        ++destroyed_;
        destroyed_.notify_all();
    }

    // A new one, a frame received at the time; whoever takes it owns it.
    static Record* make(std::atomic<int>& destroyed, unsigned int timestamp = 0) {
        auto rec = std::make_unique<CountedRecord>(destroyed);
        fill(*rec, received, timestamp, unnumberedAcknowledgment);
        return rec.release();
    }

  private:
    std::atomic<int>& destroyed_;
};

}  // namespace app::testing

#endif
