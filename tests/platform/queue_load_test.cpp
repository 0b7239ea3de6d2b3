// Writers and readers on one queue: every item arrives exactly once, and the items of one writer in
// the order in which it wrote them.

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>

#include "platform/sync_kit.h"
#include "testkit/random.h"
#include "vidshow/platform/queue.h"

namespace {

using sync_kit::Below;

struct Item {
    uint32_t writer;
    uint32_t sequence;
    uint32_t check;
};

Item ItemOf(uint32_t writer, uint32_t sequence) {
    return Item{writer, sequence, writer * 2654435761u ^ sequence};
}

// What one reader got, per writer, in the order in which it got it.
using Received = std::vector<std::vector<uint32_t>>;

void Record(const Item& item, Received* received) {
    ASSERT_LT(item.writer, received->size());
    ASSERT_EQ(item.check, item.writer * 2654435761u ^ item.sequence) << "an item is torn";
    (*received)[item.writer].push_back(item.sequence);
}

void ExpectEachOnceAndInOrder(const std::vector<Received>& readers, size_t writers,
                              size_t itemsPerWriter) {
    for (size_t writer = 0; writer < writers; ++writer) {
        std::vector<int> times(itemsPerWriter);
        for (const Received& reader : readers) {
            const std::vector<uint32_t>& got = reader[writer];
            EXPECT_TRUE(std::is_sorted(got.begin(), got.end())) << "writer " << writer;
            for (uint32_t sequence : got)
                ++times.at(sequence);
        }
        EXPECT_EQ(std::count(times.begin(), times.end(), 1),
                  static_cast<std::ptrdiff_t>(itemsPerWriter))
            << "writer " << writer;
    }
}

std::vector<Received> Pass(DWORD slots, uint32_t writers, size_t readers, size_t itemsPerWriter) {
    CLNrwqueue queue(slots, sizeof(Item));
    std::vector<Received> received(readers, Received(writers));
    std::vector<std::thread> readerThreads;
    for (Received& mine : received) {
        readerThreads.emplace_back([&queue, &mine] {
            Item item = {};
            while (queue.ReadItem(&item) == 1)
                Record(item, &mine);
        });
    }
    std::vector<std::thread> writerThreads;
    for (uint32_t writer = 0; writer < writers; ++writer) {
        writerThreads.emplace_back([&queue, writer, itemsPerWriter] {
            for (uint32_t i = 0; i < itemsPerWriter; ++i) {
                Item item = ItemOf(writer, i);
                ASSERT_EQ(queue.WriteItem(&item), 1);
            }
        });
    }
    for (std::thread& thread : writerThreads)
        thread.join();
    queue.EndOfFile();
    for (std::thread& thread : readerThreads)
        thread.join();
    EXPECT_EQ(queue.GetCount(), 0u);
    return received;
}

TEST(QueueLoad, FourWritersAndFourReadersPassAMillionItems) {
    const size_t each = sync_kit::Load(250000);
    ExpectEachOnceAndInOrder(Pass(1024, 4, 4, each), 4, each);
}

TEST(QueueLoad, OneSlotBetweenManyThreads) {
    const size_t each = sync_kit::Load(2500);
    ExpectEachOnceAndInOrder(Pass(1, 4, 4, each), 4, each);
}

TEST(QueueLoad, OneWriterManyReaders) {
    const size_t each = sync_kit::Load(50000);
    ExpectEachOnceAndInOrder(Pass(16, 1, 7, each), 1, each);
}

TEST(QueueLoad, ManyWritersOneReaderGetsEachWritersOrder) {
    const size_t each = sync_kit::Load(10000);
    ExpectEachOnceAndInOrder(Pass(16, 7, 1, each), 7, each);
}

TEST(QueueLoad, InPlaceBetweenOneWriterAndOneReader) {
    const uint32_t items = static_cast<uint32_t>(sync_kit::Load(100000));
    CLNrwqueue queue(8, sizeof(Item));
    std::thread writer([&] {
        std::mt19937 random = testkit::Random(1);
        for (uint32_t i = 0; i < items; ++i) {
            if (Below(random, 16) == 0) {
                queue.GetWriteItem();
                queue.CancelWriteItem();
            }
            *static_cast<Item*>(queue.GetWriteItem()) = ItemOf(0, i);
            queue.CommitWriteItem();
        }
        queue.EndOfFile();
    });
    std::mt19937 random = testkit::Random(2);
    std::vector<Received> received(1, Received(1));
    while (const void* item = queue.GetReadItem()) {
        if (Below(random, 16) == 0) {
            queue.CancelReadItem();
            continue;
        }
        Record(*static_cast<const Item*>(item), &received[0]);
        queue.CommitReadItem();
    }
    writer.join();
    ExpectEachOnceAndInOrder(received, 1, items);
}

// Readers, a searcher that removes from the middle, and a flusher share the items out among them.
std::atomic<size_t> g_flushed{0};

TEST(QueueLoad, ReadingSearchingAndFlushingShareTheItems) {
    struct EveryFifth : ISearchCriteria {
        int Match(void* item) override { return static_cast<Item*>(item)->sequence % 5 == 0; }
    };
    const uint32_t items = static_cast<uint32_t>(sync_kit::Load(40000));
    CLNrwqueue queue(32, sizeof(Item));
    std::atomic<bool> written{false};
    std::atomic<size_t> read{0};
    std::atomic<size_t> searched{0};
    g_flushed = 0;
    std::thread reader([&] {
        Item item = {};
        while (queue.ReadItem(&item) == 1)
            ++read;
    });
    std::thread searcher([&] {
        EveryFifth fifth;
        Item item = {};
        while (!written) {
            if (queue.SearchItem(&item, &fifth, true) == 0) {
                std::this_thread::yield();
                continue;
            }
            EXPECT_EQ(item.sequence % 5, 0u);
            ++searched;
        }
    });
    std::thread flusher([&] {
        for (int i = 0; i < 100 && !written; ++i) {
            queue.Flush([](void*) { ++g_flushed; });
            std::this_thread::yield();
        }
    });
    for (uint32_t i = 0; i < items; ++i) {
        Item item = ItemOf(0, i);
        ASSERT_EQ(queue.WriteItem(&item), 1);
    }
    written = true;
    searcher.join();
    flusher.join();
    queue.EndOfFile();
    reader.join();
    EXPECT_EQ(read + searched + g_flushed, items);
}

}  // namespace
