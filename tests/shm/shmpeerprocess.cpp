#include "shmpeerprocess.h"

#include <gtest/gtest.h>

#include <sstream>

#ifdef _WIN32
#include <windows.h>
#else
#include <cerrno>
#include <climits>
#include <csignal>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>
extern char **environ;
#endif

namespace {

#ifdef _WIN32
std::string peerProgram() {
    char path[MAX_PATH] = {};
    const DWORD length = GetModuleFileNameA(nullptr, path, MAX_PATH);
    std::string self(path, length);
    return self.substr(0, self.find_last_of("\\/") + 1) + "shm_peer.exe";
}
#else
std::string peerProgram() {
    char path[PATH_MAX] = {};
    const ssize_t length = readlink("/proc/self/exe", path, sizeof path - 1);
    std::string self(path, length > 0 ? static_cast<size_t>(length) : 0);
    return self.substr(0, self.find_last_of('/') + 1) + "shm_peer";
}
#endif

} // namespace

#ifdef _WIN32

ShmPeerProcess::ShmPeerProcess() {
    SECURITY_ATTRIBUTES inherit = {static_cast<DWORD>(sizeof(SECURITY_ATTRIBUTES)), nullptr, TRUE};
    HANDLE childIn = nullptr;
    HANDLE childOut = nullptr;
    HANDLE toPeer = nullptr;
    HANDLE fromPeer = nullptr;
    if (!CreatePipe(&childIn, &toPeer, &inherit, 0) ||
        !CreatePipe(&fromPeer, &childOut, &inherit, 0))
        return;
    SetHandleInformation(toPeer, HANDLE_FLAG_INHERIT, 0);
    SetHandleInformation(fromPeer, HANDLE_FLAG_INHERIT, 0);
    STARTUPINFOA startup = {};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput = childIn;
    startup.hStdOutput = childOut;
    startup.hStdError = GetStdHandle(STD_ERROR_HANDLE);
    PROCESS_INFORMATION info = {};
    std::string commandLine = "\"" + peerProgram() + "\"";
    const BOOL started = CreateProcessA(nullptr, commandLine.data(), nullptr, nullptr, TRUE, 0,
                                        nullptr, nullptr, &startup, &info);
    CloseHandle(childIn);
    CloseHandle(childOut);
    if (!started) {
        CloseHandle(toPeer);
        CloseHandle(fromPeer);
        return;
    }
    CloseHandle(info.hThread);
    m_process = info.hProcess;
    m_toPeer = toPeer;
    m_fromPeer = fromPeer;
    m_running = true;
}

bool ShmPeerProcess::writeLine(const std::string &line) {
    const std::string text = line + "\n";
    DWORD written = 0;
    return WriteFile(m_toPeer, text.data(), static_cast<DWORD>(text.size()), &written, nullptr) &&
           written == text.size();
}

long ShmPeerProcess::readChunk(char *chunk, int size, int) {
    DWORD got = 0;
    return ReadFile(m_fromPeer, chunk, static_cast<DWORD>(size), &got, nullptr) ? long(got) : -1;
}

void ShmPeerProcess::kill() {
    if (!m_running)
        return;
    TerminateProcess(m_process, 9);
    WaitForSingleObject(m_process, INFINITE);
    CloseHandle(m_process);
    CloseHandle(m_toPeer);
    CloseHandle(m_fromPeer);
    m_running = false;
}

void ShmPeerProcess::quit() {
    if (!m_running)
        return;
    writeLine("quit");
    WaitForSingleObject(m_process, 20000);
    kill();
}

#else

ShmPeerProcess::ShmPeerProcess() {
    int toPeer[2];
    int fromPeer[2];
    if (pipe2(toPeer, O_CLOEXEC) != 0)
        return;
    if (pipe2(fromPeer, O_CLOEXEC) != 0) {
        close(toPeer[0]);
        close(toPeer[1]);
        return;
    }
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, toPeer[0], STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, fromPeer[1], STDOUT_FILENO);
    const std::string program = peerProgram();
    char *argv[] = {const_cast<char *>(program.c_str()), nullptr};
    pid_t pid = -1;
    const int error = posix_spawn(&pid, program.c_str(), &actions, nullptr, argv, environ);
    posix_spawn_file_actions_destroy(&actions);
    close(toPeer[0]);
    close(fromPeer[1]);
    if (error != 0) {
        close(toPeer[1]);
        close(fromPeer[0]);
        return;
    }
    m_pid = pid;
    m_toPeer = toPeer[1];
    m_fromPeer = fromPeer[0];
    m_running = true;
}

bool ShmPeerProcess::writeLine(const std::string &line) {
    const std::string text = line + "\n"; // shorter than a pipe's atomic write: whole or not at all
    return write(m_toPeer, text.data(), text.size()) == static_cast<ssize_t>(text.size());
}

long ShmPeerProcess::readChunk(char *chunk, int size, int timeoutMs) {
    pollfd ready = {m_fromPeer, POLLIN, 0};
    int polled = 0;
    do
        polled = poll(&ready, 1, timeoutMs);
    while (polled < 0 && errno == EINTR);
    return polled > 0 ? long(read(m_fromPeer, chunk, static_cast<size_t>(size))) : -1;
}

void ShmPeerProcess::kill() {
    if (!m_running)
        return;
    ::kill(m_pid, SIGKILL);
    int status = 0;
    waitpid(m_pid, &status, 0);
    close(m_toPeer);
    close(m_fromPeer);
    m_running = false;
}

void ShmPeerProcess::quit() {
    if (!m_running)
        return;
    writeLine("quit");
    std::string rest;
    readLine(&rest, 5000); // returns at end of file, when the peer has exited
    kill();
}

#endif

ShmPeerProcess::~ShmPeerProcess() {
    kill();
}

bool ShmPeerProcess::readLine(std::string *line, int timeoutMs) {
    for (;;) {
        const auto end = m_buffer.find('\n');
        if (end != std::string::npos) {
            *line = m_buffer.substr(0, end);
            m_buffer.erase(0, end + 1);
            return true;
        }
        char chunk[256];
        const long got = readChunk(chunk, sizeof chunk, timeoutMs);
        if (got <= 0)
            return false;
        m_buffer.append(chunk, static_cast<size_t>(got));
    }
}

std::vector<long long> ShmPeerProcess::call(const std::string &command, int timeoutMs) {
    std::vector<long long> fields;
    std::string line;
    if (!m_running || !writeLine(command))
        return fields;
    if (!readLine(&line, timeoutMs)) {
        ADD_FAILURE() << "the peer process gave no answer to \"" << command << "\" within "
                      << timeoutMs << " ms: it is stuck";
        return fields;
    }
    std::istringstream in(line);
    long long value = 0;
    while (in >> value)
        fields.push_back(value);
    return fields;
}
