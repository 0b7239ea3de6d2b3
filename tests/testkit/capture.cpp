#include "testkit/capture.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>

namespace testkit {

StdoutCapture::StdoutCapture() {
    std::fflush(stdout);
    m_saved = dup(STDOUT_FILENO);
    char name[] = "/tmp/vidshow-stdout-XXXXXX";
    m_file = mkstemp(name);
    if (m_saved < 0 || m_file < 0) {
        std::perror("StdoutCapture");
        std::abort();
    }
    unlink(name);
    dup2(m_file, STDOUT_FILENO);
}

StdoutCapture::~StdoutCapture() {
    Restore();
    close(m_file);
}

std::string StdoutCapture::text() {
    Restore();
    std::string result;
    char block[4096];
    off_t at = 0;
    for (ssize_t n; (n = pread(m_file, block, sizeof block, at)) > 0; at += n) {
        result.append(block, static_cast<size_t>(n));
    }
    return result;
}

void StdoutCapture::Restore() {
    if (m_saved < 0) return;
    std::fflush(stdout);
    dup2(m_saved, STDOUT_FILENO);
    close(m_saved);
    m_saved = -1;
}

}  // namespace testkit
