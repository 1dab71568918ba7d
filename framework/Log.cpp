#include "framework/Log.h"

#include <pthread.h>
#include <strings.h>
#include <sys/stat.h>

#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>

#include "framework/Buffer.h"
#include "framework/Datetime.h"
#include "framework/File_Lock.h"
#include "framework/String.h"

namespace CPTA {

const char* const _log_level_strings[NUM_LOG_LEVELS] = {"FATAL", "ERR", "WARN", "INFO", "DBG"};

std::atomic<bool> _log_enabled_state(true);

namespace {

// All state below is guarded by _mutex, which is held for the whole of a
// message. Everything is constant-initialised, so messages logged by other
// static initialisers find it ready.
pthread_mutex_t _mutex = PTHREAD_MUTEX_INITIALIZER;
int _level = LL_FATAL;
bool _initialized = false;
FILE* _file = nullptr;
File_Lock* _file_lock = nullptr;

// The environment variable naming the directory that holds the configuration.
const char cimple_home_envvar[] = "HOME";

const size_t PATH_SIZE = 1024;
const size_t LINE_SIZE = 1024;

struct Log_Guard {
    Log_Guard() { pthread_mutex_lock(&_mutex); }
    ~Log_Guard() { pthread_mutex_unlock(&_mutex); }
};

int _level_of(const char* name) {
    if (!name)
        return -1;
    for (int i = 0; i < NUM_LOG_LEVELS; i++) {
        if (strcasecmp(_log_level_strings[i], name) == 0)
            return i;
    }
    return -1;
}

// Builds a path; false when it does not fit.
bool _path(char (&buffer)[PATH_SIZE], const char* format, const char* a, const char* b) {
    int n = snprintf(buffer, PATH_SIZE, format, a, b);
    return n >= 0 && size_t(n) < PATH_SIZE;
}

// While logging is off every message looks at the configuration again. A
// configuration that was missing or named no level is remembered by the
// file's identity, so that the next message only has to stat() it: any
// change to the file (or its appearance) is still seen at the next message.
struct Config_Identity {
    bool known;
    time_t seen;  // when the identity was taken
    bool exists;
    char path[PATH_SIZE];
    dev_t dev;
    ino_t ino;
    off_t size;
    struct timespec mtime;
    struct timespec ctime;
};

Config_Identity _unusable_config = {false, 0, false, {0}, 0, 0, 0, {0, 0}, {0, 0}};

bool _same_time(const struct timespec& a, const struct timespec& b) {
    return a.tv_sec == b.tv_sec && a.tv_nsec == b.tv_nsec;
}

// Fills id from the file at path; false when the file cannot be stat()ed.
void _identify(Config_Identity& id, const char* path) {
    struct stat st;
    id.known = true;
    id.seen = time(nullptr);
    id.exists = stat(path, &st) == 0;
    strlcpy(id.path, path, sizeof(id.path));
    if (!id.exists)
        return;
    id.dev = st.st_dev;
    id.ino = st.st_ino;
    id.size = st.st_size;
    id.mtime = st.st_mtim;
    id.ctime = st.st_ctim;
}

bool _same_identity(const Config_Identity& a, const Config_Identity& b) {
    if (!a.known || !b.known || a.exists != b.exists || strcmp(a.path, b.path) != 0)
        return false;
    if (!a.exists)
        return true;
    // A file changed within the second before it was looked at may change
    // again without its size or time stamps showing it: trust it only later.
    if (b.ctime.tv_sec >= b.seen - 1)
        return false;
    return a.dev == b.dev && a.ino == b.ino && a.size == b.size && _same_time(a.mtime, b.mtime) &&
           _same_time(a.ctime, b.ctime);
}

// The value of the first LOG_LEVEL line of the configuration file, or -1.
int _read_level(const char* home) {
    char path[PATH_SIZE];
    if (!_path(path, "%s/%src", home, ".cimple"))
        return -1;
    Config_Identity id;
    _identify(id, path);
    if (_same_identity(id, _unusable_config))
        return -1;
    _unusable_config = id;
    FILE* is = id.exists ? fopen(path, "re") : nullptr;
    if (!is)
        return -1;

    int level = -1;
    char line[LINE_SIZE];
    while (fgets(line, sizeof(line), is)) {
        size_t n = strlen(line);
        if (n == sizeof(line) - 1 && line[n - 1] != '\n') {
            // Only the first LINE_SIZE - 1 characters of a line count.
            int c;
            while ((c = fgetc(is)) != EOF && c != '\n') {
            }
        }
        if (line[0] == '#')
            continue;
        while (n > 0 && isspace(static_cast<unsigned char>(line[n - 1])))
            line[--n] = '\0';
        if (n == 0 || strncmp(line, "LOG_LEVEL", 9) != 0)
            continue;
        const char* p = line + 9;
        while (isspace(static_cast<unsigned char>(*p)))
            p++;
        if (*p != '=')
            continue;
        p++;
        while (isspace(static_cast<unsigned char>(*p)))
            p++;
        level = _level_of(p);
        break;
    }
    fclose(is);
    if (level >= 0)
        _unusable_config.known = false;
    return level;
}

void _release_files() {
    delete _file_lock;
    _file_lock = nullptr;
    if (_file)
        fclose(_file);
    _file = nullptr;
    _initialized = false;
}

// Reads the configuration and opens the files; false leaves logging off.
bool _start() {
    const char* home = getenv(cimple_home_envvar);
    if (!home || !*home)
        return false;
    int level = _read_level(home);
    if (level < 0)
        return false;
    _level = level;

    char dir[PATH_SIZE], messages[PATH_SIZE], lock[PATH_SIZE];
    if (!_path(dir, "%s/%s", home, ".cimple") || !_path(messages, "%s%s", dir, "/messages") ||
        !_path(lock, "%s%s", dir, "/messages.lock"))
        return false;
    mkdir(dir, 0777);

    _file_lock = new File_Lock(lock);
    if (_file_lock->okay())
        _file = fopen(messages, "ae");
    if (!_file) {
        _release_files();
        return false;
    }
    _initialized = true;
    return true;
}

const char* _level_name(int level) {
    if (level < 0)
        level = LL_FATAL;
    return level < NUM_LOG_LEVELS ? _log_level_strings[level] : "DBG";
}

}  // namespace

void vlog(Log_Level level, const char* file, int line, const char* format, va_list ap) {
    try {
        Log_Guard guard;
        if (!_initialized && !_start())
            return;
        if (int(level) > _level)
            return;

        // The time to the second: the prettified timestamp up to its '.'.
        char now[Datetime::BUFFER_SIZE];
        Datetime::now().ascii(now, true);
        if (char* dot = strchr(now, '.'))
            *dot = '\0';

        Buffer buffer;
        buffer.format("%s %s: %s(%d): ", now, _level_name(level), file ? file : "", line);
        buffer.vformat(format ? format : "", ap);
        if (buffer.data()[buffer.size() - 1] != '\n')
            buffer.append('\n');

        _file_lock->lock();
        fwrite(buffer.data(), 1, buffer.size(), _file);
        fflush(_file);
        _file_lock->unlock();
    } catch (...) {
        // Out of memory: the message is lost, the caller carries on.
    }
}

void log(Log_Level level, const char* file, int line, const char* format, ...) {
    va_list ap;
    va_start(ap, format);
    vlog(level, file, line, format, ap);
    va_end(ap);
}

void Log_Call_Frame::invoke(const char* format, ...) {
    va_list ap;
    va_start(ap, format);
    vlog(level, file, line, format, ap);
    va_end(ap);
}

bool log_enabled(Log_Level level) {
    try {
        Log_Guard guard;
        return (_initialized || _start()) && int(level) <= _level;
    } catch (...) {
        return false;
    }
}

int log_set_level(const String& name) {
    int level = _level_of(name.c_str());
    if (level < 0)
        return -1;
    Log_Guard guard;
    _level = level;
    return 0;
}

int log_enable(bool flag) {
    return _log_enabled_state.exchange(flag) == flag ? -1 : 0;
}

void close_log() {
    Log_Guard guard;
    _release_files();
}

}  // namespace CPTA
