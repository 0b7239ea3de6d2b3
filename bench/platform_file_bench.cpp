// Files, pipes, mappings and the single-byte wide-character functions, beside the system's calls
// that they stand for, and beside stdio. Goal: what ends in a system call costs at most 1.1 times
// that call alone.

#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>
#include <wchar.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "bench/compare_calls.h"
#include "vidshow/platform.h"

namespace {

constexpr size_t kFileBytes = 4u << 20;
constexpr size_t kPiece = 64u << 10;
constexpr size_t kRecord = 64;

// Few enough that a run mostly ends before somebody else gets the processor.
constexpr int kCalls = 300;     // of the system
constexpr int kInPlace = 5000;  // without it

char g_path[] = "/tmp/vidshow-bench-XXXXXX";
std::vector<char> g_buffer(kPiece, 'x');

// A file of `kFileBytes`, there as long as the program runs.
class BenchFile {
  public:
    BenchFile() {
        const int fd = mkstemp(g_path);
        for (size_t done = 0; done < kFileBytes; done += kPiece) {
            if (write(fd, g_buffer.data(), kPiece) != static_cast<ssize_t>(kPiece)) std::abort();
        }
        close(fd);
    }
    ~BenchFile() { unlink(g_path); }
};

// One file under the same few names, three ways.

class LayerFile {
  public:
    LayerFile() : m_file(CreateFile(g_path, O_RDWR, 0, nullptr, 0, 0)) {}
    ~LayerFile() { CloseHandle(m_file); }
    size_t Read(size_t n) {
        DWORD bytes = 0;
        ReadFile(m_file, g_buffer.data(), static_cast<DWORD>(n), &bytes, nullptr);
        return bytes;
    }
    void Write(size_t n) {
        DWORD bytes = 0;
        WriteFile(m_file, g_buffer.data(), static_cast<DWORD>(n), &bytes, nullptr);
    }
    void Seek(size_t position) {
        SetFilePointer(m_file, static_cast<LONG>(position), nullptr, SEEK_SET);
    }
    size_t Size() { return GetFileSize(m_file, nullptr); }
    void MapOnce() {
        const HANDLE mapping = CreateFileMapping(m_file, nullptr, MAP_SHARED, 0, 0, nullptr);
        void* view = MapViewOfFile(mapping, PROT_READ, 0, 0, 0);
        benchmark::DoNotOptimize(view);
        UnmapViewOfFileEx(view, kFileBytes);
        CloseHandle(mapping);
    }

  private:
    HANDLE m_file;
};

class SystemFile {
  public:
    SystemFile() : m_fd(open(g_path, O_RDWR)) {}
    ~SystemFile() { close(m_fd); }
    size_t Read(size_t n) {
        const ssize_t bytes = read(m_fd, g_buffer.data(), n);
        return bytes > 0 ? static_cast<size_t>(bytes) : 0;
    }
    void Write(size_t n) { benchmark::DoNotOptimize(write(m_fd, g_buffer.data(), n)); }
    void Seek(size_t position) { lseek(m_fd, static_cast<off_t>(position), SEEK_SET); }
    size_t Size() {
        struct stat status;
        return fstat(m_fd, &status) == 0 ? static_cast<size_t>(status.st_size) : 0;
    }
    // With the descriptor of its own and the look at the size that a mapping is made of.
    void MapOnce() {
        const size_t size = Size();
        const int fd = dup(m_fd);
        void* view = mmap(nullptr, size, PROT_READ, MAP_SHARED, fd, 0);
        benchmark::DoNotOptimize(view);
        munmap(view, size);
        close(fd);
    }

  private:
    int m_fd;
};

class StdioFile {
  public:
    StdioFile() : m_file(std::fopen(g_path, "r+")) {}
    ~StdioFile() { std::fclose(m_file); }
    size_t Read(size_t n) { return std::fread(g_buffer.data(), 1, n, m_file); }
    void Write(size_t n) { benchmark::DoNotOptimize(std::fwrite(g_buffer.data(), 1, n, m_file)); }
    void Seek(size_t position) { std::fseek(m_file, static_cast<long>(position), SEEK_SET); }

