#include "playkit/terminal.h"

#include <pty.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>

namespace playkit {

std::string runOnTerminal(const std::vector<std::string>& command) {
    std::vector<std::string> arguments = command;
    std::vector<char*> pointers;
    for (std::string& argument : arguments)
        pointers.push_back(argument.data());
    pointers.push_back(nullptr);

    int terminal = -1;
    const pid_t child = forkpty(&terminal, nullptr, nullptr, nullptr);
    if (child < 0) throw std::runtime_error(std::strerror(errno));
    if (child == 0) {
        execv(pointers[0], pointers.data());
        _exit(127);
    }
    std::string seen;
    char block[1024];
    for (ssize_t n; (n = read(terminal, block, sizeof block)) > 0;) {
        seen.append(block, static_cast<size_t>(n));
    }
    close(terminal);
    waitpid(child, nullptr, 0);
    return seen;
}

}  // namespace playkit
