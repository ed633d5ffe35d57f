// Inputs that tests write down, item by item.
#ifndef TESTS_READER_STREAMS_H
#define TESTS_READER_STREAMS_H

#include <cstdint>
#include <deque>
#include <memory>
#include <string>
#include <vector>

#include "capture/Reader.h"

namespace reader::testing {

inline constexpr std::int64_t second = 1'000'000'000;

// Gives what it was made of, a pause where the list says so, and then the end. What an item refers to is
// changed by the next call, as the contract has it.
class ScriptedReader : public capture::Reader {
  public:
    struct Step {
        std::string name;  // of the D channel; "pause"
        std::int64_t time = 0;
        std::vector<std::uint8_t> octets{0x02, 0x01, 0x01, 0x01};
        bool transmitted = false;
        capture::Clock clock = capture::Clock::absolute;
    };

    explicit ScriptedReader(std::vector<Step> steps, std::string file = "a.log")
        : steps_(steps.begin(), steps.end()), file_(std::move(file)) {}

    Next next(capture::Item& item) override {
        if (steps_.empty())
            return Next::end;
        const Step step = steps_.front();
        steps_.pop_front();
        if (step.name == "pause")
            return Next::pause;
        interface_.name = step.name;
        octets_ = step.octets;
        item = {};
        item.frame.octets = octets_;
        item.frame.transmitted = step.transmitted;
        item.frame.clock = step.clock;
        item.frame.time = step.time;
        item.frame.interface = &interface_;
        item.frame.place = {file_, ++number_, capture::Place::Unit::line};
        return Next::item;
    }
    void wait(std::chrono::milliseconds /*most*/) override { ++waits; }
    Progress progress() const override { return {}; }

    int waits = 0;

  private:
    std::deque<Step> steps_;
    std::string file_;
    capture::Interface interface_;
    std::vector<std::uint8_t> octets_;
    std::uint64_t number_ = 0;
};

}  // namespace reader::testing

#endif
