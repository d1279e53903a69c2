// SPDX-License-Identifier: MIT
// A plugin of QEMU's user-mode emulation (interface version 1): counts the instructions that a
// program executes, in a file of one number of 64 bits, which may be read at any time.
//
//   qemu-mipsel -plugin count.so,out=FILE PROGRAM
#include <fcntl.h>
#include <stddef.h>
#include <stdint.h>
#include <string.h>
#include <sys/mman.h>
#include <unistd.h>

// What of the interface is used; Debian has no package with its header.
struct qemu_plugin_tb;
extern void qemu_plugin_register_vcpu_tb_trans_cb(uint64_t id,
                                                  void (*call)(uint64_t, struct qemu_plugin_tb *));
extern size_t qemu_plugin_tb_n_insns(const struct qemu_plugin_tb *block);
extern void qemu_plugin_register_vcpu_tb_exec_cb(struct qemu_plugin_tb *block,
                                                 void (*call)(unsigned int, void *), int flags,
                                                 void *data);
__attribute__((visibility("default"))) int qemu_plugin_version = 1;

static uint64_t *total;

static void executed(unsigned int processor, void *instructions)
{
    (void)processor;
    __atomic_fetch_add(total, (uintptr_t)instructions, __ATOMIC_RELAXED);
}

static void translated(uint64_t id, struct qemu_plugin_tb *block)
{
    (void)id;
    qemu_plugin_register_vcpu_tb_exec_cb(block, executed, 0,
                                         (void *)(uintptr_t)qemu_plugin_tb_n_insns(block));
}

__attribute__((visibility("default"))) int qemu_plugin_install(uint64_t id, const void *info,
                                                               int count, char **arguments)
{
    int fd = -1;

    (void)info;
    if (count == 1 && strncmp(arguments[0], "out=", 4) == 0)
        fd = open(arguments[0] + 4, O_RDWR | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (fd < 0 || ftruncate(fd, sizeof *total) != 0)
        return -1;
    total = mmap(NULL, sizeof *total, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    close(fd);
    if (total == MAP_FAILED)
        return -1;
    qemu_plugin_register_vcpu_tb_trans_cb(id, translated);
    return 0;
}
