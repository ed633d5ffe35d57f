#include "calls/Finding.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

namespace calls {

TEST(FindingKinds, HaveIdentifiersThatDifferAndWordsForAPerson) {
    std::set<std::string_view> ids;
    for (const FindingKind* kind : findingKinds()) {
        EXPECT_TRUE(ids.insert(kind->id).second) << kind->id;
        EXPECT_TRUE(std::all_of(kind->id.begin(), kind->id.end(), [](char c) {
            return c == '-' || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9');
        })) << kind->id;
        EXPECT_FALSE(kind->meaning.empty()) << kind->id;
        EXPECT_FALSE(kind->lookAt.empty()) << kind->id;
        EXPECT_EQ(findingKind(kind->id), kind);
    }
    EXPECT_EQ(findingKind("no-such-finding"), nullptr);
}

}  // namespace calls
