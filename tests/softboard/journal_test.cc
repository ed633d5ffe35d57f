#include "softboard/journal.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <fstream>
#include <sstream>

#include "softboard/message_text.h"
#include "tests/softboard/temp_file.h"

namespace softboard {
namespace {

const Address host{1, 0, 0, 0, 1};
const Address ccs{1, 1, 1, 0x15, 0};

TEST(JournalTest, ALineTellsWayTypeNameFieldsAddressesAndTransaction) {
    Journal journal;
    journal.add(Journal::Way::hostToBoard, {10003U << 8, 8, host, ccs, {10, 0, 0, 0, 1, 0, 0, 0}});
    journal.add(Journal::Way::boardToHost, {10003U << 8, 9, ccs, host, {}});
    journal.note("buffers outstanding 0, queues open 0");
    EXPECT_EQ(journal.text(),
              "host->board 8 SetParm {Parm 10 Val 1} from 1/0/0/0/1 to 0/1/1/21/1 trans 10003\n"
              "board->host 9 SetParmCmplt {} from 0/1/1/21/1 to 1/0/0/0/1 trans 10003\n"
              "buffers outstanding 0, queues open 0\n");
    EXPECT_EQ(journal.heard(), "8 {Parm 10 Val 1}\n");
}

TEST(JournalTest, AfterClearingItIsEmptyAndCountsAnew) {
    Journal journal;
    journal.add(Journal::Way::hostToNobody, {0, 2, host, ccs, {}});
    EXPECT_TRUE(journal.waitFor(2, 1, std::chrono::milliseconds(0)));
    journal.clear();
    EXPECT_EQ(journal.text(), "");
    EXPECT_FALSE(journal.waitFor(2, 1, std::chrono::milliseconds(0)));
}

TEST(JournalTest, EachLineIsInTheFileAsSoonAsItIsWritten) {
    const TempFile file(".journal");
    Journal journal;
    ASSERT_TRUE(journal.writeTo(file.path()));
    journal.add(Journal::Way::hostToHost, {0, 1, host, host, {}});
    std::ostringstream text;
    text << std::ifstream(file.path()).rdbuf();
    EXPECT_EQ(text.str(), "host->host 1 Ack {} from 1/0/0/0/1 to 1/0/0/0/1 trans 0\n");
}

TEST(JournalTest, AFileThatCannotBeWrittenIsRefused) {
    Journal journal;
    EXPECT_FALSE(journal.writeTo("/nowhere/journal"));
    EXPECT_EQ(errno, ENOENT);
}

TEST(JournalTest, AFullFileLosesLinesButDelaysNobody) {
    Journal journal;
    ASSERT_TRUE(journal.writeTo("/dev/full"));
    journal.note("first");
    journal.note("second");
    EXPECT_EQ(journal.text(), "first\nsecond\n") << "what is in memory stays";
}

TEST(MessageTextTest, EveryMessageHasItsName) {
    struct {
        uint32_t type;
        const char* name;
    } const cases[] = {
        {1, "Ack"},
        {2, "Comtest"},
        {3, "ComtestCmplt"},
        {4, "Init"},
        {5, "InitCmplt"},
        {6, "Exit"},
        {7, "ExitCmplt"},
        {8, "SetParm"},
        {9, "SetParmCmplt"},
        {18, "GetParm"},
        {19, "GetParmCmplt"},
        {22, "DetectEvt"},
        {23, "DetectEvtCmplt"},
        {24, "DetectxEvts"},
        {25, "DetectxEvtsCmplt"},
        {26, "CancelEvt"},
        {27, "CancelEvtCmplt"},
        {28, "CancelxEvts"},
        {29, "CancelxEvtsCmplt"},
        {30, "CancelAllEvts"},
        {32, "EvtDetected"},
        {5376, "ieMessage"},
        {8388608, "ResultComplete"},
        {8388614, "CompAttrInfoResult"},
        {8388615, "ComponentResult"},
        {8388666, "CompAttrInfo"},
        {8388669, "CompFind"},
        {8388670, "CompInstAllocate"},
        {8388673, "CompInstFree"},
        {8388697, "CompUse"},
        {8388698, "CompUnuse"},
        {8388706, "CompFindAll"},
        {8388707, "CompMultipleResult"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(messageName({0, c.type, {}, {}, {}}), c.name) << c.type;
    }
}

TEST(MessageTextTest, BodiesAreShownFieldByField) {
    struct {
        const char* says;
        uint32_t type;
        Octets body;
        const char* text;
    } const cases[] = {
        {"a find",
         8388669,
         {2, 0, 1, 255, 255, 0, 1, 0, 0, 0, 0, 0, 0, 0, 21, 0, 0, 0},
         "{CompStart 0/1/255/255/2 attr [0=21]}"},
        {"a negative attribute",
         8388669,
         {0, 0, 1, 1, 255, 0, 1, 0, 0, 0, 5, 0, 0, 0, 255, 255, 255, 255},
         "{CompStart 0/1/1/255/0 attr [5=-1]}"},
        {"a subscription",
         22,
         {1, 0, 0, 0, 0, 1, 2, 0, 0, 0, 0, 0, 0, 0},
         "{RetAddr 1/0/0/0/1 EvtType 2 EvtGroup 0}"},
        {"a trace event",
         32,
         {2, 0, 0, 0, 1, 0, 0, 0, 75, 0, 0, 0, 3, 0, 0, 0, 0, 1, 0x7f},
         "{EvtGroup 2 Direction 1 Timestamp 75 Length 3 List 00017f}"},
        {"an error", 0, {8, 0, 0, 0, 2, 0, 0, 0}, "{ErrorMsg 8 ErrorCode 2}"},
        {"no fields", 3, {}, "{}"},
        {"more than is known", 9, {1, 2}, "{+0102}"},
        {"less than is known", 8, {10, 0, 0, 0, 1}, "{Parm 10 ...}"},
        {"an unknown type", 4616, {1, 2, 3}, "{+010203}"},
        {"more attributes promised than there are",
         8388669,
         {0, 0, 1, 1, 255, 0, 255, 255, 255, 255, 1},
         "{CompStart 0/1/1/255/0 ...}"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(bodyText({0, c.type, {}, {}, c.body}), c.text) << c.says;
    }
    EXPECT_EQ(messageName({0, 8388697, {}, {}, {}}), "CompUse");
    EXPECT_EQ(messageName({0, 4616, {}, {}, {}}), "?");
    EXPECT_EQ(messageName({0, 0, {}, {}, {}}), "Wake");
    EXPECT_EQ(messageName({0, 0, {}, {}, {8, 0, 0, 0}}), "Error");
}

}  // namespace
}  // namespace softboard
