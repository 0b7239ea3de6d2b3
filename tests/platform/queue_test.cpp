#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <numeric>

#include "platform/sync_kit.h"
#include "vidshow/platform/queue.h"

namespace {

using sync_kit::Worker;

// A queue of numbers, each in an item of three words, so that a slot is not a power of two.
struct Item {
    uint32_t number;
    uint32_t inverse;
    uint32_t thrice;
};

Item ItemOf(uint32_t number) {
    return Item{number, ~number, 3 * number};
}

uint32_t NumberIn(const void* memory) {
    Item item;
    std::memcpy(&item, memory, sizeof item);
    EXPECT_EQ(item.inverse, ~item.number);
    EXPECT_EQ(item.thrice, 3 * item.number);
    return item.number;
}

class Numbers : public CLNrwqueue {
  public:
    explicit Numbers(DWORD max) : CLNrwqueue(max, sizeof(Item)) {}

    int Write(uint32_t number) {
        Item item = ItemOf(number);
        return WriteItem(&item);
    }
    void WriteAll(std::initializer_list<uint32_t> numbers) {
        for (uint32_t number : numbers)
            EXPECT_EQ(Write(number), 1);
    }
    uint32_t Read() {
        Item item = {};
        EXPECT_EQ(ReadItem(&item), 1);
        return NumberIn(&item);
    }
    bool AtEnd() {
        Item item = ItemOf(77);
        const bool end = ReadItem(&item) == 0;
        EXPECT_TRUE(!end || NumberIn(&item) == 77u) << "nothing is stored at the end";
        return end;
    }
    std::vector<uint32_t> All() {
        std::vector<uint32_t> numbers;
        for (DWORD i = 0; i < GetCount(); ++i)
            numbers.push_back(NumberIn(PeekItem(i)));
        return numbers;
    }
    // Writes and reads, so that the next item goes to `slot`.
    void StartAtSlot(DWORD slot) {
        for (DWORD i = 0; i < slot; ++i) {
            Write(i);
            Read();
        }
    }
};

using List = std::vector<uint32_t>;

TEST(Queue, IsFirstInFirstOut) {
    Numbers queue(3);
    for (uint32_t i = 0; i < 10; i += 2) {
        queue.WriteAll({i, i + 1});
        EXPECT_EQ(queue.Read(), i);
        EXPECT_EQ(queue.Read(), i + 1);
    }
}

TEST(Queue, CountsItsItems) {
    Numbers queue(4);
    EXPECT_EQ(queue.GetMax(), 4u);
    EXPECT_EQ(queue.GetCount(), 0u);
    queue.WriteAll({1, 2, 3, 4});
    EXPECT_EQ(queue.GetCount(), 4u);
    queue.Read();
    EXPECT_EQ(queue.GetCount(), 3u);
    EXPECT_EQ(queue.GetMax(), 4u);
}

TEST(Queue, ThirdWriteIntoTwoSlotsBlocksUntilARead) {
    Numbers queue(2);
    queue.WriteAll({1, 2});
    Worker writer([&] { EXPECT_EQ(queue.Write(3), 1); });
    writer.WaitUntilAsleep();
    EXPECT_FALSE(writer.done());
    EXPECT_EQ(queue.GetCount(), 2u);
    EXPECT_EQ(queue.Read(), 1u);
    writer.Join();
    EXPECT_EQ(queue.All(), (List{2, 3}));
}

TEST(Queue, ReadBlocksUntilAWrite) {
    Numbers queue(2);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 9u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.Write(9);
}

TEST(Queue, BlockedReaderAndWriterCostNoProcessorTime) {
    Numbers empty(1);
    Numbers full(1);
    full.Write(1);
    double reading = 1e9;
    double writing = 1e9;
    Worker reader([&] { reading = sync_kit::ProcessorMilliseconds([&] { empty.Read(); }); });
    Worker writer([&] { writing = sync_kit::ProcessorMilliseconds([&] { full.Write(2); }); });
    reader.WaitUntilAsleep();
    writer.WaitUntilAsleep();
    const sync_kit::Handle never = sync_kit::AutoResetEvent();
    EXPECT_EQ(WaitForSingleObject(never, 300), WAIT_TIMEOUT);
    empty.Write(1);
    full.Read();
    reader.Join();
    writer.Join();
    EXPECT_LT(reading, 30.0);
    EXPECT_LT(writing, 30.0);
}

TEST(Queue, ReadIntoNullDropsTheItem) {
    Numbers queue(2);
    queue.WriteAll({1, 2});
    EXPECT_EQ(queue.ReadItem(nullptr), 1);
    EXPECT_EQ(queue.Read(), 2u);
    queue.WriteAll({3, 4});
}

TEST(Queue, WriteOfNullLooksLikeTheEndAndCostsASlot) {
    Numbers queue(2);
    EXPECT_EQ(queue.WriteItem(nullptr), 1);
    EXPECT_EQ(queue.GetCount(), 0u);
    EXPECT_TRUE(queue.AtEnd());
    EXPECT_TRUE(queue.AtEnd()) << "the unit is put back each time";
    queue.Write(5);
    Worker writer([&] { EXPECT_EQ(queue.Write(6), 1); });
    writer.WaitUntilAsleep();
    EXPECT_FALSE(writer.done()) << "of two slots one is lost";
    EXPECT_EQ(queue.Read(), 5u);
    writer.Join();
    EXPECT_EQ(queue.Read(), 6u);
    EXPECT_TRUE(queue.AtEnd());
}

TEST(Queue, WriteOfNullTakesThePlaceOfAPendingEnd) {
    Numbers queue(3);
    queue.EndOfFile();
    EXPECT_EQ(queue.WriteItem(nullptr), 1);
    EXPECT_TRUE(queue.AtEnd()) << "the unit of the end is still there";
    queue.EndOfFile();
    queue.Write(1);
    EXPECT_EQ(queue.Read(), 1u);
    EXPECT_TRUE(queue.AtEnd());
}

TEST(Queue, EndOfFileIsSeenByEveryReadUntilAWrite) {
    Numbers queue(2);
    EXPECT_EQ(queue.EndOfFile(), 0);
    for (int i = 0; i < 3; ++i)
        EXPECT_TRUE(queue.AtEnd());
    EXPECT_EQ(queue.GetReadItem(), nullptr);
    EXPECT_EQ(queue.GetReadItem(), nullptr);
    queue.Write(4);
    EXPECT_EQ(queue.Read(), 4u);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 5u) << "the end is no longer pending"; });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.Write(5);
}

