// A payload read as a body of any family: reading stays within it, and what is written of it comes back. The
// input's first two octets choose the body and the transport's manner.
#include <sstream>

#include "tests/fuzz/payload.h"
#include "tests/vela/families.h"

namespace {

template <typename T>
std::string printed(const T& object) {
    std::ostringstream out;
    out << object;
    return out.str();
}

// A list of public elements is read as long as its octets: what is written again is longer.
template <typename BodyType>
constexpr bool comesBack = !std::is_same_v<BodyType, vela::CCS::ieMessage_t>;

void readsStayInside() {
    for (const fake_norv::Call& call : fake_norv::calls(fake_norv::Op::varFieldGet))
        fuzz::require(call.status == 0, "a body is read from its payload alone");
}

template <typename Table, typename BodyType>
void readAndWrite(const fuzz::Octets& payload) {
    const std::unique_ptr<vela::Msg> msg = fuzz::messageOf(payload);
    const std::unique_ptr<vela::MsgBody> made(Table::make(BodyType::code));
    msg->read(made.get(), 0);
    readsStayInside();
    const std::string text = printed(*made);
    BodyType copy(static_cast<const BodyType&>(*made));
    fuzz::require(printed(copy) == text, "a copy of a body says the same");
    vela::Msg written(copy.GetByteSize());
    fuzz::require(written.write(&copy, 0) <= written.getSize(), "a body takes the room that it asks for");
    BodyType again;
    written.read(&again, 0);
    readsStayInside();
    if constexpr (comesBack<BodyType>)  // its counts set to what its lists hold
        fuzz::require(printed(again) == printed(copy), "a body comes back as it was written");
    msg->setBodyDef(Table::make(BodyType::code));
    static_cast<void>(printed(*msg));
}

using Run = void (*)(const fuzz::Octets&);

// In the order of the families and their tables.
std::vector<Run> everyBody() {
    std::vector<Run> all;
    forEachFamily([&all]<typename Table>(const char*, const char*) {
        Table::forEach([&all]<typename BodyType>() { all.push_back(&readAndWrite<Table, BodyType>); });
    });
    return all;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::vector<Run> bodies = everyBody();
    fuzz::Input input(data, size);
    const Run run = bodies[input.octet() % bodies.size()];
    const fuzz::Transport transport;
    fake_norv::leaveFirstOffsetAtZero((input.octet() & 1U) != 0);
    run(input.rest());
    return 0;
}
