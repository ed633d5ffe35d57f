// Findings about the links of one D channel.
#ifndef CALLS_LINKFINDINGS_H
#define CALLS_LINKFINDINGS_H

#include <array>
#include <cstdint>
#include <map>
#include <string>

#include "calls/DChannel.h"
#include "calls/Finding.h"
#include "calls/FindingSink.h"
#include "calls/LinkWatch.h"
#include "calls/RepeatedFindings.h"
#include "calls/Roles.h"
#include "calls/TeiWatch.h"
#include "calls/Timers.h"

namespace calls {

// Looks at what a DChannel says about its frames, and reports findings to a sink. A fault that comes again
// within ten minutes is only counted (RepeatedFindings). Memory is bounded like that of the channel. Used by
// the thread that feeds the channel.
class LinkFindings {
  public:
    struct Options {
        std::string dChannel{};
        Timers timers{};
        bool grouped = false;             // the D channel is one of a group (NFAS) and may be the standby
        Access access = Access::unknown;  // unknown: learnt from TEIs and channel identifications
    };

    LinkFindings(Options options, FindingSink& sink);
    LinkFindings(const LinkFindings&) = delete;
    LinkFindings& operator=(const LinkFindings&) = delete;

    // Takes what the channel says about its last frame.
    void take(const DChannel& channel);
    // The clock has come to `at`, and no frame has come.
    void advance(std::int64_t at);
    // The recorder says, in `sentence`, that frames are missing behind the last one.
    void lost(std::string sentence);
    // The board, or the recorder, was started again behind the last frame.
    void restarted();
    // The trace has ended. Call this after the channel's finish().
    void finish(const DChannel& channel);

    Access access() const { return around_.access; }

  private:
    void takeOfLink(const DChannel& channel);
    void learn(const Sample& sample);
    void learnFromMessage(const Sample& sample);
    void event(const LinkEvent& event, const Sample& sample);
    void expire(std::int64_t at);
    void collect(LinkWatch& watch, std::uint8_t tei);
    void forgetWhatWaits();
    void observe(Observation observation, std::uint8_t tei);

    Options options_;
    RepeatedFindings findings_;
    LinkWatch::Circumstances around_;
    std::map<std::uint16_t, LinkWatch> watches_;  // by SAPI and TEI
    Roles roles_;
    TeiWatch teis_;
    std::array<std::uint64_t, 2> heard_{};  // frames of each direction
    std::uint64_t lastFrame_ = 0;
    std::uint64_t restartSaid_ = 0;  // the last frame before the restart that was reported
    std::int64_t lastAt_ = 0;
    std::int64_t offset_ = 0;  // of the frames' times against the D channel's clock
    capture::Clock clock_ = capture::Clock::none;
    std::int64_t lostAt_ = 0;
    bool hasLost_ = false;      // the recorder has missed frames, or was started again, at lostAt_
    bool channelSeen_ = false;  // a channel identification has told the access
    std::int64_t due_ = LinkWatch::never;
};

}  // namespace calls

#endif
