#include "RunningProgram.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <fstream>
#include <iterator>
#include <sstream>
#include <thread>

namespace pyx::test {

RunningProgram::RunningProgram(const std::vector<std::string>& args,
                               const std::filesystem::path& workDir)
    : outPath_(workDir / ("stdout_" + std::to_string(::getpid()) + ".txt")) {
    pid_ = ::fork();
    if (pid_ == 0) {
        const int out = ::open(outPath_.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        const int null = ::open("/dev/null", O_RDWR);
        if (out < 0 || null < 0 || ::chdir(workDir.c_str()) != 0) ::_exit(127);
        ::dup2(null, STDIN_FILENO);
        ::dup2(out, STDOUT_FILENO);
        ::dup2(null, STDERR_FILENO);
        std::vector<char*> argv;
        argv.reserve(args.size() + 1);
        for (const auto& a : args) argv.push_back(const_cast<char*>(a.c_str()));
        argv.push_back(nullptr);
        ::execv(argv[0], argv.data());
        ::_exit(127);
    }
}

RunningProgram::~RunningProgram() {
    if (pid_ <= 0) return;
    ::kill(pid_, SIGKILL);
    int status = 0;
    ::waitpid(pid_, &status, 0);
}

std::string RunningProgram::output() const {
    std::ifstream in(outPath_);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

bool RunningProgram::waitForLines(const std::vector<std::string>& lines,
                                  std::chrono::seconds limit) const {
    const auto hasAll = [&lines](const std::string& text) {
        for (const auto& wanted : lines) {
            std::istringstream in(text);
            bool found = false;
            for (std::string line; !found && std::getline(in, line);) found = line == wanted;
            if (!found) return false;
        }
        return true;
    };
    const auto deadline = std::chrono::steady_clock::now() + limit;
    while (!hasAll(output())) {
        if (std::chrono::steady_clock::now() > deadline) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
    return true;
}

int RunningProgram::terminate() {
    if (pid_ <= 0) return -1;
    ::kill(pid_, SIGTERM);
    int status = 0;
    const pid_t ended = ::waitpid(pid_, &status, 0);
    pid_ = -1;
    if (ended <= 0 || !WIFEXITED(status)) return -1;
    return WEXITSTATUS(status);
}

}  // namespace pyx::test
