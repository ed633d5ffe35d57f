// Joins several inputs to one stream, one after another or by time.
#ifndef READER_JOINED_H
#define READER_JOINED_H

#include <cstdint>
#include <functional>
#include <list>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "capture/Reader.h"

namespace reader {

// Opens an input when its turn comes, so that a thousand files need no thousand descriptors.
using Opener = std::function<std::unique_ptr<capture::Reader>()>;

// Keeps the names that items refer to, so that they outlive the reader that the items came from.
class Names {
  public:
    void keep(capture::Item& item);
    // The reader is destroyed, so the addresses of its names may be used again for other names.
    void readerIsGone() {
        lastGiven_ = nullptr;
        lastFileGiven_ = {};
    }

  private:
    std::list<capture::Interface> interfaces_;
    std::set<std::string, std::less<>> files_;
    const capture::Interface* lastGiven_ = nullptr;
    capture::Interface lastSeen_;
    const capture::Interface* lastKept_ = nullptr;
    std::string_view lastFileGiven_;
    std::string_view lastFile_;
};

// Gives the items of one input after another. An input that is followed never ends, so it must be the last.
class Sequence : public capture::Reader {
  public:
    explicit Sequence(std::vector<Opener> inputs) : inputs_(std::move(inputs)) {}

    Next next(capture::Item& item) override;
    void wait(std::chrono::milliseconds most) override;
    Progress progress() const override;

  private:
    std::vector<Opener> inputs_;
    std::size_t nextInput_ = 0;
    std::unique_ptr<capture::Reader> current_;
    Names names_;
};

// Gives the items of all inputs in the order of their times. Inputs without times, and those that have
// nothing just now, do not hold up the others. Items of equal times come in the order of the inputs.
class Merge : public capture::Reader {
  public:
    explicit Merge(const std::vector<Opener>& inputs);

    Next next(capture::Item& item) override;
    void wait(std::chrono::milliseconds most) override;
    Progress progress() const override;

  private:
    struct Input {
        std::unique_ptr<capture::Reader> reader;
        capture::Item item;
        Next state = Next::pause;
        bool given = true;  // the item was handed out, and the next one is not asked for yet
    };

    std::vector<Input> inputs_;
    Names names_;
};

}  // namespace reader

#endif
