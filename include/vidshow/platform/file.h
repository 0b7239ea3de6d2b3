#ifndef VIDSHOW_PLATFORM_FILE_H
#define VIDSHOW_PLATFORM_FILE_H

/// @file
/// Files, pipes, mappings, directories, modules and the environment.
///
/// Flags are Linux's own, given where Win32 has its: open flags, `mmap` protections and flags,
/// `lseek` origins. A call that fails leaves `errno`, which is what `GetLastError` tells, as the
/// system call set it. Paths and names must not be null. A path of 4096 bytes or more, its end
/// counted, fails with ENAMETOOLONG.
///
/// Files and mappings can be waited for like every object; they are always ready. `CloseHandle`
/// closes them.
///
/// Thread rule: any thread may call. Threads that share a file share its position, as the system
/// keeps it; a file or a mapping is made (`Init`, `SetRegion`) before it is shared.

#include "vidshow/platform/sync.h"

/// An open file, or one end of a pipe. Positions and sizes have 64 bits on every processor.
///
/// Usually plain; `SetRegion` makes the object show a part of its file as if it were the whole.
class VIDSHOW_API CLinuxFile : public CLinuxSyncObject {
  public:
    CLinuxFile();                 ///< no file
    explicit CLinuxFile(int fd);  ///< owns `fd` from now on; -1 is none
    ~CLinuxFile() override;       ///< closes the file

    /// Opens a file, plain. A file that the object had before is closed.
    /// @param path  not null
    /// @param flags as `open` takes them
    /// @param mode  of a file that this creates
    /// @return 0; -1 with `errno`
    int Init(const char* path, int flags, int mode);

    /// Confines the object to `length` bytes of its file from `start` on: sizes, positions and
    /// reads see only them, and positions count from `start`. Writes are not confined. The position
    /// becomes the region's start. Whoever makes the object calls this before it is shared.
    /// @param start, length in bytes, not negative; the file need not be so long
    /// @return 0; -1 with `errno`, the object as it was: EINVAL for a region that no file can have,
    ///         ESPIPE for a pipe, EBADF without a file
    int SetRegion(int64_t start, int64_t length);

    int GetFD() const;  ///< the descriptor, still the object's own; -1 without a file

    /// @return the file's size, or the region's, in bytes; -1 with `errno`
    int64_t GetSize() const;

    /// @param high receives the upper 32 bits of `GetSize`; may be null
    /// @return the lower 32 bits; 0xFFFFFFFF, with nothing stored, on failure
    DWORD GetFileSize(DWORD* high) const;

    /// Reads up to `n` bytes at the position, as `read`; from a region no byte past its end.
    /// @param buffer room for `n` bytes
    /// @param n      bytes
    /// @return bytes read; 0 at the end, and in a region also when there is no position; -1 with
    ///         `errno`
    int Read(void* buffer, int n);

    /// Writes up to `n` bytes at the position, as `write`.
    /// @param buffer the bytes
    /// @param n      how many
    /// @return bytes written; -1 with `errno`
    int Write(const void* buffer, int n);

    /// Moves the position.
    ///
    /// In a region, origin 0 takes offsets from 0 to the region's length, origin 2 from minus that
    /// to 0, and origin 1 only tells the position, whatever the offset.
    /// @param low    the offset, signed, when `high` is null; else its lower 32 bits
    /// @param high   the offset's upper 32 bits; receives those of the new position. May be null.
    /// @param origin 0 from the start, 1 from the position, 2 from the end
    /// @return the lower 32 bits of the new position; 0xFFFFFFFF with `errno` on failure, when the
    ///         position and `*high` stay
    DWORD SetFilePointer(LONG low, LONG* high, int origin);

    const char* getType() const override;
    int WaitAction() override;               ///< @return 0
    DWORD WaitForSignal(DWORD ms) override;  ///< @return WAIT_OBJECT_0 at once

  private:
    int64_t SeekInRegion(int64_t offset, int origin);

    int32_t m_fd;            ///< -1: none
    int64_t m_regionStart;   ///< byte of the file
    int64_t m_regionLength;  ///< bytes
    int32_t m_regionMode;    ///< 1: confined to the region; 0: plain
};

/// A file's contents, ready to be seen as memory. It has a descriptor of its own, so the file may
/// be closed first; views stay when the mapping is closed.
class VIDSHOW_API CLinuxFileMapping : public CLinuxSyncObject {
  public:
    CLinuxFileMapping();            ///< of nothing
    ~CLinuxFileMapping() override;  ///< closes the descriptor; views stay

    /// Before first use.
    /// @param file  doubled, not owned; may be closed afterwards
    /// @param size  bytes; 0: the lower 32 bits of the file's size
    /// @param flags of every view, as `mmap` takes them: MAP_SHARED, MAP_PRIVATE ...
    /// @return 0; -1 when the file is null, its size cannot be read or its descriptor not doubled
    int Init(CLinuxFile* file, unsigned size, int flags);

