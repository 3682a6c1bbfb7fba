#include "shmpeerprocess.h"

#include <gtest/gtest.h>

#include <sstream>

#ifdef _WIN32
#include <windows.h>
#else
#include <QCoreApplication>
#include <QProcess>
#endif

#ifdef _WIN32

namespace {

std::string peerProgram() {
    char path[MAX_PATH] = {};
    const DWORD length = GetModuleFileNameA(nullptr, path, MAX_PATH);
    std::string self(path, length);
    return self.substr(0, self.find_last_of("\\/") + 1) + "shm_peer.exe";
}

} // namespace

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

ShmPeerProcess::ShmPeerProcess() : m_process(new QProcess) {
    m_process->setProcessChannelMode(QProcess::ForwardedErrorChannel);
    m_process->start(QCoreApplication::applicationDirPath() + QStringLiteral("/shm_peer"), {});
    m_running = m_process->waitForStarted(5000);
}

bool ShmPeerProcess::writeLine(const std::string &line) {
    m_process->write((line + "\n").c_str());
    return m_process->waitForBytesWritten(5000);
}

long ShmPeerProcess::readChunk(char *chunk, int size, int timeoutMs) {
    if (m_process->bytesAvailable() == 0 && !m_process->waitForReadyRead(timeoutMs))
        return -1;
    return long(m_process->read(chunk, size));
}

void ShmPeerProcess::kill() {
    if (!m_running)
        return;
    m_process->kill();
    m_process->waitForFinished(5000);
    m_running = false;
}

void ShmPeerProcess::quit() {
    if (!m_running)
        return;
    writeLine("quit");
    m_process->waitForFinished(5000);
    kill();
}

#endif

ShmPeerProcess::~ShmPeerProcess() {
    kill();
#ifndef _WIN32
    delete m_process;
#endif
}

void ShmPeerProcess::send(const std::string &command) {
    if (m_running)
        writeLine(command);
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

std::vector<long long> ShmPeerProcess::answer(const std::string &command, int timeoutMs) {
    std::vector<long long> fields;
    std::string line;
    if (!m_running)
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
