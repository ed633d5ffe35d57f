// A callback for messages or events: a function, or an object with a member function. It takes the decoded
// body or the message.
#ifndef VELA_HANDLER_H
#define VELA_HANDLER_H

#include <concepts>
#include <variant>

#include "vela/Msg.h"

namespace vela {

class Addressable;

// The base class of objects whose member functions are callbacks.
class CallbackBase {};

class Handler {
  public:
    // The callback owns the body or the message that it gets, and must delete it.
    using BodyFunction = void (*)(Addressable*, unsigned int type, MsgBody*);
    using MsgFunction = void (*)(Addressable*, Msg*);
    using BodyMember = void (CallbackBase::*)(Addressable*, unsigned int type, MsgBody*);
    using MsgMember = void (CallbackBase::*)(Addressable*, Msg*);

    // These constructors are implicit, so that a plain function or a lambda without captures can be
    // registered directly.
    Handler(BodyFunction function) : target_(function) {}
    Handler(MsgFunction function) : target_(function) {}
    template <std::convertible_to<BodyFunction> Lambda>
    Handler(Lambda lambda) : target_(static_cast<BodyFunction>(lambda)) {}
    template <std::convertible_to<MsgFunction> Lambda>
    Handler(Lambda lambda) : target_(static_cast<MsgFunction>(lambda)) {}
    template <typename T, std::derived_from<CallbackBase> Class>
    Handler(T* object, void (Class::*member)(Addressable*, unsigned int, MsgBody*))
        : target_(Bound<BodyMember>{object, static_cast<BodyMember>(member)}) {}
    template <typename T, std::derived_from<CallbackBase> Class>
    Handler(T* object, void (Class::*member)(Addressable*, Msg*))
        : target_(Bound<MsgMember>{object, static_cast<MsgMember>(member)}) {}

    // Makes a handler of a function that takes exactly the object and body types that it will get:
    //     Handler::of<onTrace>()   with   void onTrace(CCS*, unsigned int, CCS::EvtL2Trace_t*)
    template <auto function>
    static Handler of() {
        return Handler(&Typed<function>::call);
    }

    bool operator==(const Handler& other) const = default;

    bool isEmpty() const {
        return std::visit([](const auto& target) { return isNull(target); }, target_);
    }
    bool takesBody() const {
        return std::holds_alternative<BodyFunction>(target_) ||
               std::holds_alternative<Bound<BodyMember>>(target_);
    }
    // The object whose member function is called; null for a plain function.
    const void* object() const {
        return std::visit([](const auto& target) { return objectOf(target); }, target_);
    }

    void call(Addressable* owner, unsigned int type, MsgBody* body) const {
        if (const auto* function = std::get_if<BodyFunction>(&target_); function != nullptr)
            (*function)(owner, type, body);
        else if (const auto* bound = std::get_if<Bound<BodyMember>>(&target_); bound != nullptr)
            (bound->object->*bound->member)(owner, type, body);
    }
    void call(Addressable* owner, Msg* msg) const {
        if (const auto* function = std::get_if<MsgFunction>(&target_); function != nullptr)
            (*function)(owner, msg);
        else if (const auto* bound = std::get_if<Bound<MsgMember>>(&target_); bound != nullptr)
            (bound->object->*bound->member)(owner, msg);
    }

  private:
    template <typename Member>
    struct Bound {
        CallbackBase* object;
        Member member;
        bool operator==(const Bound&) const = default;
    };

    template <auto function>
    struct Typed;
    template <typename Object, typename BodyType, void (*function)(Object*, unsigned int, BodyType*)>
    struct Typed<function> {
        static void call(Addressable* owner, unsigned int type, MsgBody* body) {
            function(static_cast<Object*>(owner), type, static_cast<BodyType*>(body));
        }
    };

    template <typename Member>
    static bool isNull(const Bound<Member>& bound) {
        return bound.object == nullptr && bound.member == nullptr;
    }
    template <typename Function>
    static bool isNull(Function* function) {
        return function == nullptr;
    }
    template <typename Member>
    static const void* objectOf(const Bound<Member>& bound) {
        return bound.object;
    }
    template <typename Function>
    static const void* objectOf(Function*) {
        return nullptr;
    }

    std::variant<BodyFunction, MsgFunction, Bound<BodyMember>, Bound<MsgMember>> target_;
};

}  // namespace vela

#endif
