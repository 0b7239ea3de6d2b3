#ifndef VIDSHOW_PLATFORM_QUEUE_H
#define VIDSHOW_PLATFORM_QUEUE_H

/// @file
/// A bounded first-in-first-out queue of fixed-size items between threads.

#include <atomic>

#include "vidshow/types.h"

/// Chooses an item for `CLNrwqueue::SearchItem`.
class VIDSHOW_API ISearchCriteria {
  public:
    virtual ~ISearchCriteria();

    /// Called with the queue locked. @return not 0 when the item is the one looked for
    virtual int Match(void* item) = 0;
};

/// A ring of `max` slots, safe between any number of writers and readers as long as they copy whole
/// items (`WriteItem`, `ReadItem`). The in-place calls hand out a slot and let the lock go: they
/// are for one writer and one reader.
///
/// `EndOfFile` marks the end behind the items: when they are read, every reader is told so at once,
/// until a writer goes on. Where memory or a semaphore could not be had, the queue holds nothing:
/// calls return 0 or null without blocking.
class VIDSHOW_API CLNrwqueue {
  public:
    /// @param max      slots, at least 1
    /// @param itemSize bytes of an item
    CLNrwqueue(DWORD max, DWORD itemSize);
    CLNrwqueue(const CLNrwqueue&) = delete;
    CLNrwqueue& operator=(const CLNrwqueue&) = delete;
    ~CLNrwqueue();  ///< no thread may use the queue any more

    /// Copies an item in, blocking while the queue is full. @return 1
    /// @param src null posts a reader's unit without an item: the reader is told the end, and the
    ///            slot is lost for the life of the queue
    int WriteItem(void* src);

    /// Copies the oldest item out, blocking until there is one.
    /// @param dst null drops the item
    /// @return 1; 0 at the end of the file
    int ReadItem(void* dst);

    /// Blocks while the queue is full. @return the slot to be filled, to be given to the readers by
    /// `CommitWriteItem` or back by `CancelWriteItem`
    void* GetWriteItem();
    void CommitWriteItem();  ///< the filled slot becomes the newest item
    void CancelWriteItem();  ///< the slot is free again

    /// Blocks until there is an item. @return the oldest item, to be ended by `CommitReadItem` or
    /// `CancelReadItem`; null at the end of the file
    void* GetReadItem();
    void CommitReadItem();  ///< the item is gone
    void CancelReadItem();  ///< the item stays the oldest

    /// @param index 0 is the oldest item
    /// @return the item, which a reader may take away at any moment; null when there are not so
    /// many
    void* PeekItem(DWORD index);

    /// Marks the end behind the items; again does nothing. @return 0
    int EndOfFile();

    /// Drops all items, oldest first, and starts over at the first slot. An end of file stays.
    /// @param callback called for every item with the queue locked; may be null
    /// @return 0
    int Flush(void (*callback)(void*));

    /// Finds the oldest item that matches.
    /// @param dst      receives the item; may be null
    /// @param criteria null: every item matches
    /// @param remove   takes the item out; the others keep their order
    /// @return 1 when found, else 0
    int SearchItem(void* dst, ISearchCriteria* criteria, bool remove);

    DWORD GetCount();  ///< items, perhaps no longer true on return
    DWORD GetMax();    ///< slots

  private:
    bool Lock();
    bool LockWith(HANDLE unit);
    bool LockWithItem();
    void Unlock();
    unsigned char* Slot(DWORD slot);
    DWORD SlotOfItem(DWORD index);
    void Advance(DWORD* slot);
    void SetCount(DWORD count);
    void Append();
    void Announce();
    void TakeUnitOfItem();
    void DropOldest();
    void Remove(DWORD slot);
    void CloseGap(DWORD found);

    HANDLE m_lock;               ///< mutex; null: the queue could not be made
    HANDLE m_items;              ///< semaphore: readable items, and one while the end is pending
    HANDLE m_free;               ///< semaphore: free slots
    unsigned char* m_buffer;     ///< m_max items; guarded by m_lock, or by a unit of a semaphore
    DWORD m_max;                 ///< constant
    DWORD m_itemSize;            ///< constant
    std::atomic<DWORD> m_count;  ///< changed under m_lock, also read without
    DWORD m_read;                ///< slot of the oldest item; guarded by m_lock
    DWORD m_write;               ///< slot of the next item; guarded by m_lock
    DWORD m_endOfFile;           ///< the end is pending; guarded by m_lock
    DWORD m_owed;  ///< units in readers' hands whose items are gone; guarded by m_lock
};

#endif
