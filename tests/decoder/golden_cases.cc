#include "golden_cases.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>

#include "capture.h"
#include "decoder/elements.h"
#include "decoder/frame.h"
#include "decoder/layer3.h"
#include "decoder/state.h"

namespace golden {

namespace {

constexpr char folder[] = LAPDMON_SOURCE_DIR "/tests/decoder/golden";
constexpr std::string_view endOfText = "..";

// The decoders that no identifier reaches, and one that not every identifier of its kind does.
struct Direct {
    std::string_view name;
    ElementDecoder decode;
};
constexpr std::array<Direct, 5> directDecoders{{
    {"call_appearance_ie", decoder::call_appearance_ie},
    {"service_profile_id", decoder::service_profile_id},
    {"end_pointID", decoder::end_pointID},
    {"service_indicator", decoder::service_indicator},
    {"non_locking_shift", decoder::non_locking_shift},
}};

std::vector<std::string> splitLines(std::string_view contents) {
    std::vector<std::string> lines;
    while (!contents.empty()) {
        const std::size_t end = std::min(contents.find('\n'), contents.size());
        lines.emplace_back(contents.substr(0, end));
        contents.remove_prefix(std::min(end + 1, contents.size()));
    }
    return lines;
}

// One golden file being read, line by line.
class Reader {
  public:
    explicit Reader(File& file) : file_(file) {}

    void readAll() {
        while (at_ < file_.lines.size()) {
            const std::string& line = file_.lines[at_];
            if (line.starts_with("== "))
                readCase();
            else if (line.empty() || line.starts_with('#'))
                ++at_;
            else
                fail("expected a line \"== sentence\"");
        }
    }

  private:
    [[noreturn]] void fail(const std::string& reason) const {
        throw std::runtime_error(file_.path + ":" + std::to_string(at_ + 1) + ": " + reason);
    }

    const std::string& nextLine() {
        if (++at_ >= file_.lines.size())
            fail("the case has no end");
        return file_.lines[at_];
    }

    void readCase() {
        Case kase;
        kase.line = static_cast<int>(at_ + 1);
        kase.sentence = file_.lines[at_].substr(3);
        while (nextLine() != "--")
            readDirective(kase);
        if (kase.on.empty() || kase.octets.empty())
            fail("the case names no trunk or no octets");
        if (kase.octets.size() > 1 && kase.kind != Kind::frame)
            fail("only frames come several in one case");
        kase.textBegin = at_ + 1;
        while (nextLine() != endOfText) {
        }
        kase.textEnd = at_;
        try {
            kase.expected = unescape({file_.lines.begin() + static_cast<std::ptrdiff_t>(kase.textBegin),
                                      file_.lines.begin() + static_cast<std::ptrdiff_t>(kase.textEnd)});
        } catch (const std::runtime_error& error) {
            fail(error.what());
        }
        ++at_;
        file_.cases.push_back(std::move(kase));
    }

    void readDirective(Case& kase) {
        std::istringstream words(file_.lines[at_]);
        std::string name;
        words >> name;
        if (name == "trunk")
            readTrunks(kase, words);
        else if (name == "octets")
            readOctets(kase.octets.emplace_back(), words);
        else if (name == "more" && !kase.octets.empty())
            readOctets(kase.octets.back(), words);
        else if (name == "direction")
            readDirection(kase, words);
        else if (name == "left")
            words >> kase.left;
        else if (name == "frame")
            kase.kind = Kind::frame;
        else if (name == "message")
            kase.kind = Kind::message;
        else if (name == "decoder")
            readDecoder(kase, words);
        else
            fail("unknown word \"" + name + "\"");
        if (words.fail() && !words.eof())
            fail("unreadable value of \"" + name + "\"");
    }

    void readTrunks(Case& kase, std::istream& words) const {
        for (std::string name; words >> name;) {
            const auto* known =
                std::find_if(trunks.begin(), trunks.end(), [&](const Trunk& t) { return t.name == name; });
            if (name == "all")
                kase.on.assign(trunks.begin(), trunks.end());
            else if (known == trunks.end())
                fail("unknown trunk \"" + name + "\"");
            else
                kase.on.push_back(*known);
        }
    }

    void readOctets(Octets& octets, std::istream& words) const {
        for (std::string word; words >> word;) {
            if (word.size() != 2 || word.find_first_not_of("0123456789ABCDEF") != std::string::npos)
                fail("\"" + word + "\" is no octet");
            octets.push_back(static_cast<unsigned char>(std::stoi(word, nullptr, 16)));
        }
    }

    void readDirection(Case& kase, std::istream& words) const {
        std::string direction;
        words >> direction;
        if (direction != "rx" && direction != "tx")
            fail("a direction is rx or tx");
        kase.transmitted = direction == "tx";
    }

    void readDecoder(Case& kase, std::istream& words) const {
        std::string name;
        words >> name;
        const auto* known = std::find_if(directDecoders.begin(), directDecoders.end(),
                                         [&](const Direct& d) { return d.name == name; });
        if (known == directDecoders.end())
            fail("no decoder \"" + name + "\" to call directly");
        kase.kind = Kind::direct;
        kase.directDecoder = known->decode;
    }

