#pragma once

#include <string>
#include <vector>

#ifndef _WIN32
class QProcess;
#endif

// Runs the test helper program shm_peer (next to the running test program) as a real second
// process and talks to it over pipes: one command line in, one answer out, in order.
class ShmPeerProcess {
public:
    ShmPeerProcess();
    ~ShmPeerProcess(); // kills the peer if it still runs

    ShmPeerProcess(const ShmPeerProcess &) = delete;
    ShmPeerProcess &operator=(const ShmPeerProcess &) = delete;

    bool isRunning() const { return m_running; }

    // Sends `command`; the peer runs it while this process goes on.
    void send(const std::string &command);

    // The answer to the oldest command sent and not yet answered (`command` names it in a
    // failure), its fields as numbers ("<result> <status> ..."); empty, and a test failure,
    // when the peer did not answer within `timeoutMs` (its own waits give up after 3 s, so
    // only a stuck peer takes longer).
    std::vector<long long> answer(const std::string &command, int timeoutMs = 8000);

    // Sends `command` and waits for its answer.
    std::vector<long long> call(const std::string &command) {
        send(command);
        return answer(command);
    }

    // Shorthand: the first field of the answer is 1.
    bool ok(const std::string &command) {
        const std::vector<long long> fields = call(command);
        return !fields.empty() && fields.front() == 1;
    }

    // Kills the peer at once (SIGKILL, TerminateProcess) and reaps it.
    void kill();

    // Asks the peer to quit and waits for it to end.
    void quit();

private:
    bool writeLine(const std::string &line);
    bool readLine(std::string *line, int timeoutMs);
    // Reads what the peer has sent, waiting up to `timeoutMs` (not on Windows); -1 or 0 when
    // nothing came.
    long readChunk(char *chunk, int size, int timeoutMs);

    bool m_running = false;
    std::string m_buffer;
#ifdef _WIN32
    void *m_process = nullptr;
    void *m_toPeer = nullptr;
    void *m_fromPeer = nullptr;
#else
    QProcess *m_process = nullptr;
#endif
};