TEST(Queue, ItemsBeforeTheEndAreReadFirst) {
    Numbers queue(3);
    queue.WriteAll({1, 2, 3});
    queue.EndOfFile();
    EXPECT_EQ(queue.Read(), 1u);
    EXPECT_EQ(queue.Read(), 2u);
    EXPECT_EQ(queue.Read(), 3u);
    EXPECT_TRUE(queue.AtEnd());
}

TEST(Queue, SecondEndOfFileDoesNothing) {
    Numbers queue(2);
    queue.EndOfFile();
    EXPECT_EQ(queue.EndOfFile(), 0);
    queue.Write(1);
    EXPECT_EQ(queue.Read(), 1u);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 2u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done()) << "one write took the whole end away";
    queue.Write(2);
}

TEST(Queue, EndOfFileReachesEveryBlockedReader) {
    Numbers queue(2);
    std::vector<std::unique_ptr<Worker>> readers;
    for (int i = 0; i < 4; ++i) {
        readers.push_back(std::make_unique<Worker>([&] { EXPECT_TRUE(queue.AtEnd()); }));
    }
    for (auto& reader : readers)
        reader->WaitUntilAsleep();
    queue.EndOfFile();
}

TEST(Queue, ItemsAreFilledAndConsumedInPlace) {
    Numbers queue(2);
    for (uint32_t i = 0; i < 5; ++i) {
        void* slot = queue.GetWriteItem();
        const Item item = ItemOf(i);
        std::memcpy(slot, &item, sizeof item);
        EXPECT_EQ(queue.GetCount(), 0u) << "not an item before the commit";
        queue.CommitWriteItem();
        EXPECT_EQ(queue.GetCount(), 1u);
        const void* read = queue.GetReadItem();
        EXPECT_EQ(read, slot);
        EXPECT_EQ(NumberIn(read), i);
        EXPECT_EQ(queue.GetCount(), 1u) << "an item until the commit";
        queue.CommitReadItem();
        EXPECT_EQ(queue.GetCount(), 0u);
    }
}

