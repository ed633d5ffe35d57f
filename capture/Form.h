// A form of input: how its beginning looks, and who reads it.
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
    std::string trunk{};                 // the D channel's name, in place of what the input says
    Variant variant = Variant::unknown;  // in place of what the input says
};

// The interfaces of an input, each once. They stay where they are.
class Interfaces {
  public:
    const Interface* of(const Interface& wanted);

  private:
    std::deque<Interface> interfaces_;
};

// What a parser works on. All of it outlives the parser.
struct Context {
    Source& source;
    const ReadOptions& options;
    Interfaces& interfaces;
    const Interface* unnamed;  // what nothing in the input names: as chosen, or after the file
};

// Reads one content of one form from a source. wait and progress are the source's.
class Parser {
  public:
    Parser() = default;
    Parser(const Parser&) = delete;
    Parser& operator=(const Parser&) = delete;
    virtual ~Parser() = default;

    // As Reader's next. After the end of a content that was replaced it is not called again.
    virtual Reader::Next next(Item& item) = 0;
};

struct Form {
    enum class Match : std::uint8_t { no, perhaps, yes };

    std::string_view name;
    // `isAll`: nothing follows the beginning. Then "perhaps" counts as "no".
    Match (*matches)(std::string_view beginning, bool isAll);
    std::unique_ptr<Parser> (*read)(const Context& context);
};

}  // namespace capture

#endif
