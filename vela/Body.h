// A message body is declared by its code and a row of fields. A command also names the body of its reply:
//
//     struct ParmVal { U32<"Parm"> Parm; U32<"Val"> Val; };
//     struct MsgSetParmCmplt_t : Body<9> {};
//     struct MsgSetParm_t : Command<8, MsgSetParmCmplt_t, ParmVal> { using Command::Command; };
//
//     MsgSetParm_t own;                 // its own storage; own.Parm = 10;
//     MsgSetParm_t bound{parm, val};    // reads into and writes from the caller's two variables
//
// If the first fields of a row decide whether the message has the others, the row says how many fields the
// message has:
//
//     struct IEPubData { U8<"IEId"> IEId; ...; std::size_t fieldsPresent() const { return ...; } };
//
// A family declares its bodies in a struct that derives from Family, and lists them in a BodyTable, which
// makes them by code. Two bodies of one code do not compile, nor does a program that makes a body that its
// family does not list:
//
//     struct Messages : Family<Messages> {
//         struct MsgSetParmCmplt_t : Body<9> {};
//         ...
//         using Bodies = BodyTable<MsgSetParmCmplt_t, ...>;   // by message type
//         using Events = BodyTable<...>;                      // by event group; left out if there are none
//     };
#ifndef VELA_BODY_H
#define VELA_BODY_H

#include <array>
#include <ostream>
#include <tuple>
#include <type_traits>
#include <utility>

#include "vela/Msg.h"
#include "vela/MsgBody.h"
#include "vela/field.h"
#include "vela/fieldsOf.h"

namespace vela {

// The code of a body that is only part of another body.
inline constexpr unsigned int noCode = 0xFFFFFFFFU;

struct NoFields {};

// Messages is the family; void for a body that is only part of another, or belongs to several families.
template <unsigned int messageCode, typename Row = NoFields, typename Messages = void>
class Body : public MsgBody, public Row {
  public:
    static constexpr unsigned int code = messageCode;

    Body() = default;

    // Binds the body to variables: one for each field, in order, each of the field's own type. The variables
    // of all counts may be left out, because counts follow from their lists.
    template <typename... Variables>
    explicit Body(Variables&... variables) requires BindsTo<Row, Variables...> {
        if constexpr (sizeof...(Variables) == n)
            std::apply([&](auto&... field) { (field.bind(variables), ...); }, fields());
        else
            bindValues(std::tie(variables...), std::make_index_sequence<n>{});
    }

    // A tuple of references to the fields, in order.
    auto fields() { return fieldsOf(static_cast<Row&>(*this)); }
    auto fields() const { return fieldsOf(static_cast<const Row&>(*this)); }

    // Throws Exception when a list is longer than its count can express.
    unsigned int writeMsg(Msg* msg, unsigned int offset) override {
        static_assert(isListed(), "a body is missing from the table of its family");
        setCounts(std::make_index_sequence<n>{});
        return move<Move::put>(msg, offset);
    }
    unsigned int readMsg(Msg* msg, unsigned int offset) override { return move<Move::get>(msg, offset); }

    unsigned int GetByteSize() const override {
        unsigned int size = 0;
        forEachField([&](const auto& field, bool isPresent, unsigned int announced) {
            if (!isPresent)
                return;
            if constexpr (requires { field.byteSize(announced); })
                size += field.byteSize(announced);
            else
                size += field.byteSize();
        });
        return size;
    }

    std::size_t memorySize() const override { return sizeof(*this) + GetByteSize(); }

    // Writes "{", the label and value of each field, and "}".
    void toStream(std::ostream* out) const override {
        *out << "{";
        const char* separator = "";
        forEachField([&]<typename FieldType>(const FieldType& field, bool isPresent, unsigned int) {
            *out << std::exchange(separator, " ") << field.label() << " ";
            if constexpr (requires { FieldType::absent; }) {
                if (!isPresent) {
                    *out << FieldType::absent;
                    return;
                }
            }
            field.print(out);
        });
        *out << "}";
    }

  private:
    static constexpr std::size_t n = fieldCount<Row>;
    // Called when the family is complete.
    static constexpr bool isListed() {
        if constexpr (std::is_void_v<Messages>)
            return true;
        else if constexpr (requires { typename Messages::Events; })
            return Messages::Bodies::has(code) || Messages::Events::has(code);
        else
            return Messages::Bodies::has(code);
    }
    static constexpr bool hasOptionalFields = requires(const Row& row) { row.fieldsPresent(); };

    // Whether the message has the field. When a message is read, call it after the fields before that one
    // have been read.
    bool isPresent(std::size_t field) const {
        if constexpr (hasOptionalFields)
            return field < Row::fieldsPresent();
        else
            return true;
    }

    // Calls visit(field, whether it is present, what the fields before it announce) for each field, in order.
    template <typename Visit>
    void forEachField(Visit visit) const {
        std::size_t i = 0;
        unsigned int announced = 0;
        const auto one = [&](const auto& field) {
            visit(field, isPresent(i++), announced);
            note(field, announced);
        };
        std::apply([&](const auto&... field) { (one(field), ...); }, fields());
    }
    template <typename FieldType>
    static void note(const FieldType& field, unsigned int& announced) {
        if constexpr (AnnouncingField<FieldType>)
            announced = field.value();
    }
    template <std::size_t i>
    using FieldAt = vela::FieldAt<Row, i>;

