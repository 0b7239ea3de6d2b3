#include "playkit/process.h"

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace playkit {

namespace {

std::vector<std::string> merged(const Environment& changes) {
    std::vector<std::string> result;
    for (char** entry = environ; *entry != nullptr; ++entry) {
        const std::string text = *entry;
        const std::string name = text.substr(0, text.find('='));
        const bool changed = std::any_of(changes.begin(), changes.end(),
                                         [&name](const auto& c) { return c.first == name; });
        if (!changed) result.push_back(text);
    }
    for (const auto& [name, value] : changes) {
        if (!value.empty()) result.push_back(name + "=" + value);
    }
    return result;
}

std::vector<std::string> joined(const char* program, const std::vector<std::string>& arguments) {
    std::vector<std::string> command = {program};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return command;
}

std::vector<char*> pointers(std::vector<std::string>* texts) {
    std::vector<char*> result;
    for (std::string& text : *texts)
        result.push_back(text.data());
    result.push_back(nullptr);
    return result;
}

}  // namespace

TempFolder::TempFolder() {
    m_path = (std::filesystem::temp_directory_path() / "vidshow-test-XXXXXX").string();
    if (mkdtemp(m_path.data()) == nullptr) throw std::runtime_error(std::strerror(errno));
}

TempFolder::~TempFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(m_path, ignored);
}

Process::Process(const std::vector<std::string>& command, const Environment& environment) {
    std::vector<std::string> arguments = command;
    std::vector<std::string> variables = merged(environment);
    posix_spawn_file_actions_t files;
    posix_spawn_file_actions_init(&files);
    constexpr int kWrite = O_WRONLY | O_CREAT | O_TRUNC;
    posix_spawn_file_actions_addopen(&files, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&files, STDOUT_FILENO, m_folder.path("out").c_str(), kWrite,
                                     0600);
    posix_spawn_file_actions_addopen(&files, STDERR_FILENO, m_folder.path("err").c_str(), kWrite,
                                     0600);
    const int error = posix_spawnp(&m_pid, command[0].c_str(), &files, nullptr,
                                   pointers(&arguments).data(), pointers(&variables).data());
    posix_spawn_file_actions_destroy(&files);
    if (error != 0) throw std::runtime_error(command[0] + ": " + std::strerror(error));
}

Process::~Process() {
    if (!running()) return;
    kill(m_pid, SIGTERM);
    wait();
}

bool Process::running() {
    if (!m_ended) m_ended = waitpid(m_pid, &m_waitStatus, WNOHANG) == m_pid;
    return !m_ended;
}

std::string Process::printed() const {
    return readFile(m_folder.path("out"));
}

Outcome Process::wait() {
    while (!m_ended)
        m_ended = waitpid(m_pid, &m_waitStatus, 0) == m_pid;
    return {WIFEXITED(m_waitStatus) ? WEXITSTATUS(m_waitStatus) : -1,
            readFile(m_folder.path("out")), readFile(m_folder.path("err"))};
}

Outcome run(const std::vector<std::string>& command, const Environment& environment) {
    return Process(command, environment).wait();
}

Outcome play(const std::vector<std::string>& arguments) {
    return run(joined(VIDSHOW_PLAY, arguments), withoutDisplay());
}

Outcome convert(const std::vector<std::string>& arguments) {
    return run(joined(VIDSHOW_CONVERT, arguments));
}

Outcome compare(const std::vector<std::string>& arguments) {
    return run(joined(VIDSHOW_COMPARE, arguments));
}

Environment withoutDisplay() {
    return {{"DISPLAY", ""}, {"WAYLAND_DISPLAY", ""}};
}

std::vector<std::string> listFolder(const std::string& path) {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(path)) {
        names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::string readFile(const std::string& path) {
    std::ostringstream contents;
    contents << std::ifstream(path, std::ios::binary).rdbuf();
    return contents.str();
}

void writeFile(const std::string& path, const std::string& contents) {
    std::ofstream(path, std::ios::binary) << contents;
}

}  // namespace playkit
