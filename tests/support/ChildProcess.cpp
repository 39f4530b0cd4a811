#include "ChildProcess.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <stdexcept>
#include <thread>
#include <utility>

extern char** environ;

namespace pyx::test {

namespace {

std::vector<char*> pointers(std::vector<std::string>& strings) {
    std::vector<char*> out;
    for (auto& s : strings) out.push_back(s.data());
    out.push_back(nullptr);
    return out;
}

int statusCode(int status) {
    if (WIFEXITED(status)) return WEXITSTATUS(status);
    if (WIFSIGNALED(status)) return 128 + WTERMSIG(status);
    return -1;
}

}  // namespace

ChildProcess::ChildProcess(Options options) {
    std::vector<std::string> args = options.argv;
    std::vector<std::string> env;
    for (char** e = environ; *e != nullptr; ++e) {
        const std::string entry(*e);
        const std::string key = entry.substr(0, entry.find('='));
        if (!options.env.contains(key)) env.push_back(entry);
    }
    for (const auto& [key, value] : options.env) env.push_back(key + "=" + value);
    std::vector<char*> argv = pointers(args);
    std::vector<char*> envp = pointers(env);

    int outPipe[2] = {-1, -1};
    int errPipe[2] = {-1, -1};
    if (options.captureStdout && ::pipe2(outPipe, O_CLOEXEC) != 0)
        throw std::runtime_error("pipe failed");
    if (options.captureStderr && ::pipe2(errPipe, O_CLOEXEC) != 0)
        throw std::runtime_error("pipe failed");
    const int inFd = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    const int outFd =
        options.captureStdout
            ? outPipe[1]
            : ::open(options.stdoutFile.empty() ? "/dev/null" : options.stdoutFile.c_str(),
                     O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    const int errFd =
        options.captureStderr
            ? errPipe[1]
            : (options.stderrFile.empty() ? -1
                                          : ::open(options.stderrFile.c_str(),
                                                   O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644));
    const char* workDir = options.workDir.empty() ? nullptr : options.workDir.c_str();
    const pid_t parent = ::getpid();
    pid_ = ::fork();
    if (pid_ < 0) throw std::runtime_error("fork failed");
    if (pid_ == 0) {
        // Only async-signal-safe calls from here on.
        ::prctl(PR_SET_PDEATHSIG, SIGKILL);
        if (::getppid() != parent) ::_exit(127);
        ::setpgid(0, 0);
        if (workDir != nullptr && ::chdir(workDir) != 0) ::_exit(127);
        if (inFd >= 0) ::dup2(inFd, 0);
        if (outFd >= 0) ::dup2(outFd, 1);
        if (errFd >= 0) ::dup2(errFd, 2);
        ::execvpe(argv[0], argv.data(), envp.data());
        ::_exit(127);
    }
    if (inFd >= 0) ::close(inFd);
    if (outFd >= 0) ::close(outFd);
    if (errFd >= 0) ::close(errFd);
    stdout_ = outPipe[0];
    stderr_ = errPipe[0];
}

ChildProcess::~ChildProcess() {
    terminate(std::chrono::seconds(5));
    // What the child started (the programs of a shell pipeline) is in its process group: none
    // of it outlives the test.
    if (pid_ > 0) ::kill(-pid_, SIGKILL);
    if (stdout_ >= 0) ::close(stdout_);
    if (stderr_ >= 0) ::close(stderr_);
}

int ChildProcess::takeStdout() {
    return std::exchange(stdout_, -1);
}

int ChildProcess::takeStderr() {
    return std::exchange(stderr_, -1);
}

std::optional<std::string> ChildProcess::readLine(std::chrono::milliseconds timeout) {
    const auto until = std::chrono::steady_clock::now() + timeout;
    while (true) {
        const auto newline = buffered_.find('\n');
        if (newline != std::string::npos) {
            std::string line = buffered_.substr(0, newline);
            buffered_.erase(0, newline + 1);
            return line;
        }
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
            until - std::chrono::steady_clock::now());
        if (stdout_ < 0 || left.count() <= 0) return std::nullopt;
        pollfd fd{stdout_, POLLIN, 0};
        if (::poll(&fd, 1, static_cast<int>(left.count())) <= 0) continue;
        char chunk[512];
        const ssize_t n = ::read(stdout_, chunk, sizeof chunk);
        if (n <= 0) return std::nullopt;
        buffered_.append(chunk, static_cast<std::size_t>(n));
    }
}

bool ChildProcess::running() {
    if (status_ || pid_ <= 0) return false;
    int status = 0;
    if (::waitpid(pid_, &status, WNOHANG) == pid_) {
        status_ = statusCode(status);
        return false;
    }
    return true;
}

int ChildProcess::wait(std::chrono::milliseconds timeout) {
    const auto until = std::chrono::steady_clock::now() + timeout;
    while (running() && std::chrono::steady_clock::now() < until)
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    return terminate();
}

int ChildProcess::terminate(std::chrono::milliseconds timeout) {
    if (status_) return *status_;
    if (pid_ <= 0) return -1;
    ::kill(pid_, SIGTERM);
    const auto until = std::chrono::steady_clock::now() + timeout;
    while (running()) {
        if (std::chrono::steady_clock::now() > until) {
            ::kill(-pid_, SIGKILL);
            int status = 0;
            ::waitpid(pid_, &status, 0);
            status_ = statusCode(status);
            break;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return *status_;
}

}  // namespace pyx::test
