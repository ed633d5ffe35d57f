// A form of input: how to recognise it by its beginning, and how to read it.
#ifndef CAPTURE_FORM_H
#define CAPTURE_FORM_H

#include <deque>
#include <memory>
#include <string>
#include <string_view>

#include "capture/Source.h"

namespace capture {

struct ReadOptions {
    bool follow = false;
    std::string trunk{};                 // the D channel's name; replaces what the input says, unless empty
    Variant variant = Variant::unknown;  // the switch variant; replaces what the input says, unless unknown
};

// The interfaces of an input. Each is kept once, and its address never changes.
class Interfaces {
  public:
    const Interface* of(const Interface& wanted);

  private:
    std::deque<Interface> interfaces_;
};

// What a parser works on. Everything in it must outlive the parser.
struct Context {
    Source& source;
    const ReadOptions& options;
    Interfaces& interfaces;
    // for frames whose interface the input does not name; it has the name that was chosen, or the file's
    const Interface* unnamed;
};

// Reads items of one form from a source, up to the end of its content. Waiting and progress are left to the
// source.
class Parser {
  public:
    Parser() = default;
    Parser(const Parser&) = delete;
    Parser& operator=(const Parser&) = delete;
    virtual ~Parser() = default;

    // Does what Reader::next does. It is not called again once it has returned `end`.
    virtual Reader::Next next(Item& item) = 0;
};

struct Form {
    enum class Match : std::uint8_t { no, perhaps, yes };

    std::string_view name;
    // Says whether an input that begins so is of this form. `isAll`: nothing follows. Then `perhaps` counts
    // as `no`.
    Match (*matches)(std::string_view beginning, bool isAll);
    std::unique_ptr<Parser> (*read)(const Context& context);
};

}  // namespace capture

#endif
