#include "ZrdictRunner.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <spawn.h>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace {

struct Pipe {
    int fds[2] = {-1, -1};

    Pipe() {
        if (pipe2(fds, O_CLOEXEC) != 0)
            throw std::runtime_error(std::string("pipe: ") + std::strerror(errno));
    }

    ~Pipe() {
        closeEnd(0);
        closeEnd(1);
    }

    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    void closeEnd(int end) {
        if (fds[end] >= 0)
            close(fds[end]);
        fds[end] = -1;
    }
};

// Drains both pipes together, so a child that fills one while we wait on the
// other cannot stall.
void collect(Pipe& outPipe, Pipe& errPipe, std::string& out, std::string& err) {
    pollfd polled[2] = {{outPipe.fds[0], POLLIN, 0}, {errPipe.fds[0], POLLIN, 0}};
    std::string* sinks[2] = {&out, &err};
    int open = 2;
    char buffer[65536];
    while (open > 0) {
        if (poll(polled, 2, -1) < 0) {
            if (errno == EINTR)
                continue;
            throw std::runtime_error(std::string("poll: ") + std::strerror(errno));
        }
        for (int i = 0; i < 2; ++i) {
            if (polled[i].fd < 0 || polled[i].revents == 0)
                continue;
            ssize_t n = read(polled[i].fd, buffer, sizeof buffer);
            if (n > 0) {
                sinks[i]->append(buffer, static_cast<size_t>(n));
            } else if (n == 0 || errno != EINTR) {
                polled[i].fd = -1;
                --open;
            }
        }
    }
}

} // namespace

RunResult runZrdict(const std::vector<std::string>& args, const std::string& workDir,
                    const std::string& program) {
    std::vector<std::string> argvStrings{program.empty() ? std::string(ZRDICT_PATH) : program};
    argvStrings.insert(argvStrings.end(), args.begin(), args.end());
    std::vector<char*> argv;
    for (std::string& arg : argvStrings)
        argv.push_back(arg.data());
    argv.push_back(nullptr);

    Pipe outPipe;
    Pipe errPipe;
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 0, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_adddup2(&actions, outPipe.fds[1], 1);
    posix_spawn_file_actions_adddup2(&actions, errPipe.fds[1], 2);
    if (!workDir.empty())
        posix_spawn_file_actions_addchdir_np(&actions, workDir.c_str());

    pid_t pid = 0;
    int rc = posix_spawn(&pid, argv[0], &actions, nullptr, argv.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    if (rc != 0)
        throw std::runtime_error(std::string("cannot run ") + argv[0] + ": " + std::strerror(rc));
    outPipe.closeEnd(1);
    errPipe.closeEnd(1);

    RunResult result;
    collect(outPipe, errPipe, result.out, result.err);
    int status = 0;
    while (waitpid(pid, &status, 0) < 0 && errno == EINTR) {
    }
    if (WIFEXITED(status))
        result.exitStatus = WEXITSTATUS(status);
    else if (WIFSIGNALED(status))
        result.exitStatus = 128 + WTERMSIG(status);
    return result;
}

Json RunResult::json() const {
    try {
        return Json::parse(out);
    } catch (const Json::parse_error& e) {
        ADD_FAILURE() << "stdout is not one JSON document (" << e.what() << ")\nstdout:\n"
                      << out << "\nstderr:\n"
                      << err;
        return Json();
    }
}

std::string dataDir() { return ZR_TEST_DATA_DIR; }

std::string examplesDir() { return ZR_EXAMPLES_DIR; }

std::string pluginPath() { return ZRBXMLS_PATH; }

std::string utilLibraryPath() { return ZRUTIL_PATH; }
