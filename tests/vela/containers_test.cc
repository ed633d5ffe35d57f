#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <new>
#include <sstream>
#include <string>

#include "vela/linkedList.h"
#include "vela/list.h"

namespace {

template <typename T>
std::string printed(const T& object) {
    std::ostringstream out;
    out << object;
    return out.str();
}

using vela::keyedList;
using vela::linkedList;
using vela::staticList;

TEST(StaticList, KeepsItsArrayDownToHalfItsCapacity) {
    staticList<unsigned char> list(100);
    list[59] = 7;
    const unsigned char* const array = list.begin();
    list.realloc(60);
    EXPECT_EQ(list.begin(), array);
    EXPECT_EQ(list.length(), 60U);
    EXPECT_EQ(list.capacity(), 100U);
    EXPECT_EQ(list[59], 7);
}

TEST(StaticList, MakesANewArrayBelowHalfItsCapacityAndKeepsWhatExists) {
    staticList<int> list(100);
    list[39] = 39;
    const int* const array = list.begin();
    list.realloc(40);
    EXPECT_NE(list.begin(), array);
    EXPECT_EQ(list.length(), 40U);
    EXPECT_EQ(list.capacity(), 40U);
    EXPECT_EQ(list[39], 39);
}

TEST(StaticList, ResizesByTheRuleAtEachBoundary) {
    struct {
        const char* says;
        unsigned int from, to, capacity;
    } const cases[] = {
        {"the capacity itself", 100, 100, 100},
        {"half", 100, 50, 100},
        {"just below half", 100, 49, 49},
        {"half of an odd one", 101, 50, 101},
        {"one more", 100, 101, 101},
        {"nothing yet", 0, 5, 5},
        {"empty of one", 1, 0, 1},
        {"empty of two", 2, 0, 0},
    };
    for (const auto& c : cases) {
        staticList<int> list(c.from);
        list.realloc(c.to);
        EXPECT_EQ(list.length(), c.to) << c.says;
        EXPECT_EQ(list.capacity(), c.capacity) << c.says;
    }
}

TEST(StaticList, GrowsWithItsElements) {
    staticList<int> list{1, 2, 3};
    list.realloc(5);
    EXPECT_EQ(list[0], 1);
    EXPECT_EQ(list[2], 3);
    list[4] = 5;
    EXPECT_EQ(list.length(), 5U);
}

// Its memory comes full of something else.
struct Used {
    int value;

    static void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
        void* const memory = std::malloc(size);
        if (memory != nullptr)
            std::memset(memory, 0xA5, size);
        return memory;
    }
    static void operator delete[](void* memory) { std::free(memory); }
    static void operator delete[](void* memory, const std::nothrow_t&) { std::free(memory); }
};
std::ostream& operator<<(std::ostream& out, const Used& used) { return out << used.value; }

TEST(StaticList, NewElementsAreZero) {
    staticList<Used> list(2);
    EXPECT_EQ(printed(list), "{0 0}");
    list[1].value = 7;
    list.realloc(4);
    EXPECT_EQ(printed(list), "{0 7 0 0}");
    list.realloc(1);
    EXPECT_EQ(printed(list), "{0}");
}

// So large that no machine has room for 4294967295 of it.
struct Huge {
    char octets[1 << 20];
};
std::ostream& operator<<(std::ostream& out, const Huge&) { return out; }

TEST(StaticList, SaysWhichSizeThereIsNoMemoryFor) {
    staticList<Huge> list;
    try {
        list.realloc(0xFFFFFFFF);
        FAIL() << "nothing was thrown";
    } catch (const staticList<Huge>::AllocationError& error) {
        EXPECT_EQ(error.size(), 0xFFFFFFFFU);
        EXPECT_EQ(printed(error), "list::AllocationError(ReqSize: 4294967295)");
        EXPECT_EQ(list.length(), 0U);
    }
}

TEST(StaticList, CopiesElementByElement) {
    const staticList<int> source{4, 5, 6};
    staticList<int> copy(10);
    copy = source;
    EXPECT_EQ(copy, source);
    copy[0] = 9;
    EXPECT_EQ(source[0], 4);
}

TEST(StaticList, PrintsOctetsAsCharactersSeparatedByOneBlank) {
    EXPECT_EQ(printed(staticList<unsigned char>{'a', 'b', 'c'}), "{a b c}");
    EXPECT_EQ(printed(staticList<unsigned char>{}), "{}");
    EXPECT_EQ(printed(staticList<unsigned int>{10, 20}), "{10 20}");
}

TEST(LinkedList, InsertsInFrontInTheMiddleAndAtTheEnd) {
    linkedList<int> list;
    list.insert(0, 20);
    list.insert(0, 10);
    list.insert(2, 40);
    list.insert(2, 30);
    list.append(50);
    EXPECT_EQ(printed(list), "{10 20 30 40 50}");
    EXPECT_EQ(list.length(), 5U);
}