    /// Makes a view, which stays until it is ended by its address.
    /// @param protection as `mmap` takes it: PROT_READ ...
    /// @param offset     of the file, a multiple of the page size
    /// @param size       bytes; 0: the mapping's size
    /// @return the view; null before `Init` or when `mmap` fails
    void* MapView(int protection, long offset, unsigned size);

    /// @return bytes of the view that was asked for last; 0 before that
    unsigned GetViewSize() const;

    /// Ends a view.
    /// @param view its address
    /// @param size its bytes; 0 is refused
    /// @return 1; 0 for a size of 0 or when `munmap` fails
    static BOOL UnmapViewByAddress(void* view, unsigned size);

    const char* getType() const override;
    int WaitAction() override;               ///< @return 0
    DWORD WaitForSignal(DWORD ms) override;  ///< @return WAIT_OBJECT_0 at once

  private:
    int32_t m_fd;         ///< -1: none
    uint32_t m_size;      ///< bytes
    uint32_t m_viewSize;  ///< bytes of the last view
    int32_t m_flags;      ///< of every view
};

extern "C" {

/// @name Files
/// @{

/// Opens or creates a file.
///
/// With a mode of -1 the file is opened with `openFlags` alone, and when that fails once more with
/// O_CREAT added: a file that this creates has all twelve mode bits that the process's mask leaves.
/// @param path                  not null
/// @param openFlags, extraFlags as `open` takes them, together: O_RDWR, O_CREAT ...
/// @param share, attributes     not looked at
/// @param mode                  of a file that this creates; 0 means 0644
/// @return the file; INVALID_HANDLE_VALUE with `errno`
VIDSHOW_API HANDLE CreateFile(const char* path, int openFlags, DWORD share, void* attributes,
                              int extraFlags, int mode);

/// Reads up to `n` bytes.
/// @param file       a file
/// @param buffer     room for `n` bytes
/// @param n          bytes, below 2^31
/// @param bytesRead  receives how many; 0 at the end, 0xFFFFFFFF when reading failed. Not null.
/// @param overlapped not looked at
/// @return 1, also when reading failed; 0 for the handles 0, 0xFFFFFFFE and 0xFFFFFFFF or without
///         `bytesRead`
VIDSHOW_API BOOL ReadFile(HANDLE file, void* buffer, DWORD n, DWORD* bytesRead, void* overlapped);

/// Writes up to `n` bytes.
/// @param file         a file
/// @param buffer       the bytes
/// @param n            how many, below 2^31
/// @param bytesWritten receives how many; 0xFFFFFFFF when writing failed. Not null.
/// @param overlapped   not looked at
/// @return as `ReadFile`
VIDSHOW_API BOOL WriteFile(HANDLE file, const void* buffer, DWORD n, DWORD* bytesWritten,
                           void* overlapped);

/// Tells a file's size in bytes.
/// @param file a file
/// @param high receives the size's upper 32 bits; may be null
/// @return the lower 32 bits; 0xFFFFFFFF on failure and for the handles 0 and 0xFFFFFFFF
VIDSHOW_API DWORD GetFileSize(HANDLE file, DWORD* high);

/// Moves the position, as `CLinuxFile::SetFilePointer`. Clears `errno` first, so that a lower half
/// of 0xFFFFFFFF can be told from a failure.
/// @param file   a file
/// @param low    the offset, signed, when `high` is null; else its lower 32 bits
/// @param high   the offset's upper 32 bits; receives those of the new position. May be null.
/// @param origin 0 from the start, 1 from the position, 2 from the end
/// @return the lower 32 bits of the new position; 0xFFFFFFFF on failure, and with EBADF for the
///         handles 0 and 0xFFFFFFFF
VIDSHOW_API DWORD SetFilePointer(HANDLE file, LONG low, LONG* high, DWORD origin);

/// Writes what the system still holds of the file to its device. No handle is refused: it must be a
/// file's.
/// @param file a file
/// @return 1; 0 when `fsync` fails
VIDSHOW_API BOOL FlushFileBuffers(HANDLE file);

/// Makes a pipe, each end of which is a file to be closed by `CloseHandle`.
/// @param readEnd          receives the end to read from
/// @param writeEnd         receives the end to write to
/// @param attributes, size not looked at
/// @return 1; 0, with nothing stored, when an address is null or no pipe can be had
VIDSHOW_API BOOL CreatePipe(HANDLE* readEnd, HANDLE* writeEnd, void* attributes, DWORD size);

/// @}

/// @name Directories
/// @{

/// Takes a file's name away. @param path its path @return 1; 0 with `errno`
VIDSHOW_API BOOL DeleteFile(const char* path);

/// Renames a file or a directory, and replaces what is there.
/// @param from its path
/// @param to   the new path, on the same file system
/// @return 1; 0 with `errno`
VIDSHOW_API BOOL MoveFile(const char* from, const char* to);

/// Makes a directory of mode 0777 less the process's mask.
/// @param path       its path
/// @param attributes not looked at
/// @return 1; 0 with `errno`
VIDSHOW_API BOOL CreateDirectory(const char* path, void* attributes);

/// Takes an empty directory away. @param path its path @return 1; 0 with `errno`
VIDSHOW_API BOOL RemoveDirectory(const char* path);

/// Tells what a path leads to.
/// @param path the path
/// @return the mode word of `stat`, type and permissions; 0xFFFF when there is no such file
VIDSHOW_API DWORD GetFileAttributes(const char* path);

/// Tells a file system's room in bytes. Each address may be null.
/// @param path         a file or directory of it
/// @param freeToCaller receives what users other than root may still fill
/// @param total        receives its size
/// @param totalFree    receives what is free, root's reserve included
/// @return 1; 0, with nothing stored, for a null or empty path or when `statfs` fails
VIDSHOW_API BOOL GetDiskFreeSpaceEx(const char* path, uint64_t* freeToCaller, uint64_t* total,
                                    uint64_t* totalFree);

/// @}

/// @name Mappings
/// @{

/// Makes a mapping of a file, to be closed by `CloseHandle`.
/// @param file                       a file; may be closed before the mapping
/// @param mmapFlags                  of every view: MAP_SHARED, MAP_PRIVATE ...
/// @param sizeLow                    bytes; 0: the file's size
/// @param attributes, sizeHigh, name not looked at
/// @return the mapping; INVALID_HANDLE_VALUE, not null, on failure and for the files 0 and
///         0xFFFFFFFF
VIDSHOW_API HANDLE CreateFileMapping(HANDLE file, void* attributes, DWORD mmapFlags, DWORD sizeHigh,
                                     DWORD sizeLow, const char* name);

/// Makes a view of a mapping, which stays until `UnmapViewOfFileEx`.
/// @param mapping    a mapping; may be closed before the view
/// @param protection PROT_READ, PROT_WRITE ...
/// @param offsetHigh not looked at
/// @param offsetLow  of the file, a multiple of the page size
/// @param size       bytes; 0: the mapping's size
/// @return the view; null on failure and for the mappings 0 and 0xFFFFFFFF
VIDSHOW_API void* MapViewOfFile(HANDLE mapping, DWORD protection, DWORD offsetHigh, DWORD offsetLow,
                                DWORD size);

/// Does nothing, for it does not know the view's size: the view stays.
/// @param view not looked at
/// @return 0
VIDSHOW_API BOOL UnmapViewOfFile(void* view);

/// Ends a view.
/// @param view its address
/// @param size its bytes
/// @return 1; 0 for a size of 0 or when `munmap` fails
VIDSHOW_API BOOL UnmapViewOfFileEx(void* view, DWORD size);

/// @}

/// @name Modules
/// @{

/// Loads a module; its functions are found when they are first called.
/// @param name a path, or a name to be searched where the system searches
/// @return the module; null when it cannot be loaded
VIDSHOW_API void* LoadLibrary(const char* name);

/// Gives a module back.
/// @param module what `LoadLibrary` returned
/// @return 1; 0 for null or when the system does not know the module
VIDSHOW_API BOOL FreeLibrary(void* module);

/// Finds a function or an object by its name, as `dlsym`.
/// @param module what `LoadLibrary` returned; null looks at what the process itself sees
/// @param name   its name
/// @return its address; null when there is none
VIDSHOW_API void* GetProcAddress(void* module, const char* name);

/// Tells the path of the program that runs, cut to `size` - 1 characters, and its end.
/// @param module not looked at
/// @param buffer receives the path and its end
/// @param size   bytes of `buffer`
/// @return characters stored, without the end; 0, with nothing stored, for a size below 2 or when
///         the system does not tell
VIDSHOW_API DWORD GetModuleFileName(void* module, char* buffer, DWORD size);

/// Tells the directory of modules, which is the environment's "QZ_DLL_PATH".
/// @param size   bytes of `buffer`
/// @param buffer receives the path and its end
/// @return its length without the end; 0, with nothing stored, when it is not set or does not fit
///         with its end
VIDSHOW_API DWORD GetDllDirectory(DWORD size, char* buffer);

/// Sets "QZ_DLL_PATH".
/// @param path its new value, of at most 4095 bytes
/// @return 0 for success, unlike the Win32 function; -1 with `errno`
VIDSHOW_API int SetDllDirectory(const char* path);

/// Sets a variable of the environment, or takes it away. No other thread may look at the
/// environment meanwhile.
/// @param name  the variable's name
/// @param value null takes the variable away
/// @return 1 when it is set; 0 when it cannot be, and always when it is taken away
VIDSHOW_API BOOL SetEnvironmentVariable(const char* name, const char* value);

/// @}

}  // extern "C"

#endif
