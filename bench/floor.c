/* The floor of an update run: the least file work that installs the same files with the same
 * durability, and nothing else. For every pair named in the list file (one "target<TAB>download"
 * per line, host paths), in order: copy the existing target to its backup (target + ".$bak$")
 * and flush it, then copy the download over the target and flush it. Then, as the library's
 * clean-up does, remove every backup and every download. UpdateAll is measured against this.
 *
 *   pexfloor LISTFILE        exit 0 when every step succeeded
 */
#define _GNU_SOURCE
#include <errno.h>
#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>
#include <unistd.h>

/* The same 64 KiB buffer as the library's copy, the size `cp` used for years. */
static char buffer[1 << 16];

static int CopyAndFlush(const char* from, const char* to) {
    int in = open(from, O_RDONLY | O_CLOEXEC);
    if (in < 0) return -1;
    int out = open(to, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    if (out < 0) {
        close(in);
        return -1;
    }
    int ok = 1;
    for (;;) {
        ssize_t n = read(in, buffer, sizeof buffer);
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) {
            ok = n == 0;
            break;
        }
        for (ssize_t done = 0; done < n;) {
            ssize_t w = write(out, buffer + done, (size_t)(n - done));
            if (w < 0 && errno == EINTR) continue;
            if (w < 0) {
                ok = 0;
                break;
            }
            done += w;
        }
        if (!ok) break;
    }
    if (fsync(out) != 0) ok = 0;
    if (close(out) != 0) ok = 0;
    close(in);
    return ok ? 0 : -1;
}

struct Pair {
    char* target;
    char* download;
    int backedUp;
};

int main(int argc, char** argv) {
    if (argc != 2) {
        fprintf(stderr, "usage: pexfloor LISTFILE\n");
        return 2;
    }
    FILE* list = fopen(argv[1], "r");
    if (!list) {
        perror(argv[1]);
        return 2;
    }
    struct Pair* pairs = NULL;
    size_t count = 0, capacity = 0;
    char* line = NULL;
    size_t lineSize = 0;
    ssize_t length;
    while ((length = getline(&line, &lineSize, list)) > 0) {
        if (line[length - 1] == '\n') line[--length] = '\0';
        char* tab = strchr(line, '\t');
        if (!tab) continue;
        *tab = '\0';
        if (count == capacity) {
            capacity = capacity ? 2 * capacity : 256;
            pairs = realloc(pairs, capacity * sizeof *pairs);
            if (!pairs) return 2;
        }
        pairs[count].target = strdup(line);
        pairs[count].download = strdup(tab + 1);
        pairs[count].backedUp = 0;
        ++count;
    }
    free(line);
    fclose(list);

    int failures = 0;
    char backup[4096];
    for (size_t i = 0; i < count; ++i) {
        struct stat st;
        snprintf(backup, sizeof backup, "%s.$bak$", pairs[i].target);
        if (stat(pairs[i].target, &st) == 0) {
            if (CopyAndFlush(pairs[i].target, backup) != 0) {
                ++failures;
                continue;
            }
            pairs[i].backedUp = 1;
        }
        if (CopyAndFlush(pairs[i].download, pairs[i].target) != 0) ++failures;
    }
    for (size_t i = 0; i < count; ++i) {
        snprintf(backup, sizeof backup, "%s.$bak$", pairs[i].target);
        if (pairs[i].backedUp && unlink(backup) != 0) ++failures;
        if (unlink(pairs[i].download) != 0) ++failures;
    }
    if (failures) fprintf(stderr, "pexfloor: %d failures\n", failures);
    return failures ? 1 : 0;
}
