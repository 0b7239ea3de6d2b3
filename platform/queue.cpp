// The ring queue, made of a mutex and two semaphores of this layer.
//
// `m_items` holds a unit for each readable item, `m_free` one for each free slot, and the ring
// itself is guarded by `m_lock`. A writer takes a free unit and then the lock, a reader an item's
// unit and then the lock; whoever holds the lock waits for nothing, so that a wait for the lock is
// short. Of the readers that an item wakes, one gets its unit and goes on to the lock.
//
// Flush and SearchItem take items from under the lock, and the items' units with them. A unit that
// a reader has already taken on its way to the lock is owed: the next reader that gets the lock
// drops its unit instead of reading, and waits anew. Otherwise it would find a unit without an
// item, which is the end of the file.
//
// An end of file is one more unit of `m_items`, without an item. A reader that gets it finds the
// ring empty and gives it back, for the next reader. A writer that comes later leaves it as the
// unit of its own item and takes the mark away.

#include "vidshow/platform/queue.h"

#include <cstdint>
#include <cstring>
#include <new>

#include "vidshow/platform/sync.h"

ISearchCriteria::~ISearchCriteria() = default;

namespace {

unsigned char* NewBuffer(size_t items, size_t itemSize) {
    if (itemSize != 0 && items > SIZE_MAX / itemSize) return nullptr;
    return new (std::nothrow) unsigned char[items * itemSize];
}

}  // namespace

CLNrwqueue::CLNrwqueue(DWORD max, DWORD itemSize)
    : m_lock(CreateMutex(nullptr, FALSE, nullptr)),
      m_items(CreateSemaphore(nullptr, 0, static_cast<LONG>(max + 1), nullptr)),
      m_free(CreateSemaphore(nullptr, static_cast<LONG>(max), static_cast<LONG>(max), nullptr)),
      m_buffer(NewBuffer(max, itemSize)),
      m_max(max),
      m_itemSize(itemSize),
      m_count(0),
      m_read(0),
      m_write(0),
      m_endOfFile(0),
      m_owed(0) {
    if (m_items != nullptr && m_free != nullptr && m_buffer != nullptr) return;
    CloseHandle(m_lock);
    m_lock = nullptr;
}

CLNrwqueue::~CLNrwqueue() {
    delete[] m_buffer;
    CloseHandle(m_lock);
    CloseHandle(m_items);
    CloseHandle(m_free);
}

bool CLNrwqueue::Lock() {
    return WaitForSingleObject(m_lock, INFINITE) == WAIT_OBJECT_0;
}

bool CLNrwqueue::LockWith(HANDLE unit) {
    return m_lock != nullptr && WaitForSingleObject(unit, INFINITE) == WAIT_OBJECT_0 && Lock();
}

bool CLNrwqueue::LockWithItem() {
    while (LockWith(m_items)) {
        if (m_owed == 0) return true;
        --m_owed;
        Unlock();
    }
    return false;
}

void CLNrwqueue::Unlock() {
    ReleaseMutex(m_lock);
}

unsigned char* CLNrwqueue::Slot(DWORD slot) {
    return m_buffer + size_t{slot} * m_itemSize;
}

DWORD CLNrwqueue::SlotOfItem(DWORD index) {
    const DWORD slot = m_read + index;
    return slot < m_max ? slot : slot - m_max;
}

void CLNrwqueue::Advance(DWORD* slot) {
    *slot = *slot + 1 < m_max ? *slot + 1 : 0;
}

void CLNrwqueue::SetCount(DWORD count) {
    m_count.store(count, std::memory_order_relaxed);
}

// The write slot becomes the newest item.
void CLNrwqueue::Append() {
    Advance(&m_write);
    SetCount(GetCount() + 1);
}

// One more unit for the readers, unless that of a pending end of file is still there to be used.
void CLNrwqueue::Announce() {
    if (m_endOfFile != 0) {
        m_endOfFile = 0;
    } else {
        ReleaseSemaphore(m_items, 1, nullptr);
    }
}

void CLNrwqueue::TakeUnitOfItem() {
    if (WaitForSingleObject(m_items, 0) != WAIT_OBJECT_0) ++m_owed;
}