TEST(LinkedList, ReachesElementsInAnyOrder) {
    linkedList<int> list;
    for (int i = 0; i < 6; ++i)
        list.append(i);
    for (const unsigned int i : {5U, 0U, 3U, 2U, 4U, 4U, 1U})
        EXPECT_EQ(list[i], static_cast<int>(i));
    EXPECT_EQ(list.value(3), 3);
}

TEST(LinkedList, RemovesAtEachPlaceAndReturnsTheElement) {
    linkedList<int> list;
    for (int i = 0; i < 5; ++i)
        list.append(i);
    EXPECT_EQ(list.remove(0), 0);
    EXPECT_EQ(list.remove(3), 4);
    EXPECT_EQ(list.remove(1), 2);
    EXPECT_EQ(printed(list), "{1 3}");
    list.append(7);
    EXPECT_EQ(printed(list), "{1 3 7}");
    EXPECT_EQ(list.remove(0) + list.remove(0) + list.remove(0), 11);
    EXPECT_EQ(list.length(), 0U);
    list.append(8);
    EXPECT_EQ(printed(list), "{8}");
}

template <typename List, typename Action>
void expectOutOfBounds(unsigned int index, Action action) {
    try {
        action();
        FAIL() << "nothing was thrown";
    } catch (const typename List::OutOfBoundsError& error) {
        EXPECT_EQ(error.index(), index);
        EXPECT_EQ(printed(error), "list::OutOfBoundsError(Index: " + std::to_string(index) + ")");
    }
}

TEST(LinkedList, RefusesAnIndexBeyondItsEnd) {
    linkedList<int> list;
    list.append(1);
    expectOutOfBounds<linkedList<int>>(2, [&] { list.insert(2, 0); });
    expectOutOfBounds<linkedList<int>>(1, [&] { list.element(1); });
    expectOutOfBounds<linkedList<int>>(1, [&] { list[1] = 2; });
    expectOutOfBounds<linkedList<int>>(1, [&] { list.remove(1); });
    expectOutOfBounds<linkedList<int>>(7, [&] { static_cast<void>(list.value(7)); });
    EXPECT_EQ(printed(list), "{1}");
}

TEST(LinkedList, CopiesAreIndependent) {
    linkedList<int> list;
    list.append(1);
    linkedList<int> copy(list);
    copy.append(2);
    EXPECT_EQ(printed(list), "{1}");
    list = copy;
    EXPECT_EQ(printed(list), "{1 2}");
}

TEST(LinkedList, IsDestroyedWithoutRecursion) {
    linkedList<int> list;
    for (int i = 0; i < 100000; ++i)
        list.append(i);
    EXPECT_EQ(list.length(), 100000U);
}

// From the front or the end each time, it would be a walk of 30,000,000,000 links, which no time limit
// allows.
TEST(LinkedList, TheCursorWalksFromWhereItStandsForwardsAndBackwards) {
    constexpr unsigned int n = 250000;
    linkedList<unsigned int> list;
    for (unsigned int i = 0; i < n; ++i)
        list.append(i);
    unsigned int wrong = 0;
    for (unsigned int i = 0; i < n; ++i)
        wrong += list[i] != i ? 1 : 0;
    for (unsigned int i = n; i > 0; --i)
        wrong += list[i - 1] != i - 1 ? 1 : 0;
    for (unsigned int i = 0; i < n; ++i)  // one behind the other, from the middle on
        list.insert(n / 2 + i, n + i);
    for (unsigned int i = 0; i < n; ++i)
        wrong += list[n / 2 + i] != n + i ? 1 : 0;
    EXPECT_EQ(wrong, 0U);
}

TEST(KeyedList, TheNewestOfEqualKeysWinsUntilItIsUnset) {
    keyedList<unsigned int, int> list;
    list.set(1, 10);
    list.set(1, 20);
    EXPECT_EQ(list.element(1), 20);
    list.unset(1);
    EXPECT_EQ(list.element(1), 10);
}

TEST(KeyedList, ReportsAMissingKeyAsAllOnes) {
    using List = keyedList<unsigned int, int>;
    List list;
    list.set(1, 10);
    expectOutOfBounds<List>(4294967295U, [&] { list.element(2); });
    expectOutOfBounds<List>(4294967295U, [&] { list.unset(2); });
    EXPECT_EQ(list.find(2), nullptr);
}

TEST(KeyedList, PrintsItsEntriesNewestFirst) {
    keyedList<unsigned int, int> list;
    list.set(1, 10);
    list.set(2, 20);
    EXPECT_EQ(printed(list), "{{Key: 2 Value: 20} {Key: 1 Value: 10}}");
}

TEST(KeyedList, PrintsAPointerAsAnAddress) {
    char octet = 'x';
    std::ostringstream address;
    address << static_cast<const void*>(&octet);
    EXPECT_EQ(printed(vela::keyLink<unsigned int, char*>{&octet, 3}),
              "{Key: 3 Value: " + address.str() + "}");
}

TEST(Exception, PrintsItsName) {
    EXPECT_EQ(printed(vela::Exception()), "Exception");
    EXPECT_EQ(printed(vela::Exception("another name")), "another name");
}

}  // namespace