TEST(Queue, SlotInWorkCountsAgainstTheRoom) {
    Numbers queue(1);
    void* slot = queue.GetWriteItem();
    Worker writer([&] { EXPECT_EQ(queue.Write(8), 1); });
    writer.WaitUntilAsleep();
    EXPECT_FALSE(writer.done());
    queue.CancelWriteItem();
    writer.Join();
    EXPECT_EQ(queue.PeekItem(0), slot) << "the slot given back is used again";
    EXPECT_EQ(queue.Read(), 8u);
}

TEST(Queue, CancelledReadLeavesTheItemTheOldest) {
    Numbers queue(2);
    queue.WriteAll({1, 2});
    EXPECT_EQ(NumberIn(queue.GetReadItem()), 1u);
    queue.CancelReadItem();
    EXPECT_EQ(NumberIn(queue.GetReadItem()), 1u);
    queue.CommitReadItem();
    EXPECT_EQ(queue.Read(), 2u);
}

TEST(Queue, ItemInWorkIsNotReadTwice) {
    Numbers queue(1);
    queue.Write(1);
    ASSERT_EQ(NumberIn(queue.GetReadItem()), 1u);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 2u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.CommitReadItem();
    queue.Write(2);
}

TEST(Queue, CommitAfterTheEndTakesItAway) {
    Numbers queue(2);
    queue.EndOfFile();
    const Item item = ItemOf(6);
    std::memcpy(queue.GetWriteItem(), &item, sizeof item);
    queue.CommitWriteItem();
    EXPECT_EQ(queue.Read(), 6u);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 7u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.Write(7);
}

TEST(Queue, PeekSeesEveryItemAndNoMore) {
    Numbers queue(4);
    EXPECT_EQ(queue.PeekItem(0), nullptr);
    queue.StartAtSlot(3);
    queue.WriteAll({10, 11, 12});
    EXPECT_EQ(NumberIn(queue.PeekItem(0)), 10u);
    EXPECT_EQ(NumberIn(queue.PeekItem(1)), 11u) << "behind the wrap";
    EXPECT_EQ(NumberIn(queue.PeekItem(2)), 12u);
    EXPECT_EQ(queue.PeekItem(3), nullptr);
    EXPECT_EQ(queue.PeekItem(0xFFFFFFFF), nullptr);
    EXPECT_EQ(queue.Read(), 10u) << "what PeekItem(0) showed";
}

List g_flushed;

void RecordFlushed(void* item) {
    g_flushed.push_back(NumberIn(item));
}

TEST(Queue, FlushEmptiesAndStartsAtTheFirstSlot) {
    Numbers queue(4);
    queue.Write(0);
    const void* firstSlot = queue.PeekItem(0);
    queue.Read();
    queue.WriteAll({1, 2});
    EXPECT_EQ(queue.Flush(nullptr), 0);
    EXPECT_EQ(queue.GetCount(), 0u);
    queue.WriteAll({5, 6, 7, 8});
    EXPECT_EQ(queue.PeekItem(0), firstSlot);
    EXPECT_EQ(queue.All(), (List{5, 6, 7, 8}));
    for (uint32_t i = 5; i <= 8; ++i)
        EXPECT_EQ(queue.Read(), i);
}

TEST(Queue, FlushShowsTheItemsOldestFirst) {
    Numbers queue(4);
    queue.StartAtSlot(3);
    queue.WriteAll({1, 2, 3});
    g_flushed.clear();
    queue.Flush(RecordFlushed);
    EXPECT_EQ(g_flushed, (List{1, 2, 3}));
    g_flushed.clear();
    queue.Flush(RecordFlushed);
    EXPECT_TRUE(g_flushed.empty());
}

TEST(Queue, FlushLeavesNoReadersUnitBehind) {
    Numbers queue(4);
    queue.WriteAll({1, 2, 3});
    queue.Flush(nullptr);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 4u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.Write(4);
}

