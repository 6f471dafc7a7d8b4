/* The floor of an update run: the least file work that installs the same files with the same
 * durability, and nothing else. For every pair named in the list file (one "target<TAB>download"
 * per line, host paths), in order: copy the existing target to its backup (target + ".$bak$")
 * and flush it, then copy the download over the target and flush it. Then, as the library's
 * clean-up does, remove every backup and every download. UpdateAll is measured against this.
 *
 * The log and the status that the library keeps are part of the work too:
 *   --log FILE --lines N --line-bytes B   N lines of B bytes appended to FILE, each by open
 *                                         (append, create), one write and close, spread evenly
 *                                         over the files (the trace log's least cost)
 *   --status FILE --status-bytes B --group-files K
 *                                         after every K files (and after the last), FILE
 *                                         written whole with B bytes and flushed (the content
 *                                         file's write-back after every group)
 *
 *   pexfloor LISTFILE [OPTIONS]   exit 0 when every step succeeded
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

/* The C loop of a trace line: open for appending, one write, close. */
static int AppendLine(const char* log, const char* line, size_t size) {
    int fd = open(log, O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
    if (fd < 0) return -1;
    int ok = write(fd, line, size) == (ssize_t)size;
    return close(fd) == 0 && ok ? 0 : -1;
}

static int WriteStatus(const char* status, size_t size) {
    static char* bytes = NULL;
    if (!bytes && !(bytes = malloc(size ? size : 1))) return -1;
    memset(bytes, 'S', size);
    int fd = open(status, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    if (fd < 0) return -1;
    int ok = write(fd, bytes, size) == (ssize_t)size && fsync(fd) == 0;
    return close(fd) == 0 && ok ? 0 : -1;
}

struct Options {
    const char* log;
    long lines, lineBytes;
    const char* status;
    long statusBytes, groupFiles;
};

static int ParseOptions(int argc, char** argv, struct Options* o) {
    memset(o, 0, sizeof *o);
    for (int i = 2; i + 1 < argc; i += 2) {
        const char* name = argv[i];
        const char* value = argv[i + 1];
        if (!strcmp(name, "--log")) o->log = value;
        else if (!strcmp(name, "--lines")) o->lines = atol(value);
        else if (!strcmp(name, "--line-bytes")) o->lineBytes = atol(value);
        else if (!strcmp(name, "--status")) o->status = value;
        else if (!strcmp(name, "--status-bytes")) o->statusBytes = atol(value);
        else if (!strcmp(name, "--group-files")) o->groupFiles = atol(value);
        else return -1;
    }
    return argc % 2 == 0 ? 0 : -1;
}

struct Pair {
    char* target;
    char* download;
    int backedUp;
};

int main(int argc, char** argv) {
    struct Options options;
    if (argc < 2 || ParseOptions(argc, argv, &options) != 0) {
        fprintf(stderr, "usage: pexfloor LISTFILE [--log FILE --lines N --line-bytes B] "
                        "[--status FILE --status-bytes B --group-files K]\n");
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
    char* logLine = NULL;
    if (options.log && options.lineBytes > 0) {
        if (!(logLine = malloc((size_t)options.lineBytes))) return 2;
        memset(logLine, 'L', (size_t)options.lineBytes);
        logLine[options.lineBytes - 1] = '\n';
    }
    long linesWritten = 0;
    for (size_t i = 0; i < count; ++i) {
        /* The lines so far in proportion to the files so far. */
        for (long due = logLine ? options.lines * (long)(i + 1) / (long)count : 0; linesWritten < due; ++linesWritten)
            if (AppendLine(options.log, logLine, (size_t)options.lineBytes) != 0) ++failures;
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
        const int groupEnd = options.groupFiles > 0 && ((long)(i + 1) % options.groupFiles == 0 || i + 1 == count);
        if (options.status && groupEnd && WriteStatus(options.status, (size_t)options.statusBytes) != 0) ++failures;
    }
    for (size_t i = 0; i < count; ++i) {
        snprintf(backup, sizeof backup, "%s.$bak$", pairs[i].target);
        if (pairs[i].backedUp && unlink(backup) != 0) ++failures;
        if (unlink(pairs[i].download) != 0) ++failures;
    }
    if (failures) fprintf(stderr, "pexfloor: %d failures\n", failures);
    return failures ? 1 : 0;
}
