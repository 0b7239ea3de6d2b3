// File calls on one file, whole and confined to a region, compared with the bytes and positions
// that a plain model keeps.

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "fuzz/bytes.h"
#include "vidshow/platform/file.h"

namespace {

using fuzz::Bytes;
using fuzz::Require;

constexpr DWORD kFailed = 0xFFFFFFFF;

/// The process's one scratch file, gone at its end.
const std::string& Path() {
    static const struct Scratch {
        Scratch() {
            char name[] = "/tmp/vidshow-fuzz-XXXXXX";
            const int fd = mkstemp(name);
            Require(fd >= 0, "there is room for a scratch file");
            close(fd);
            path = name;
        }
        ~Scratch() { unlink(path.c_str()); }
        std::string path;
    } scratch;
    return scratch.path;
}

class Session {
  public:
    explicit Session(Bytes& bytes)
        : m_bytes(bytes),
          m_file(CreateFile(Path().c_str(), O_RDWR | O_TRUNC, 0, nullptr, O_CREAT, 0600)) {
        Require(m_file != INVALID_HANDLE_VALUE, "the scratch file opens");
    }
    ~Session() { Require(CloseHandle(m_file) == 1, "a file closes"); }
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    void Step() {
        switch (m_bytes.Below(8)) {
            case 0:
            case 1:
                return Write();
            case 2:
            case 3:
                return Read();
            case 4:
            case 5:
                return Seek();
            case 6:
                return View();
            default:
                return Region();
        }
    }

    void Check() {
        DWORD high = 1;
        Require(GetFileSize(m_file, &high) == m_contents.size() && high == 0,
                "the file is as long as what was written");
    }

  private:
    void Write() {
        std::vector<uint8_t> block(m_bytes.Below(200));
        fuzz::Samples(m_bytes.Word()).Fill(block.data(), block.size());
        DWORD written = 0;
        const DWORD asked = static_cast<DWORD>(block.size());
        Require(WriteFile(m_file, block.data(), asked, &written, nullptr) == 1 && written == asked,
                "a block is written whole");
        if (block.empty()) return;
        m_contents.resize(std::max(m_contents.size(), m_position + block.size()));
        std::copy(block.begin(), block.end(),
                  m_contents.begin() + static_cast<ptrdiff_t>(m_position));
        m_position += block.size();
    }

    void Read() {
        std::vector<uint8_t> block(m_bytes.Below(300));
        DWORD got = 0;
        const DWORD asked = static_cast<DWORD>(block.size());
        Require(ReadFile(m_file, block.data(), asked, &got, nullptr) == 1, "reading succeeds");
        const size_t left = m_contents.size() - std::min(m_position, m_contents.size());
        Require(got == std::min(block.size(), left), "as much as there is");
        Require(got == 0 || std::memcmp(block.data(), &m_contents[m_position], got) == 0,
                "what was written reads back");
        m_position += got;
    }

    void Seek() {
        const uint32_t origin = m_bytes.Below(8) == 0 ? 9 : m_bytes.Below(3);
        const int32_t offset = static_cast<int32_t>(m_bytes.Below(3000)) - 1000;
        LONG low = offset, high = offset < 0 ? -1 : 0;
        const DWORD result = SetFilePointer(m_file, low, m_bytes.Bit() ? &high : nullptr, origin);
        const size_t from[] = {0, m_position, m_contents.size()};
        const int64_t target =
            origin < 3 ? static_cast<int64_t>(from[origin]) + offset : int64_t{-1};
        Require(result == (target < 0 ? kFailed : static_cast<DWORD>(target)),
                "the position moves, or stays where there is none");
        if (target >= 0) m_position = static_cast<size_t>(target);
    }

    void View() {
        if (m_contents.empty()) return;
        const HANDLE mapping = CreateFileMapping(m_file, nullptr, MAP_SHARED, 0, 0, nullptr);
        Require(mapping != INVALID_HANDLE_VALUE, "a file can be mapped");
        void* const view = MapViewOfFile(mapping, PROT_READ, 0, 0, 0);
        Require(view != nullptr, "and seen");
        Require(std::memcmp(view, m_contents.data(), m_contents.size()) == 0, "as it was written");
        CloseHandle(mapping);
        Require(UnmapViewOfFileEx(view, static_cast<DWORD>(m_contents.size())) == 1, "a view ends");
    }

    void Region() {
        const size_t start = m_bytes.Below(600), length = m_bytes.Below(600);
        CLinuxFile file;
        Require(file.Init(Path().c_str(), O_RDONLY, 0) == 0, "the file opens once more");
        Require(file.SetRegion(static_cast<int64_t>(start), static_cast<int64_t>(length)) == 0,
                "a region may reach behind the end");
        Require(file.GetSize() == static_cast<int64_t>(length), "it has the size that was asked");
        std::vector<uint8_t> block(m_bytes.Below(700) + 1);
        const size_t skip = m_bytes.Below(600);
        const DWORD moved = file.SetFilePointer(static_cast<LONG>(skip), nullptr, 0);
        Require(moved == (skip <= length ? skip : kFailed), "positions lie in the region");
        const size_t at = skip <= length ? skip : 0;
        const int got = file.Read(block.data(), static_cast<int>(block.size()));
        const size_t end = std::min(start + length, m_contents.size());
        const size_t left = end - std::min(start + at, end);
        Require(got == static_cast<int>(std::min(block.size(), left)), "no byte past the region");
        Require(got == 0 || std::memcmp(block.data(), &m_contents[start + at],
                                        static_cast<size_t>(got)) == 0,
                "the region's bytes are the file's");
    }

    Bytes& m_bytes;
    const HANDLE m_file;
    std::vector<uint8_t> m_contents;
    size_t m_position = 0;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Bytes bytes(data, size);
    Session session(bytes);
    while (!bytes.empty()) {
        session.Step();
        session.Check();
    }
    return 0;
}