TEST(Queue, UnitInAReadersHandsIsNoEndAfterAFlush) {
    Numbers queue(4);
    queue.Write(1);
    ASSERT_NE(queue.GetReadItem(), nullptr);
    queue.Flush(nullptr);
    queue.CancelReadItem();
    Worker reader([&] { EXPECT_EQ(queue.Read(), 4u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.Write(4);
}

TEST(Queue, FlushLeavesAPendingEnd) {
    Numbers queue(4);
    queue.WriteAll({1, 2});
    queue.EndOfFile();
    queue.Flush(nullptr);
    EXPECT_TRUE(queue.AtEnd());
}

TEST(Queue, FlushFreesBlockedWriters) {
    Numbers queue(2);
    queue.WriteAll({1, 2});
    Worker writer([&] { EXPECT_EQ(queue.Write(3), 1); });
    writer.WaitUntilAsleep();
    queue.Flush(nullptr);
    writer.Join();
    EXPECT_EQ(queue.Read(), 3u);
}

// Searching.

class Equals : public ISearchCriteria {
  public:
    explicit Equals(uint32_t number) : m_number(number) {}
    int Match(void* item) override {
        ++looks;
        return NumberIn(item) == m_number ? -5 : 0;
    }
    int looks = 0;

  private:
    uint32_t m_number;
};

TEST(QueueSearch, FindsWithoutRemoving) {
    Numbers queue(5);
    queue.WriteAll({1, 2, 3});
    Equals two(2);
    Item found = {};
    EXPECT_EQ(queue.SearchItem(&found, &two, false), 1);
    EXPECT_EQ(NumberIn(&found), 2u);
    EXPECT_EQ(two.looks, 2) << "it ends at the first match";
    EXPECT_EQ(queue.All(), (List{1, 2, 3}));
}

TEST(QueueSearch, WithoutCriteriaFindsTheOldest) {
    Numbers queue(5);
    Item found = {};
    EXPECT_EQ(queue.SearchItem(&found, nullptr, true), 0);
    queue.StartAtSlot(4);
    queue.WriteAll({1, 2, 3});
    EXPECT_EQ(queue.SearchItem(&found, nullptr, false), 1);
    EXPECT_EQ(NumberIn(&found), 1u);
    EXPECT_EQ(queue.SearchItem(&found, nullptr, true), 1);
    EXPECT_EQ(NumberIn(&found), 1u);
    EXPECT_EQ(queue.All(), (List{2, 3}));
}

TEST(QueueSearch, NoMatchLeavesEverything) {
    Numbers queue(5);
    queue.WriteAll({1, 2, 3});
    Equals nine(9);
    Item found = ItemOf(77);
    EXPECT_EQ(queue.SearchItem(&found, &nine, true), 0);
    EXPECT_EQ(NumberIn(&found), 77u);
    EXPECT_EQ(nine.looks, 3);
    EXPECT_EQ(queue.All(), (List{1, 2, 3}));
}

TEST(QueueSearch, OldestMatchWins) {
    struct Odd : ISearchCriteria {
        int Match(void* item) override { return NumberIn(item) % 2 != 0; }
    } odd;
    Numbers queue(5);
    queue.WriteAll({2, 4, 7, 5});
    Item found = {};
    EXPECT_EQ(queue.SearchItem(&found, &odd, true), 1);
    EXPECT_EQ(NumberIn(&found), 7u);
}

TEST(QueueSearch, RemovingIntoNullRemoves) {
    Numbers queue(3);
    queue.WriteAll({1, 2, 3});
    Equals two(2);
    EXPECT_EQ(queue.SearchItem(nullptr, &two, true), 1);
    EXPECT_EQ(queue.All(), (List{1, 3}));
}

TEST(QueueSearch, RemovingTheThirdOfFiveKeepsTheOrder) {
    Numbers queue(8);
    queue.WriteAll({1, 2, 3, 4, 5});
    Equals three(3);
    Item found = {};
    EXPECT_EQ(queue.SearchItem(&found, &three, true), 1);
    EXPECT_EQ(NumberIn(&found), 3u);
    EXPECT_EQ(queue.All(), (List{1, 2, 4, 5}));
}

// Every place of the ring, every fill, every item: the ring wraps before, at and behind the item.
TEST(QueueSearch, RemovingKeepsTheOrderWhereverTheRingWraps) {
    constexpr DWORD kMax = 6;
    for (DWORD start = 0; start < kMax; ++start) {
        for (uint32_t items = 1; items <= kMax; ++items) {
            for (uint32_t target = 0; target < items; ++target) {
                SCOPED_TRACE(testing::Message() << start << ' ' << items << ' ' << target);
                Numbers queue(kMax);
                queue.StartAtSlot(start);
                List expected;
                for (uint32_t i = 0; i < items; ++i) {
                    queue.Write(100 + i);
                    if (i != target) expected.push_back(100 + i);
                }
                Equals wanted(100 + target);
                Item found = {};
                ASSERT_EQ(queue.SearchItem(&found, &wanted, true), 1);
                ASSERT_EQ(NumberIn(&found), 100 + target);
                ASSERT_EQ(queue.All(), expected);
                // The units agree with the count: the room is refilled and all is read.
                while (queue.GetCount() < kMax) {
                    expected.push_back(200 + queue.GetCount());
                    queue.Write(expected.back());
                }
                for (uint32_t number : expected)
                    ASSERT_EQ(queue.Read(), number);
                queue.EndOfFile();
                ASSERT_TRUE(queue.AtEnd());
            }
        }
    }
}

TEST(QueueSearch, RemovalMakesRoomForABlockedWriter) {
    Numbers queue(2);
    queue.WriteAll({1, 2});
    Worker writer([&] { EXPECT_EQ(queue.Write(3), 1); });
    writer.WaitUntilAsleep();
    Equals two(2);
    EXPECT_EQ(queue.SearchItem(nullptr, &two, true), 1);
    writer.Join();
    EXPECT_EQ(queue.All(), (List{1, 3}));
}

TEST(QueueSearch, RemovalTakesTheReadersUnit) {
    Numbers queue(2);
    queue.Write(1);
    EXPECT_EQ(queue.SearchItem(nullptr, nullptr, true), 1);
    Worker reader([&] { EXPECT_EQ(queue.Read(), 2u); });
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    queue.Write(2);
}

TEST(QueueCriteria, MatchFollowsTheTwoDestructors) {
    int (ISearchCriteria::*match)(void*) = &ISearchCriteria::Match;
    uintptr_t words[2];
    static_assert(sizeof match == sizeof words, "a pointer to a member is two words");
    std::memcpy(words, &match, sizeof words);
    EXPECT_EQ((words[0] & ~uintptr_t{1}) / sizeof(void*), 2u);
}

// What cannot be had.

void ExpectRefusesEverything(CLNrwqueue& queue) {
    char item[64] = {};
    EXPECT_EQ(queue.WriteItem(item), 0);
    EXPECT_EQ(queue.ReadItem(item), 0);
    EXPECT_EQ(queue.GetWriteItem(), nullptr);
    EXPECT_EQ(queue.GetReadItem(), nullptr);
    EXPECT_EQ(queue.PeekItem(0), nullptr);
    EXPECT_EQ(queue.SearchItem(item, nullptr, true), 0);
    EXPECT_EQ(queue.Flush(nullptr), 0);
    EXPECT_EQ(queue.EndOfFile(), 0);
    queue.CommitWriteItem();
    queue.CommitReadItem();
    queue.CancelWriteItem();
    queue.CancelReadItem();
    EXPECT_EQ(queue.GetCount(), 0u);
}

TEST(Queue, WithoutSemaphoreRefusesEverything) {
    CLNrwqueue queue(0x80000000, 0);
    EXPECT_EQ(queue.GetMax(), 0x80000000u);
    ExpectRefusesEverything(queue);
}

TEST(Queue, WithoutMemoryRefusesEverything) {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    GTEST_SKIP() << "the sanitizer ends the program instead";
#endif
    CLNrwqueue queue(0x7FFFFFFF, 0xFFFFFFFF);
    ExpectRefusesEverything(queue);
}

TEST(Queue, ItemsMayBeEmpty) {
    CLNrwqueue queue(2, 0);
    char item = 'x';
    EXPECT_EQ(queue.WriteItem(&item), 1);
    EXPECT_EQ(queue.GetCount(), 1u);
    EXPECT_EQ(queue.ReadItem(&item), 1);
    EXPECT_EQ(item, 'x');
}

}  // namespace