void CLNrwqueue::DropOldest() {
    Advance(&m_read);
    SetCount(GetCount() - 1);
    ReleaseSemaphore(m_free, 1, nullptr);
}

int CLNrwqueue::WriteItem(void* src) {
    if (!LockWith(m_free)) return 0;
    if (src != nullptr) {
        std::memcpy(Slot(m_write), src, m_itemSize);
        Append();
    }
    Announce();
    Unlock();
    return 1;
}

int CLNrwqueue::ReadItem(void* dst) {
    if (!LockWithItem()) return 0;
    const bool found = GetCount() != 0;
    if (found) {
        if (dst != nullptr) std::memcpy(dst, Slot(m_read), m_itemSize);
        DropOldest();
    } else {
        ReleaseSemaphore(m_items, 1, nullptr);
    }
    Unlock();
    return found;
}

void* CLNrwqueue::GetWriteItem() {
    if (!LockWith(m_free)) return nullptr;
    void* item = Slot(m_write);
    Unlock();
    return item;
}

void CLNrwqueue::CommitWriteItem() {
    if (!Lock()) return;
    Append();
    Announce();
    Unlock();
}

void CLNrwqueue::CancelWriteItem() {
    ReleaseSemaphore(m_free, 1, nullptr);
}

void* CLNrwqueue::GetReadItem() {
    if (!LockWithItem()) return nullptr;
    void* item = nullptr;
    if (GetCount() != 0) {
        item = Slot(m_read);
    } else {
        ReleaseSemaphore(m_items, 1, nullptr);
    }
    Unlock();
    return item;
}

void CLNrwqueue::CommitReadItem() {
    if (!Lock()) return;
    DropOldest();
    Unlock();
}

void CLNrwqueue::CancelReadItem() {
    ReleaseSemaphore(m_items, 1, nullptr);
}

void* CLNrwqueue::PeekItem(DWORD index) {
    if (!Lock()) return nullptr;
    void* item = index < GetCount() ? Slot(SlotOfItem(index)) : nullptr;
    Unlock();
    return item;
}

int CLNrwqueue::EndOfFile() {
    if (!Lock()) return 0;
    if (m_endOfFile == 0) {
        m_endOfFile = 1;
        ReleaseSemaphore(m_items, 1, nullptr);
    }
    Unlock();
    return 0;
}

int CLNrwqueue::Flush(void (*callback)(void*)) {
    if (!Lock()) return 0;
    while (GetCount() != 0) {
        TakeUnitOfItem();
        if (callback != nullptr) callback(Slot(m_read));
        DropOldest();
    }
    m_read = 0;
    m_write = 0;
    Unlock();
    return 0;
}

int CLNrwqueue::SearchItem(void* dst, ISearchCriteria* criteria, bool remove) {
    if (!Lock()) return 0;
    const DWORD count = GetCount();
    DWORD index = 0;
    while (index < count && criteria != nullptr && criteria->Match(Slot(SlotOfItem(index))) == 0) {
        ++index;
    }
    const bool found = index < count;
    if (found) {
        const DWORD slot = SlotOfItem(index);
        if (dst != nullptr) std::memcpy(dst, Slot(slot), m_itemSize);
        if (remove) Remove(slot);
    }
    Unlock();
    return found;
}

void CLNrwqueue::Remove(DWORD slot) {
    TakeUnitOfItem();
    CloseGap(slot);
    DropOldest();
}

// Moves the items from the oldest up to `found` one slot on, over the one in `found`.
void CLNrwqueue::CloseGap(DWORD found) {
    if (found < m_read) {
        std::memmove(Slot(1), Slot(0), size_t{found} * m_itemSize);
        std::memcpy(Slot(0), Slot(m_max - 1), m_itemSize);
        found = m_max - 1;
    }
    std::memmove(Slot(m_read + 1), Slot(m_read), size_t{found - m_read} * m_itemSize);
}

DWORD CLNrwqueue::GetCount() {
    return m_count.load(std::memory_order_relaxed);
}

DWORD CLNrwqueue::GetMax() {
    return m_max;
}
