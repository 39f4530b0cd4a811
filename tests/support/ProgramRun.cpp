#include "tests/support/ProgramRun.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>

#include <gtest/gtest.h>

namespace pyx::test {
namespace {

std::string readFile(const std::filesystem::path& path) {
    std::ifstream in(path);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

}  // namespace

ProgramRun ProgramRun::of(const std::vector<std::string>& args, const std::string& input) {
    // Files rather than pipes: nothing to drain while the program runs. Each run has its own.
    static int runs = 0;
    const std::filesystem::path stem = ::testing::TempDir() + "pyxon_run_" +
                                       std::to_string(::getpid()) + "_" + std::to_string(++runs);
    const auto inPath = stem.string() + ".in";
    const auto outPath = stem.string() + ".out";
    const auto errPath = stem.string() + ".err";
    std::ofstream(inPath) << input;

    ProgramRun run;
    const pid_t pid = ::fork();
    if (pid == 0) {
        const int in = ::open(inPath.c_str(), O_RDONLY);
        const int out = ::open(outPath.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        const int err = ::open(errPath.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        if (in < 0 || out < 0 || err < 0) ::_exit(127);
        ::dup2(in, STDIN_FILENO);
        ::dup2(out, STDOUT_FILENO);
        ::dup2(err, STDERR_FILENO);
        std::vector<char*> argv;
        argv.reserve(args.size() + 1);
        for (const auto& a : args) argv.push_back(const_cast<char*>(a.c_str()));
        argv.push_back(nullptr);
        ::execvp(argv[0], argv.data());
        ::_exit(127);
    }
    if (pid > 0) {
        int status = 0;
        if (::waitpid(pid, &status, 0) == pid && WIFEXITED(status))
            run.exitCode = WEXITSTATUS(status);
        run.out = readFile(outPath);
        run.err = readFile(errPath);
    }
    std::error_code ec;
    for (const auto& path : {inPath, outPath, errPath}) std::filesystem::remove(path, ec);
    return run;
}

ProgramRun ProgramRun::shell(const std::string& commandLine, const std::string& input) {
    return of({"/bin/sh", "-c", commandLine}, input);
}

}  // namespace pyx::test
