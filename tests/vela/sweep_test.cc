// Every body of every family: filled, written, read into bound variables and printed. The golden files hold
// the text, the octets and the transport calls of each.
#include <fstream>
#include <iomanip>

#include "tests/vela/families.h"
#include "tests/vela/fill.h"
#include "tests/vela/transport.h"

namespace {

using fake_norv::Op;

std::string hexLines(const Octets& octets) {
    std::ostringstream out;
    for (std::size_t i = 0; i < octets.size(); ++i)
        out << (i % 16 == 0 ? "  " : " ") << std::hex << std::uppercase << std::setfill('0') << std::setw(2)
            << +octets[i] << (i % 16 == 15 || i + 1 == octets.size() ? "\n" : "");
    return out.str();
}

std::string indented(const std::string& lines) {
    std::string text;
    std::istringstream in(lines);
    for (std::string line; std::getline(in, line);)
        text += "  " + line + "\n";
    return text;
}

// One variable for each field of a body, and a body bound to them.
template <typename BodyType>
struct Bound {
    template <typename... Fields>
    static std::tuple<typename Fields::Value...> variablesOf(std::tuple<Fields&...>);

    decltype(variablesOf(std::declval<BodyType&>().fields())) variables;
    BodyType body = std::apply([](auto&... variable) { return BodyType(variable...); }, variables);
};

class SweepTest : public TransportTest {
  protected:
    // The golden block of a body.
    template <typename BodyType>
    std::string block() {
        BodyType own;
        Filler().fill(own);
        fake_norv::reset();
        fake_norv::leaveFirstOffsetAtZero(stuck_);
        const Octets octets = encoded(own);
        const std::string text = printed(own);
        std::ostringstream out;
        out << "== " << nameOf<BodyType>() << " " << BodyType::code << "\n";
        if (const unsigned int* const reply = replyCode<BodyType>(); reply != nullptr)
            out << "reply " << *reply << "\n";
        out << "text " << text << "\n";
        if (const std::string read = readBack<BodyType>(octets); read != text)
            out << "read " << read << "\n";
        out << "octets\n" << hexLines(octets) << "calls\n" << indented(fieldCalls(Op::varFieldPut));
        return out.str();
    }

    // What the octets give, printed.
    template <typename BodyType>
    std::string readBack(const Octets& octets) {
        Bound<BodyType> bound;
        EXPECT_EQ(messageOf(octets)->read(&bound.body, 0), octets.size()) << nameOf<BodyType>();
        EXPECT_EQ(fieldCalls(Op::varFieldGet), fieldCalls(Op::varFieldPut)) << nameOf<BodyType>();
        const std::string text = printed(bound.body);
        const BodyType copy(bound.body);
        BodyType assigned;
        assigned = bound.body;
        bound.variables = {};
        EXPECT_EQ(printed(copy), text) << "a copy has storage of its own";
        EXPECT_EQ(printed(assigned), text) << "an assigned one too";
        EXPECT_EQ(printed(bound.body), printed(BodyType())) << "the body reads the variables";
        return text;
    }

    static void compare(const std::string& family, const std::string& text) {
        const std::string path = LAPDMON_SOURCE_DIR "/tests/vela/golden/" + family + ".golden";
        if (std::getenv("UPDATE_GOLDEN") != nullptr)
            std::ofstream(path) << text;
        std::ostringstream golden;
        golden << std::ifstream(path).rdbuf();
        EXPECT_EQ(text, golden.str()) << path;
    }

    bool stuck_ = false;  // the library leaves a body's first offset at 0
};

TEST_F(SweepTest, EveryBodyIsWrittenReadAndPrintedAsItsGoldenSays) {
    for (const bool stuck : {false, true}) {
        stuck_ = stuck;
        forEachFamily([this]<typename Table>(const char* file, const char*) {
            std::string text;
            Table::forEach([&]<typename BodyType>() { text += block<BodyType>(); });
            compare(file, text);
        });
    }
}

TEST_F(SweepTest, EveryBodyIsMadeByItsCode) {
    forEachFamily([]<typename Table>(const char*, const char*) {
        Table::forEach([]<typename BodyType>() {
            const std::unique_ptr<vela::MsgBody> made(Table::make(BodyType::code));
            ASSERT_NE(made, nullptr);
            const vela::MsgBody& body = *made;
            EXPECT_EQ(typeid(body), typeid(BodyType));
            EXPECT_EQ(printed(body), printed(BodyType()));
        });
    });
}

TEST_F(SweepTest, EveryBodySurvivesAPayloadCutAnywhere) {
    forEachFamily([]<typename Table>(const char*, const char*) {
        Table::forEach([]<typename BodyType>() {
            BodyType own;
            Filler().fill(own);
            const Octets octets = encoded(own);
            for (std::size_t size = 0; size < octets.size(); ++size) {
                BodyType read;
                messageOf(Octets(octets.begin(), octets.begin() + static_cast<std::ptrdiff_t>(size)))
                    ->read(&read, 0);
                EXPECT_NE(printed(read), printed(own)) << nameOf<BodyType>() << " of " << size;
            }
            for (const fake_norv::Call& call : fake_norv::calls(Op::varFieldGet))
                EXPECT_EQ(call.status, 0U) << "a read outside the payload";
            fake_norv::reset();
        });
    });
}

// ---- Lists of every size.

const struct Size {
    unsigned int n;
    std::vector<std::uint32_t> chunks;
} sizes[] = {
    {0, {}},         {1, {1}},          {254, {254}},      {255, {255}},
    {256, {1, 255}}, {509, {254, 255}}, {510, {255, 255}}, {511, {1, 255, 255}},
};

class ListSizeTest : public SweepTest {
  protected:
    template <typename BodyType>
    void sweep() {
        sweepFields<BodyType>(std::make_index_sequence<std::tuple_size_v<decltype(BodyType().fields())>>{});
    }