  private:
    std::FILE* m_file;
};

template <typename File>
void OpenAndClose(int times) {
    for (int i = 0; i < times; ++i)
        File file;
}

template <typename File, size_t kBytes>
void ReadThrough(int times) {
    File file;
    for (int i = 0; i < times; ++i) {
        if (file.Read(kBytes) < kBytes) file.Seek(0);
    }
}

template <typename File>
void SeekAndRead(int times) {
    File file;
    for (int i = 0; i < times; ++i) {
        file.Seek(static_cast<size_t>(i) * 7919 % (kFileBytes - kRecord));
        benchmark::DoNotOptimize(file.Read(kRecord));
    }
}

template <typename File>
void WriteThrough(int times) {
    File file;
    for (int i = 0; i < times; ++i) {
        if (i % 1000 == 0) file.Seek(0);
        file.Write(kRecord);
    }
}

template <typename File>
void AskSize(int times) {
    File file;
    for (int i = 0; i < times; ++i)
        benchmark::DoNotOptimize(file.Size());
}

template <typename File>
void Map(int times) {
    File file;
    for (int i = 0; i < times; ++i)
        file.MapOnce();
}

void PassThroughLayerPipe(int times) {
    HANDLE read = nullptr, write = nullptr;
    CreatePipe(&read, &write, nullptr, 0);
    for (int i = 0; i < times; ++i) {
        DWORD bytes = 0;
        WriteFile(write, g_buffer.data(), kRecord, &bytes, nullptr);
        ReadFile(read, g_buffer.data(), kRecord, &bytes, nullptr);
    }
    CloseHandle(read);
    CloseHandle(write);
}

void PassThroughPipe(int times) {
    int ends[2];
    if (pipe(ends) != 0) std::abort();
    for (int i = 0; i < times; ++i) {
        benchmark::DoNotOptimize(write(ends[1], g_buffer.data(), kRecord));
        benchmark::DoNotOptimize(read(ends[0], g_buffer.data(), kRecord));
    }
    close(ends[0]);
    close(ends[1]);
}

// This program is linked with the layer's library ahead of the C library, so these are ours.

const char kNumbers[] = "1234567";

void ReadWideNumber(int times) {
    const auto* text = static_cast<const wchar_t*>(static_cast<const void*>(kNumbers));
    for (int i = 0; i < times; ++i)
        benchmark::DoNotOptimize(wcstol(text, nullptr, 10));
}

void ReadNumber(int times) {
    for (int i = 0; i < times; ++i)
        benchmark::DoNotOptimize(std::strtol(kNumbers, nullptr, 10));
}

char g_text[kRecord];

void CopyWideText(int times) {
    const auto* text = static_cast<const wchar_t*>(static_cast<const void*>(g_buffer.data()));
    for (int i = 0; i < times; ++i)
        benchmark::DoNotOptimize(wcstombs(g_text, text, sizeof g_text));
}

void CopyText(int times) {
    for (int i = 0; i < times; ++i)
        benchmark::DoNotOptimize(memccpy(g_text, g_buffer.data(), '\0', sizeof g_text));
}

template <typename Other>
void AddTransfersBeside(const std::string& other) {
    Add("open + close" + other, OpenAndClose<LayerFile>, OpenAndClose<Other>, kCalls);
    Add("read on, 64 bytes" + other, ReadThrough<LayerFile, kRecord>, ReadThrough<Other, kRecord>,
        kCalls);
    Add("read on, 64 KiB" + other, ReadThrough<LayerFile, kPiece>, ReadThrough<Other, kPiece>,
        kCalls);
    Add("move + read 64 bytes" + other, SeekAndRead<LayerFile>, SeekAndRead<Other>, kCalls);
    Add("write on, 64 bytes" + other, WriteThrough<LayerFile>, WriteThrough<Other>, kCalls);
}

}  // namespace

int main(int argc, char** argv) {
    const BenchFile file;
    AddTransfersBeside<SystemFile>(", beside system calls");
    AddTransfersBeside<StdioFile>(", beside stdio");
    Add("size", AskSize<LayerFile>, AskSize<SystemFile>, kCalls);
    Add("map 4 MiB + unmap", Map<LayerFile>, Map<SystemFile>, kCalls);
    Add("pipe: write + read 64 bytes", PassThroughLayerPipe, PassThroughPipe, kCalls);
    Add("wcstol, beside strtol", ReadWideNumber, ReadNumber, kInPlace);
    Add("wcstombs of 64 bytes, beside memccpy", CopyWideText, CopyText, kInPlace);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
