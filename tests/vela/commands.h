// What the tests of command calls share: the objects, and what a call is expected to send.
#ifndef TESTS_VELA_COMMANDS_H
#define TESTS_VELA_COMMANDS_H

#include "tests/vela/fill.h"
#include "tests/vela/transport.h"
#include "vela/Board.h"
#include "vela/CCS.h"
#include "vela/Cluster.h"
#include "vela/ClusterMgr.h"
#include "vela/ResourceMgr.h"
#include "vela/TSCComponent.h"

namespace vela::test {

using fake_norv::words;
using vela::CCS;
using vela::Cluster;
using vela::ClusterMgr;
using vela::CompAttr_t;
using vela::CompDesc_t;
using vela::ResourceMgr;
using vela::staticList;
using vela::StdResource;
using vela::TSCComponent;

// A board, and an object of each class that sends commands.
class CommandTest : public TransportTest {
  protected:
    CommandTest() {
        for (vela::Addressable* object :
             {static_cast<vela::Addressable*>(&resource_), static_cast<vela::Addressable*>(&ccs_)})
            object->setErrorWaitTime(10);
    }

    // The call sends the body that it is given and reads the reply into the caller's.
    template <typename Cmd, typename Call>
    void prepared(Call call) {
        using Reply = typename Cmd::Reply;
        SCOPED_TRACE(Cmd::code);
        Cmd cmd;
        Filler().fill(cmd);
        Reply answer;
        Filler().fill(answer);
        board_.answers(Cmd::code, Reply::code, encoded(answer));
        Reply reply;
        call(cmd, &reply);
        EXPECT_EQ(fake_norv::written().back().type, Cmd::code);
        EXPECT_EQ(fake_norv::written().back().body, encoded(cmd));
        EXPECT_EQ(printed(reply), printed(answer));
        call(cmd, static_cast<Reply*>(nullptr));
    }
    template <typename Object>
    void sendsEachPrepared(Object& object) {
        Object::Bodies::forEach([&]<typename Body>() {
            if constexpr (requires { typename Body::Reply; })
                prepared<Body>([&](Body& cmd, auto* reply) { object.send(cmd, reply); });
        });
    }
    template <typename Cmd, typename Call>
    void preparedWithoutReply(Call call) {
        Cmd cmd;
        Filler().fill(cmd);
        call(cmd);
        EXPECT_EQ(fake_norv::written().back().type, Cmd::code);
        EXPECT_EQ(fake_norv::written().back().body, encoded(cmd));
    }

    // The call sends the command with this body, and takes the reply.
    template <typename Call>
    void sends(std::uint32_t command, std::uint32_t reply, const Octets& body, Call call) {
        SCOPED_TRACE(command);
        if (reply != noReply)
            board_.answers(command, reply);
        call();
        EXPECT_EQ(fake_norv::written().back().type, command);
        EXPECT_EQ(fake_norv::written().back().body, body);
    }
    static constexpr std::uint32_t noReply = 0xFFFFFFFF;

    // Bodies of the one field of each entry.
    template <typename List>
    static List listOf(unsigned int n) {
        List list(n);
        Filler filler;
        for (auto& element : list)
            filler.fill(element);
        return list;
    }

    ScriptedBoard board_;
    StdResource resource_{CompDesc_t(1, 1, 1, 0x15, 0), nullptr};
    CCS ccs_{CompDesc_t(2, 1, 1, 0x15, 0), resource_.getMsgQueue()};
    TSCComponent tsc_{vela::Component(CompDesc_t(0, 1, 1, 0x12, 0), resource_.getMsgQueue())};
    ResourceMgr resources_{resource_};
    ClusterMgr clusters_{resource_};
    Cluster cluster_{CompDesc_t(7, 1, 2, 3, 0), resource_.getMsgQueue()};
    staticList<CompAttr_t> attributes_{{1001, -1}};
};

inline const Octets oneAttribute{1, 0, 0, 0, 0xE9, 3, 0, 0, 0xFF, 0xFF, 0xFF, 0xFF};

inline Octets operator+(Octets left, const Octets& right) {
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

}  // namespace vela::test

#endif
