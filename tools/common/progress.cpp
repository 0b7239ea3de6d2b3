#include "common/progress.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <string>

namespace vidshow::tools {

namespace {

constexpr std::chrono::milliseconds kMoment(300);
constexpr std::chrono::milliseconds kBetweenDraws(100);
constexpr uint64_t kCells = 40;
const char kEraseLine[] = "\r\033[K";

}  // namespace

Progress::Progress(bool wanted, uint64_t total)
    : m_on(wanted && isatty(STDERR_FILENO) != 0),
      m_total(total),
      m_nextDraw(Clock::now() + kMoment) {}

Progress::~Progress() {
    if (m_drawn) std::fputs(kEraseLine, stderr);
}

void Progress::update(uint64_t done) {
    if (!m_on || Clock::now() < m_nextDraw) return;
    m_nextDraw = Clock::now() + kBetweenDraws;
    draw(done);
}

void Progress::draw(uint64_t done) {
    m_drawn = true;
    if (m_total == 0) {
        std::fprintf(stderr, "%s%llu frames", kEraseLine, static_cast<unsigned long long>(done));
        return;
    }
    const uint64_t reached = std::min(done, m_total);
    const size_t cells = static_cast<size_t>(kCells * reached / m_total);
    const std::string bar = std::string(cells, '#') + std::string(kCells - cells, '.');
    std::fprintf(stderr, "%s[%s] %3llu %%  %llu of %llu frames", kEraseLine, bar.c_str(),
                 static_cast<unsigned long long>(100 * reached / m_total),
                 static_cast<unsigned long long>(done), static_cast<unsigned long long>(m_total));
}

}  // namespace vidshow::tools
