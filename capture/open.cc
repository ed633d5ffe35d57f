#include "capture/open.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <utility>
#include <vector>

#include "capture/pcap.h"
#include "capture/pcapng.h"
#include "capture/text_forms.h"

namespace capture {

namespace {

constexpr std::array allForms{pcapForm, pcapngForm, hexForm, dumpForm};

// How much of an input is looked at, at most, to find out its form.
constexpr std::size_t beginningSize = std::size_t{1} << 16;

// Some editors write it in front of a text.
constexpr std::string_view byteOrderMark = "\xef\xbb\xbf";

// How contents begin that something else has to unpack first.
constexpr std::pair<std::string_view, std::string_view> packings[] = {
    {"\x1f\x8b", "; it is compressed with gzip: unpack it first"},
    {"\xfd"
     "7zXZ",
     "; it is compressed with xz: unpack it first"},
    {"\x28\xb5\x2f\xfd", "; it is compressed with zstd: unpack it first"},
    {"BZh", "; it is compressed with bzip2: unpack it first"},
    {"\xff\xfe", "; it is text in UTF-16: convert it to UTF-8 first"},
    {"\xfe\xff", "; it is text in UTF-16: convert it to UTF-8 first"},
};

std::string_view adviceFor(std::string_view beginning) {
    const auto* const found =
        std::find_if(std::begin(packings), std::end(packings),
                     [&](const auto& packing) { return beginning.starts_with(packing.first); });
    return found == std::end(packings) ? std::string_view() : found->second;
}

class AnyReader final : public Reader {
  public:
    AnyReader(const std::string& path, ReadOptions options, std::span<const Form> forms)
        : source_(path, options.follow),
          options_(std::move(options)),
          unnamed_(
              interfaces_.of({options_.trunk.empty() ? trunkOf(path) : options_.trunk, options_.variant})),
          forms_(forms.begin(), forms.end()) {}

    Next next(Item& item) override {
        while (true) {
            if (parser_ == nullptr) {
                if (const Next found = recognise(); found != Next::item)
                    return found;
            }
            if (const Next result = parser_->next(item); result != Next::end || !source_.replaced())
                return result;
            beginAnew(item);
            return Next::item;
        }
    }

    void wait(std::chrono::milliseconds most) override { source_.wait(most); }
    Progress progress() const override { return source_.progress(); }

  private:
    // Returns Next::item once the form is known, Next::pause while that needs more octets. Throws BadInput.
    Next recognise() {
        while (true) {
            const std::size_t held = source_.held().size();
            const Source::State state = held < beginningSize ? source_.want(held + 1) : Source::State::end;
            if (source_.held().starts_with(byteOrderMark))
                source_.consume(byteOrderMark.size());
            const bool isAll = state == Source::State::end;
            bool isOpen = !isAll && byteOrderMark.starts_with(source_.held());
            for (const Form& form : forms_) {
                const Form::Match match = form.matches(source_.held().substr(0, beginningSize), isAll);
                if (match == Form::Match::yes) {
                    parser_ = form.read({source_, options_, interfaces_, unnamed_});
                    return Next::item;
                }
                isOpen = isOpen || match == Form::Match::perhaps;
            }
            if (state == Source::State::pause)
                return Next::pause;
            if (isAll && source_.replaced()) {
                source_.restart();
                continue;
            }
            if (isAll || !isOpen)
                failUnknown();
        }
    }

    [[noreturn]] void failUnknown() const {
        if (source_.held().empty())
            throw BadInput(source_.name() + ": it is empty");
        throw BadInput(source_.name() + ": unknown file format" + std::string(adviceFor(source_.held())));
    }

    void beginAnew(Item& item) {
        source_.restart();
        parser_.reset();
        item = {};
        item.kind = Item::Kind::replaced;
        item.frame.interface = unnamed_;
        item.frame.place = {source_.name(), 1, Place::Unit::line};
        item.text = "the file was emptied or replaced";
    }

    Source source_;
    ReadOptions options_;
    Interfaces interfaces_;
    const Interface* unnamed_;
    std::vector<Form> forms_;
    std::unique_ptr<Parser> parser_;
};

bool isStart(std::string_view name) {
    constexpr std::size_t dateSize = 8;
    return name.size() >= dateSize && std::all_of(name.begin(), name.begin() + dateSize,
                                                  [](unsigned char c) { return std::isdigit(c) != 0; });
}

// "pri1.log" of "pri1.log.2", as programs that rotate logs name the older ones.
std::string_view withoutRotation(std::string_view name) {
    const std::size_t dot = name.rfind('.');
    const std::size_t before = dot == 0 || dot == std::string_view::npos ? dot : name.rfind('.', dot - 1);
    if (before == 0 || before == std::string_view::npos)
        return name;
    const std::string_view number = name.substr(dot + 1);
    const auto isDigit = [](char c) { return c >= '0' && c <= '9'; };
    return !number.empty() && std::ranges::all_of(number, isDigit) ? name.substr(0, dot) : name;
}

}  // namespace

const Interface* Interfaces::of(const Interface& wanted) {
    for (const Interface& known : interfaces_) {
        if (known == wanted)
            return &known;
    }
    return &interfaces_.emplace_back(wanted);
}

std::span<const Form> forms() { return allForms; }

std::unique_ptr<Reader> openReader(const std::string& path, const ReadOptions& options,
                                   std::span<const Form> known) {
    return std::make_unique<AnyReader>(path, options, known);
}

std::string trunkOf(std::string_view path) {
    const std::string_view name = withoutRotation(path.substr(path.rfind('/') + 1));
    for (std::size_t dot = name.find('.'); dot != std::string_view::npos; dot = name.find('.', dot + 1)) {
        if (dot > 0 && isStart(name.substr(dot + 1)))
            return std::string(name.substr(0, dot));
    }
    const std::size_t dot = name.rfind('.');
    return std::string(dot == std::string_view::npos || dot == 0 ? name : name.substr(0, dot));
}

}  // namespace capture