    template <typename BodyType, std::size_t... i>
    void sweepFields(std::index_sequence<i...>) {
        (sweepField<BodyType, i>(), ...);
    }

    template <typename BodyType, std::size_t i>
    void sweepField() {
        using FieldType =
            std::remove_reference_t<std::tuple_element_t<i, decltype(std::declval<BodyType&>().fields())>>;
        if constexpr (requires { FieldType::isArray; }) {
            for (const Size& size : sizes) {
                expectSize<BodyType, i>(size);
            }
        }
    }

    template <typename BodyType, std::size_t i>
    void expectSize(const Size& size) {
        SCOPED_TRACE(nameOf<BodyType>() + " with " + std::to_string(size.n));
        fake_norv::reset();
        fake_norv::leaveFirstOffsetAtZero(stuck_);
        BodyType own;
        Filler().fill(own);
        resize(std::get<i>(own.fields()).value(), 0);
        const std::size_t before = encoded(own).size();
        const std::vector<std::uint32_t> without = counts(0);
        resize(std::get<i>(own.fields()).value(), size.n);
        if (size.n > 255 && std::is_same_v<BodyType, vela::TSCComponent::MsgDefineBSet_t>) {
            vela::Msg msg(own.GetByteSize());
            EXPECT_THROW(msg.write(&own, 0), vela::Exception);
            return;
        }
        const std::vector<std::uint32_t> expected = expectedCalls(std::get<i>(own.fields()).value(), size);
        fake_norv::reset();
        fake_norv::leaveFirstOffsetAtZero(stuck_);
        const Octets octets = encoded(own);
        EXPECT_EQ(octets.size(), before + std::get<i>(own.fields()).byteSize());
        EXPECT_TRUE(isInsertedInto(without, expected, counts(0)));
        if constexpr (!std::is_same_v<BodyType, vela::CCS::ieMessage_t>) {
            EXPECT_EQ(readBack<BodyType>(octets), printed(own));
        }
    }

    // As many elements, the first two again and again.
    template <typename Element>
    static void resize(vela::staticList<Element>& list, unsigned int n) {
        static const vela::staticList<Element> pattern = [] {
            vela::staticList<Element> filled;
            Filler().fill(filled);
            return filled;
        }();
        list.realloc(n);
        for (unsigned int k = 0; k < n; ++k)
            list[k] = pattern[k % 2];
    }

    // Element counts of the calls that a list makes.
    template <typename Element>
    static std::vector<std::uint32_t> expectedCalls(const vela::staticList<Element>& list, const Size& size) {
        if constexpr (std::is_arithmetic_v<Element>) {
            return size.chunks;
        } else {
            std::vector<std::uint32_t> of[2], all;
            for (unsigned int k = 0; k < size.n; ++k) {
                if (k < 2)
                    of[k] = callsOf(list[k]);
                all.insert(all.end(), of[k % 2].begin(), of[k % 2].end());
            }
            return all;
        }
    }
    template <typename Element>
    static std::vector<std::uint32_t> callsOf(Element element) {
        const std::size_t before = fake_norv::count(Op::varFieldPut);
        encoded(element);
        return counts(before);
    }

    // All is the others with these somewhere between them, all together.
    using Counts = std::vector<std::uint32_t>;
    static bool isInsertedInto(const Counts& others, const Counts& these, const Counts& all) {
        for (std::size_t at = 0; at <= others.size(); ++at) {
            Counts whole = others;
            whole.insert(whole.begin() + static_cast<std::ptrdiff_t>(at), these.begin(), these.end());
            if (whole == all)
                return true;
        }
        return false;
    }
    // Of the calls from the `from`th on, the elements of the first field.
    static std::vector<std::uint32_t> counts(std::size_t from) {
        std::vector<std::uint32_t> all;
        const std::vector<fake_norv::Call> calls = fake_norv::calls(Op::varFieldPut);
        for (std::size_t k = from; k < calls.size(); ++k)
            all.push_back(((calls[k].descriptors[0] >> 11) & 0xFF) + 1);
        return all;
    }
};

TEST_F(ListSizeTest, EveryListOfEverySizeIsMovedWhole) {
    for (const bool stuck : {false, true}) {
        stuck_ = stuck;
        forEachFamily([this]<typename Table>(const char*, const char*) {
            Table::forEach([this]<typename BodyType>() { sweep<BodyType>(); });
        });
    }
}

}  // namespace
