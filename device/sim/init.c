// SPDX-License-Identifier: MIT
// The first process of the simulated device: starts one program, reaps every process that lost its
// parent, and exits with the program's status. The rest of the namespace ends with it.
#include <errno.h>
#include <signal.h>
#include <stdio.h>
#include <string.h>
#include <sys/wait.h>
#include <unistd.h>

int main(int argc, char **argv)
{
    int status;
    pid_t ended;
    if (argc < 2) {
        fputs("usage: init PROGRAM [ARGUMENT...]\n", stderr);
        return 2;
    }
    pid_t program = fork();
    if (program == 0) {
        execvp(argv[1], argv + 1);
        fprintf(stderr, "%s: %s\n", argv[1], strerror(errno));
        _exit(127);
    }
    // The program decides what Ctrl+C means.
    signal(SIGINT, SIG_IGN);
    while ((ended = wait(&status)) > 0 || (ended < 0 && errno == EINTR))
        if (ended == program)
            return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    return 127;
}
