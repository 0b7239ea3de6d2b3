#pragma once

namespace faults {

/// Watches what the library asks of the system while it exists, in all threads, and refuses one
/// request; one watch at a time. The calls: malloc, calloc and `new (std::nothrow)`, threads,
/// joins, locks, semaphores, files, pipes, mappings, and the window's geometry, lock and post; and
/// what asks `IsRefused`.
class Watch {
  public:
    /// @param failing number of the request, from 0, that is refused; negative: none is
    explicit Watch(int failing);
    ~Watch();
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;

    const char* refused() const;  ///< the call that was; null: there were fewer requests
    int heldLocks() const;        ///< taken since, and not given back
    int liveBlocks() const;       ///< of memory; 0 under a sanitizer, which counts them itself
    int liveViews() const;        ///< of mappings
};

/// For what stands behind pointers that the library is handed, as a window's hooks and Java do.
/// @return whether this request, of this name, is the one to be refused
bool IsRefused(const char* name);

}  // namespace faults
