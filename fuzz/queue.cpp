// The ring queue along random schedules of two threads, compared with a plain list. The threads
// take turns, so that the list knows the outcome; only a call that sleeps, for an item or for room,
// is left to the second thread while the first one makes what it sleeps for.

#include <cstdint>
#include <cstring>
#include <deque>
#include <vector>

#include "fuzz/bytes.h"
#include "fuzz/worker.h"
#include "vidshow/platform/queue.h"

namespace {

using fuzz::Bytes;
using fuzz::Require;
using fuzz::Worker;

using Item = std::vector<uint8_t>;

class Equals : public ISearchCriteria {
  public:
    explicit Equals(const Item& wanted) : m_wanted(wanted) {}
    int Match(void* item) override {
        return std::memcmp(item, m_wanted.data(), m_wanted.size()) == 0;
    }

  private:
    const Item& m_wanted;
};

size_t g_flushed = 0;
void CountFlushed(void*) {
    ++g_flushed;
}

class Schedule {
  public:
    Schedule(Bytes& bytes, Worker& worker)
        : m_bytes(bytes),
          m_worker(worker),
          m_max(1 + bytes.Below(9)),
          m_itemSize(1 + bytes.Below(20)),
          m_queue(m_max, m_itemSize) {}

    void Step() {
        switch (m_bytes.Below(11)) {
            case 0:
            case 1:
                return Write();
            case 2:
                return WriteInPlace();
            case 3:
            case 4:
                return Read();
            case 5:
                return ReadInPlace();
            case 6:
                return Search();
            case 7:
                Require(m_queue.EndOfFile() == 0, "the end can always be marked");
                m_isEnded = true;
                return;
            case 8:
                return Flush();
            case 9:
                return Sleep();
            default:
                return Peek();
        }
    }

    void Check() {
        Require(m_queue.GetCount() == m_model.size(), "as many items as the list");
        Require(m_queue.GetMax() == m_max, "the slots stay");
    }

  private:
    Item NewItem() {
        Item item(m_itemSize);
        for (uint8_t& byte : item)
            byte = m_bytes.Byte();
        return item;
    }
    bool IsFull() const { return m_model.size() == m_max; }
    bool IsOldest(const void* item) const {
        return std::memcmp(item, m_model.front().data(), m_itemSize) == 0;
    }

    void Write() {
        if (IsFull()) return;
        Item item = NewItem();
        Require(m_queue.WriteItem(item.data()) == 1, "a free slot takes an item");
        m_model.push_back(item);
        m_isEnded = false;
    }

    void WriteInPlace() {
        if (IsFull()) return;
        const Item item = NewItem();
        void* const slot = m_queue.GetWriteItem();
        Require(slot != nullptr, "a free slot is handed out");
        std::memcpy(slot, item.data(), m_itemSize);
        if (m_bytes.Bit()) return m_queue.CancelWriteItem();
        m_queue.CommitWriteItem();
        m_model.push_back(item);
        m_isEnded = false;
    }

    void Read() {
        if (m_model.empty() && !m_isEnded) return;
        Item item(m_itemSize);
        const int result = m_queue.ReadItem(m_bytes.Below(4) != 0 ? item.data() : nullptr);
        Require(result == !m_model.empty(), "an item, or the end behind the last one");
        if (m_model.empty()) return;
        Require(item == Item(m_itemSize) || IsOldest(item.data()), "the oldest item is read");
        m_model.pop_front();
    }

    void ReadInPlace() {
        if (m_model.empty() && !m_isEnded) return;
        const void* const item = m_queue.GetReadItem();
        Require((item == nullptr) == m_model.empty(), "an item, or the end behind the last one");
        if (item == nullptr) return;
        Require(IsOldest(item), "the oldest item is handed out");
        if (m_bytes.Bit()) return m_queue.CancelReadItem();
        m_queue.CommitReadItem();
        m_model.pop_front();
    }

    void Search() {
        const bool any = m_bytes.Below(4) == 0;
        const bool remove = m_bytes.Bit();
        const size_t start = m_model.empty() ? 0 : m_bytes.Below(16) % m_model.size();
        const Item wanted = m_model.empty() || m_bytes.Below(4) == 0 ? NewItem() : m_model[start];
        Item found(m_itemSize);
        Equals criteria(wanted);
        const int result = m_queue.SearchItem(found.data(), any ? nullptr : &criteria, remove);
        auto match = m_model.begin();
        while (match != m_model.end() && !any && *match != wanted)
            ++match;
        Require(result == (match != m_model.end()), "what the list holds is found");
        if (match == m_model.end()) return;
        Require(found == *match, "the oldest match is found");
        if (remove) m_model.erase(match);
    }

    void Flush() {
        g_flushed = 0;
        const bool counts = m_bytes.Bit();
        Require(m_queue.Flush(counts ? CountFlushed : nullptr) == 0, "a flush succeeds");
        Require(!counts || g_flushed == m_model.size(), "the callback sees every item");
        m_model.clear();
    }

    void Sleep() {
        if (m_model.empty() && !m_isEnded) return SleepForItem();
        if (IsFull()) return SleepForRoom();
    }

    void SleepForItem() {
        Item read(m_itemSize);
        int result = -1;
        m_worker.Start([&] { result = m_queue.ReadItem(read.data()); });
        if (m_bytes.Bit()) {
            Item item = NewItem();
            Require(m_queue.WriteItem(item.data()) == 1, "a free slot takes an item");
            m_worker.Finish();
            Require(result == 1 && read == item, "a reader that slept gets the item");
        } else {
            Require(m_queue.EndOfFile() == 0, "the end can always be marked");
            m_worker.Finish();
            Require(result == 0, "the end wakes a reader");
            m_isEnded = true;
        }
    }

    void SleepForRoom() {
        Item item = NewItem();
        int result = -1;
        m_worker.Start([&] { result = m_queue.WriteItem(item.data()); });
        if (m_bytes.Bit()) {
            Read();
        } else {
            Flush();
        }
        m_worker.Finish();
        Require(result == 1, "a writer that slept finds room");
        m_model.push_back(item);
        m_isEnded = false;
    }

    void Peek() {
        const DWORD index = m_bytes.Below(12);
        const void* const item = m_queue.PeekItem(index);
        Require((item != nullptr) == (index < m_model.size()), "items within the count are seen");
        if (item == nullptr) return;
        Require(std::memcmp(item, m_model[index].data(), m_itemSize) == 0, "in their order");
    }

    Bytes& m_bytes;
    Worker& m_worker;
    const DWORD m_max;
    const DWORD m_itemSize;
    CLNrwqueue m_queue;
    std::deque<Item> m_model;
    bool m_isEnded = false;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static Worker worker;
    Bytes bytes(data, size);
    Schedule schedule(bytes, worker);
    while (!bytes.empty()) {
        schedule.Step();
        schedule.Check();
    }
    return 0;
}
