// Runs a fuzz target without a fuzzer: the files of its corpus, then made inputs. Input number i
// is the same everywhere and always. A case that ends the program is printed in hexadecimal.
//
// usage: fuzz_TARGET [FILE | DIRECTORY]...
// VIDSHOW_FUZZ_CASES: made inputs; VIDSHOW_FUZZ_SECONDS: after which no new one begins, 0: never

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace {

using Input = std::vector<uint8_t>;

#if defined(__arm__)
constexpr unsigned long kCases = 1000;
#else
constexpr unsigned long kCases = 20000;
#endif
constexpr unsigned long kSeconds = 4;
constexpr size_t kLongest = 256;

const Input* g_running = nullptr;

// Only what a signal handler may call.
void PrintCase(int signal) {
    const char digits[] = "0123456789abcdef";
    char text[2 * kLongest + 1];
    size_t length = 0;
    for (const uint8_t byte : *g_running) {
        if (length + 2 >= sizeof text) break;
        text[length++] = digits[byte >> 4];
        text[length++] = digits[byte & 15];
    }
    text[length++] = '\n';
    const char head[] = "the case (xxd -r -p makes a file of it): ";
    if (write(STDERR_FILENO, head, sizeof head - 1) < 0 || write(STDERR_FILENO, text, length) < 0)
        _exit(1);
    std::signal(signal, SIG_DFL);
    std::raise(signal);
}

void Run(const Input& input) {
    g_running = &input;
    LLVMFuzzerTestOneInput(input.data(), input.size());
}

size_t RunFiles(const std::filesystem::path& path) {
    if (!std::filesystem::is_directory(path)) {
        std::ifstream file(path, std::ios::binary);
        if (!file) {
            std::fprintf(stderr, "%s cannot be read\n", path.c_str());
            std::exit(1);
        }
        Run(Input(std::istreambuf_iterator<char>(file), {}));
        return 1;
    }
    size_t files = 0;
    for (const auto& entry : std::filesystem::directory_iterator(path))
        files += RunFiles(entry.path());
    return files;
}

Input Made(uint32_t number) {
    std::mt19937 random(number);
    Input input(random() % (kLongest + 1));
    for (uint8_t& byte : input)
        byte = static_cast<uint8_t>(random() >> 16);
    return input;
}

unsigned long Setting(const char* name, unsigned long otherwise) {
    const char* const text = std::getenv(name);
    return text != nullptr ? std::strtoul(text, nullptr, 10) : otherwise;
}

// The diagnostics of the library.
void SilenceStdout() {
    const int nowhere = open("/dev/null", O_WRONLY);
    if (nowhere < 0) return;
    dup2(nowhere, STDOUT_FILENO);
    close(nowhere);
}

}  // namespace

int main(int argc, char** argv) {
    using Clock = std::chrono::steady_clock;
    SilenceStdout();
    for (const int signal : {SIGABRT, SIGBUS, SIGFPE, SIGILL, SIGSEGV})
        std::signal(signal, PrintCase);

    size_t files = 0;
    for (int i = 1; i < argc; ++i)
        files += RunFiles(argv[i]);

    const unsigned long cases = Setting("VIDSHOW_FUZZ_CASES", kCases);
    const auto seconds = std::chrono::seconds(Setting("VIDSHOW_FUZZ_SECONDS", kSeconds));
    const Clock::time_point start = Clock::now();
    uint32_t made = 0;
    for (; made < cases; ++made) {
        if (seconds.count() != 0 && Clock::now() - start > seconds) break;
        Run(Made(made));
    }
    std::fprintf(stderr, "%zu files, %lu made inputs\n", files, static_cast<unsigned long>(made));
    return 0;
}