    template <typename Variables, std::size_t... i>
    void bindValues(const Variables& variables, std::index_sequence<i...>) {
        (bindValue<i>(variables), ...);
    }
    template <std::size_t i, typename Variables>
    void bindValue(const Variables& variables) {
        if constexpr (!CountField<FieldAt<i>>)
            std::get<i>(fields()).bind(std::get<valuesBefore<Row, i>()>(variables));
    }

    // How many consecutive numbers, beginning with field i, are moved in one transport call. The first field
    // of a body is always moved alone.
    template <std::size_t i>
    static constexpr std::size_t runLength() {
        if constexpr (i < n) {
            if constexpr (ScalarField<FieldAt<i>>)
                return i == 0 ? 1 : 1 + runLength<i + 1>();
        }
        return 0;
    }

    template <Move direction>
    unsigned int move(Msg* msg, unsigned int offset) {
        FieldMover<direction> mover(msg->getNvMsgRef(), offset);
        unsigned int announced = 0;
        moveFrom<0>(mover, msg, announced);
        return mover.offset();
    }

    template <std::size_t i, Move direction>
    void moveFrom(FieldMover<direction>& mover, Msg* msg, unsigned int& announced) {
        if (hasOptionalFields && !isPresent(i)) {
            if constexpr (direction == Move::get)
                emptyListsFrom<i>();
            return;
        }
        if constexpr (constexpr std::size_t run = runLength<i>(); run > 0) {
            moveRun<i>(mover, announced, std::make_index_sequence<run>{});
            moveFrom<i + run>(mover, msg, announced);
        } else if constexpr (i < n) {
            std::get<i>(fields()).transfer(mover, msg, announced);
            moveFrom<i + 1>(mover, msg, announced);
        }
    }

    template <std::size_t start, typename Mover, std::size_t... i>
    void moveRun(Mover& mover, unsigned int& announced, std::index_sequence<i...>) {
        mover.scalars(std::get<start + i>(fields())...);
        (note(std::get<start + i>(fields()), announced), ...);
    }

    // Called when a message was read that does not have these fields.
    template <std::size_t i>
    void emptyListsFrom() {
        if constexpr (i < n) {
            if constexpr (requires { FieldAt<i>::isArray; })
                std::get<i>(fields())->realloc(0);
            emptyListsFrom<i + 1>();
        }
    }

    template <std::size_t... i>
    void setCounts(std::index_sequence<i...>) {
        (setCount<i>(), ...);
    }
    template <std::size_t i>
    void setCount() {
        if constexpr (CountField<FieldAt<i>>) {
            constexpr std::size_t counted = nextArray<i + 1>();
            static_assert(counted < n, "a count needs a list after it");
            if (isPresent(i))
                std::get<i>(fields()).count(std::get<counted>(fields()).length());
        }
    }
    template <std::size_t i>
    static constexpr std::size_t nextArray() {
        if constexpr (i >= n)
            return n;
        else if constexpr (requires { FieldAt<i>::isArray; })
            return i;
        else
            return nextArray<i + 1>();
    }
};

// The body of a command, with the body of its reply.
template <unsigned int messageCode, typename ReplyBody, typename Row = NoFields, typename Messages = void>
class Command : public Body<messageCode, Row, Messages> {
  public:
    using Body<messageCode, Row, Messages>::Body;
    using Reply = ReplyBody;
};

// The base of a family: within it, Body and Command are bodies of this family.
template <typename Messages>
struct Family {
    template <unsigned int messageCode, typename Row = NoFields>
    using Body = vela::Body<messageCode, Row, Messages>;
    template <unsigned int messageCode, typename Reply, typename Row = NoFields>
    using Command = vela::Command<messageCode, Reply, Row, Messages>;
};

// The bodies of a family, by code.
template <typename... Bodies>
class BodyTable {
  public:
    // Returns a new empty body, which the caller owns; null when no body of the family has the code.
    static MsgBody* make(unsigned int code) {
        MsgBody* made = nullptr;
        static_cast<void>(((code == Bodies::code && (made = std::make_unique<Bodies>().release())) || ...));
        return made;
    }

    // Calls visit.template operator()<Body>() for each body, in the order of the table.
    template <typename Visit>
    static void forEach(Visit visit) {
        (visit.template operator()<Bodies>(), ...);
    }

    static constexpr std::size_t size = sizeof...(Bodies);
    static constexpr std::array<unsigned int, size> codes{Bodies::code...};
    template <typename Body>
    static constexpr bool lists = (std::is_same_v<Body, Bodies> || ...);
    static constexpr bool has(unsigned int code) { return ((code == Bodies::code) || ...); }

  private:
    static constexpr bool distinct() {
        for (std::size_t i = 0; i < size; ++i) {
            for (std::size_t j = 0; j < i; ++j) {
                if (codes[i] == codes[j])
                    return false;
            }
        }
        return true;
    }
    static_assert(distinct(), "two bodies of one code in one family");
};

}  // namespace vela

#endif