    File& file_;
    std::size_t at_ = 0;
};

void appendEscaped(std::string& line, unsigned char octet) {
    constexpr std::string_view digits = "0123456789abcdef";
    if (octet == '\\')
        line += "\\\\";
    else if (octet == '\t')
        line += "\\t";
    else if (octet < 0x20 || octet > 0x7E)
        line.append("\\x").append(1, digits[octet >> 4]).append(1, digits[octet & 15]);
    else
        line += static_cast<char>(octet);
}

// Appends what one line stands for, its line end included.
void appendUnescaped(std::string& text, std::string_view line) {
    for (std::size_t i = 0; i < line.size(); ++i) {
        if (line[i] != '\\') {
            text += line[i];
            continue;
        }
        if (++i == line.size())
            return;  // marks: no line end
        if (line[i] == '\\')
            text += '\\';
        else if (line[i] == 't')
            text += '\t';
        else if (line[i] == 'n')
            text += '\n';
        else if (line[i] == 'x' && i + 2 < line.size()) {
            text += static_cast<char>(std::stoi(std::string(line.substr(i + 1, 2)), nullptr, 16));
            i += 2;
        } else
            throw std::runtime_error("unknown escape \"\\" + std::string(1, line[i]) + "\"");
    }
    text += '\n';
}

// Returns how many octets are left.
int decodeOnce(const Case& kase, const Octets& octets) {
    if (octets.size() > decoder::maximumFrame)
        throw std::runtime_error("the octets do not fit into a frame");
    decoder::RingBuffer rb = decoder::testing::cursorOver(octets);
    unsigned char id = 0;
    switch (kase.kind) {
        case Kind::element:
            decoder::ie_id(&rb);
            break;
        case Kind::direct:
            decoder::getblockchar(&rb, &id);
            kase.directDecoder(id, &rb);
            break;
        case Kind::message:
            decoder::layer_3(&rb);
            break;
        case Kind::frame:
            decoder::msglen = static_cast<int>(octets.size());
            decoder::parse_isdn_frame(rb);
            return 0;  // it was given a copy
    }
    return rb.count;
}

}  // namespace

std::string contentsOf(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream contents;
    if (!(contents << in.rdbuf()))
        throw std::runtime_error(path + ": cannot be read");
    return contents.str();
}

std::vector<std::string> names() {
    std::vector<std::string> found;
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        if (entry.path().extension() == ".golden")
            found.push_back(entry.path().stem().string());
    }
    std::sort(found.begin(), found.end());
    return found;
}

File read(const std::string& name) {
    const std::string path = std::string(folder) + "/" + name + ".golden";
    return parse(path, contentsOf(path));
}

File parse(const std::string& path, std::string_view contents) {
    File file;
    file.path = path;
    file.lines = splitLines(contents);
    Reader(file).readAll();
    return file;
}

std::vector<std::string> escape(std::string_view text) {
    std::vector<std::string> lines;
    bool open = false;  // the last line waits for its end
    for (const char c : text) {
        if (!open)
            lines.emplace_back();
        open = c != '\n';
        if (open)
            appendEscaped(lines.back(), static_cast<unsigned char>(c));
    }
    if (open)
        lines.back() += '\\';
    for (std::string& line : lines) {
        if (line == endOfText)
            line = "\\x2e.";
    }
    return lines;
}

std::string unescape(const std::vector<std::string>& lines) {
    std::string text;
    for (const std::string& line : lines)
        appendUnescaped(text, line);
    return text;
}

void replaceText(File& file, const Case& kase, std::string_view text) {
    const auto begin = file.lines.begin() + static_cast<std::ptrdiff_t>(kase.textBegin);
    const auto end = file.lines.begin() + static_cast<std::ptrdiff_t>(kase.textEnd);
    const std::vector<std::string> lines = escape(text);
    file.lines.insert(file.lines.erase(begin, end), lines.begin(), lines.end());
}

Outcome run(const Case& kase, const Trunk& trunk) {
    decoder::testing::Capture log(trunk.variant, kase.transmitted ? 0 : 1);
    int left = 0;
    for (const Octets& octets : kase.octets)
        left = decodeOnce(kase, octets);
    return {log.text(), left, decoder::flag, decoder::swit};
}

std::string difference(std::string_view expected, std::string_view actual) {
    const std::vector<std::string> before = escape(expected);
    const std::vector<std::string> after = escape(actual);
    const auto [b, a] = std::mismatch(before.begin(), before.end(), after.begin(), after.end());
    const auto [rb, ra] = std::mismatch(before.rbegin(), std::make_reverse_iterator(b), after.rbegin(),
                                        std::make_reverse_iterator(a));
    constexpr int shown = 12;
    std::ostringstream out;
    const auto list = [&](const char* mark, auto from, auto to) {
        const auto rest = std::distance(from, to) - shown;
        for (auto line = from; line != (rest > 0 ? from + shown : to); ++line)
            out << mark << *line << "\n";
        if (rest > 0)
            out << "    (" << rest << " lines more)\n";
    };
    list("    ", b - std::min<std::ptrdiff_t>(3, b - before.begin()), b);
    list("  - ", b, rb.base());
    list("  + ", a, ra.base());
    return out.str();
}

}  // namespace golden
