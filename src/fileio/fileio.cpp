// SPDX-License-Identifier: MIT
// Whole-file reads, and batches of writes on the POSIX calls themselves: unnamed temporary files, links,
// renames and flushes, with the IDE's error numbers and the path and the system's reason in the
// description.
#include "fileio/fileio.h"

#include "fileio/parallel.h"

#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QRandomGenerator>

#include <atomic>
#include <cerrno>
#include <climits>
#include <csignal>
#include <cstring>
#include <ctime>
#include <mutex>
#include <set>
#include <string_view>

#include <dirent.h>
#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

namespace fileio {

namespace {

/// Why a file of this type is not read: opening a directory succeeds and only the read fails, with a less
/// helpful reason; opening a FIFO waits for a writer; a device may never end. Empty for a regular file.
QString unreadableKind(mode_t mode) {
  if (S_ISREG(mode)) return {};
  if (S_ISDIR(mode)) return QStringLiteral("it is a directory");
  if (S_ISFIFO(mode)) return QStringLiteral("it is a FIFO");
  if (S_ISCHR(mode) || S_ISBLK(mode)) return QStringLiteral("it is a device");
  if (S_ISSOCK(mode)) return QStringLiteral("it is a socket");
  return QStringLiteral("it is not a regular file");
}

constexpr qint64 kSecond = 1'000'000'000;

qint64 nanoseconds(const timespec& time) {
  return qint64(time.tv_sec) * kSecond + time.tv_nsec;
}

qint64 now() {
  timespec time{};
  ::clock_gettime(CLOCK_REALTIME, &time);
  return nanoseconds(time);
}

void setFrom(FileStamp& stamp, const struct stat& status) {
  stamp.exists = true;
  stamp.size = status.st_size;
  stamp.modified = nanoseconds(status.st_mtim);
  stamp.device = status.st_dev;
  stamp.inode = status.st_ino;
}

size_t hashOf(const QByteArray& bytes) {
  return qHash(bytes, 0);
}

QString reasonOf(int error) {
  return QString::fromLocal8Bit(std::strerror(error));
}

[[noreturn]] void failWrite(const QString& path, int error) {
  throw ide::Error(ide::err::PathFileAccessError,
                   QStringLiteral("Cannot write %1: %2").arg(path, reasonOf(error)));
}

bool writeAll(int descriptor, const QByteArray& bytes, off_t offset = -1) {
  const char* data = bytes.constData();
  qsizetype left = bytes.size();
  while (left > 0) {
    const ssize_t written = offset < 0 ? ::write(descriptor, data, size_t(left))
                                       : ::pwrite(descriptor, data, size_t(left), offset);
    if (written < 0) {
      if (errno == EINTR) continue;
      return false;
    }
    data += written;
    left -= written;
    if (offset >= 0) offset += written;
  }
  return true;
}

/// The whole content of an open file; false with errno on failure.
bool readAll(int descriptor, QByteArray& bytes) {
  bytes.clear();
  char buffer[65536];
  for (;;) {
    const ssize_t got = ::read(descriptor, buffer, sizeof buffer);
    if (got < 0) {
      if (errno == EINTR) continue;
      return false;
    }
    if (got == 0) return true;
    bytes.append(buffer, got);
  }
}

/// The content of `path`; false with errno on failure.
bool readPath(const QByteArray& path, QByteArray& bytes) {
  const int descriptor = ::open(path.constData(), O_RDONLY | O_CLOEXEC);
  if (descriptor < 0) return false;
  const bool read = readAll(descriptor, bytes);
  const int error = errno;
  ::close(descriptor);
  errno = error;
  return read;
}

// ---------------------------------------------------------------------------------------------------
// Test seam

std::function<int(FileStep, const QString&)>& faultHook() {
  static std::function<int(FileStep, const QString&)> hook;
  return hook;
}

int injected(FileStep step, const QString& path) {
  const auto& hook = faultHook();
  return hook ? hook(step, path) : 0;
}

// ---------------------------------------------------------------------------------------------------
// Signals: while a batch is under way, SIGINT, SIGTERM and SIGHUP are only noted; the batch removes what
// it wrote (or, once it is replacing files, finishes) and then lets the signal take its course.

constexpr int kCaughtSignals[] = {SIGINT, SIGTERM, SIGHUP};
std::atomic<int> g_caughtSignal{0};
std::mutex g_signalMutex;
int g_batchesUnderWay = 0;
struct sigaction g_previousActions[std::size(kCaughtSignals)];
bool g_signalHeld[std::size(kCaughtSignals)];

extern "C" void noteSignal(int signal) {
  int none = 0;
  g_caughtSignal.compare_exchange_strong(none, signal);
}

void holdSignals() {
  const std::lock_guard lock(g_signalMutex);
  if (g_batchesUnderWay++ > 0) return;
  for (size_t i = 0; i < std::size(kCaughtSignals); ++i) {
    struct sigaction previous {};
    ::sigaction(kCaughtSignals[i], nullptr, &previous);
    // An ignored signal stays ignored (nohup).
    g_signalHeld[i] = (previous.sa_flags & SA_SIGINFO) || previous.sa_handler != SIG_IGN;
    if (!g_signalHeld[i]) continue;
    g_previousActions[i] = previous;
    struct sigaction noting {};
    noting.sa_handler = noteSignal;
    noting.sa_flags = SA_RESTART;
    sigemptyset(&noting.sa_mask);
    ::sigaction(kCaughtSignals[i], &noting, nullptr);
  }
}

/// Gives the signals back; one that came meanwhile is raised again, which ends the process unless it
/// had a handler of its own.
void releaseSignals() {
  int caught = 0;
  {
    const std::lock_guard lock(g_signalMutex);
    if (--g_batchesUnderWay > 0) return;
    for (size_t i = 0; i < std::size(kCaughtSignals); ++i)
      if (g_signalHeld[i]) ::sigaction(kCaughtSignals[i], &g_previousActions[i], nullptr);
    caught = g_caughtSignal.exchange(0);
  }
  if (caught) ::raise(caught);
}

bool interrupted() {
  return g_caughtSignal.load(std::memory_order_relaxed) != 0;
}

[[noreturn]] void failInterrupted() {
  throw ide::Error(ide::err::PathFileAccessError,
                   QStringLiteral("Saving was interrupted; no file was changed"));
}

// ---------------------------------------------------------------------------------------------------
// Names on disk

QByteArray directoryOf(const QByteArray& path) {
  const qsizetype slash = path.lastIndexOf('/');
  if (slash < 0) return ".";
  return slash == 0 ? QByteArray("/") : path.left(slash);
}

/// The file that `path` finally names, following every symbolic link; empty with errno ELOOP for a loop.
QByteArray finalTarget(QByteArray path) {
  for (int hops = 0; hops < 40; ++hops) {
    struct stat status {};
    if (::lstat(path.constData(), &status) != 0 || !S_ISLNK(status.st_mode)) return path;
    char link[PATH_MAX];
    const ssize_t length = ::readlink(path.constData(), link, sizeof link);
    if (length < 0) return path;
    QByteArray next(link, length);
    path = next.startsWith('/') ? next : directoryOf(path) + '/' + next;
  }
  errno = ELOOP;
  return {};
}

/// The start of our hidden names beside `target`: `.NAME.quimbel-PID-`, followed by six letters or digits.
QByteArray hiddenPrefix(const QByteArray& target) {
  const QByteArray name = target.mid(target.lastIndexOf('/') + 1).left(200);
  return directoryOf(target) + "/." + name + ".quimbel-" + QByteArray::number(::getpid()) + '-';
}

QByteArray randomSuffix() {
  static constexpr char kLetters[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789";
  QByteArray suffix(6, '0');
  for (char& letter : suffix)
    letter = kLetters[QRandomGenerator::global()->bounded(int(sizeof kLetters - 1))];
  return suffix;
}

/// Makes `from` (a path, or with an empty path the open file `descriptor`) known under a new hidden name
/// beside `target`; the name, or empty with errno.
QByteArray linkHidden(const QByteArray& target, const char* from, int descriptor = -1) {
  char procPath[64];
  if (descriptor >= 0) std::snprintf(procPath, sizeof procPath, "/proc/self/fd/%d", descriptor);
  for (int attempt = 0; attempt < 100; ++attempt) {
    const QByteArray name = hiddenPrefix(target) + randomSuffix();
    const int linked = descriptor >= 0
                           ? ::linkat(AT_FDCWD, procPath, AT_FDCWD, name.constData(), AT_SYMLINK_FOLLOW)
                           : ::link(from, name.constData());
    if (linked == 0) return name;
    if (errno != EEXIST) return {};
  }
  return {};
}

/// Unnamed temporary files need a file system that has them and /proc to give them a name.
bool unnamedFilesUsable() {
  static const bool usable = ::access("/proc/self/fd", X_OK) == 0;
  return usable;
}

bool parseDigits(std::string_view text, long& value) {
  if (text.empty() || text.size() > 9) return false;
  value = 0;
  for (const char c : text) {
    if (c < '0' || c > '9') return false;
    value = value * 10 + (c - '0');
  }
  return true;
}

/// Removes our temporary files in `directory` that a process which has ended left behind (killed while
/// saving). Those of older versions, which carry no process number, are removed once an hour old.
void removeStaleTemporaries(const QByteArray& directory) {
  DIR* dir = ::opendir(directory.constData());
  if (!dir) return;
  const qint64 hourAgo = now() - 3600 * kSecond;
  while (const dirent* entry = ::readdir(dir)) {
    const std::string_view name(entry->d_name);
    // .NAME.quimbel-PID-XXXXXX or .NAME.quimbel-XXXXXX
    if (name.size() < 17 || name.front() != '.' || name[name.size() - 7] != '-') continue;
    const std::string_view head = name.substr(0, name.size() - 7);
    const size_t mark = head.rfind(".quimbel");
    if (mark == std::string_view::npos || mark == 0) continue;
    const std::string_view rest = head.substr(mark + 8);
    bool stale = false;
    long pid = 0;
    if (rest.empty()) {
      struct stat status {};
      stale = ::fstatat(::dirfd(dir), entry->d_name, &status, AT_SYMLINK_NOFOLLOW) == 0 &&
              S_ISREG(status.st_mode) && nanoseconds(status.st_mtim) < hourAgo;
    } else if (rest.front() == '-' && parseDigits(rest.substr(1), pid) && pid != ::getpid()) {
      stale = ::kill(pid_t(pid), 0) != 0 && errno == ESRCH;
    }
    if (stale) ::unlinkat(::dirfd(dir), entry->d_name, 0);
  }
  ::closedir(dir);
}

void syncDirectories(const std::set<QByteArray>& directories) {
  for (const QByteArray& directory : directories) {
    const int descriptor = ::open(directory.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (descriptor < 0) continue;
    ::fsync(descriptor);
    ::close(descriptor);
  }
}

/// Writes `bytes` over the content of the existing file `path`, keeping its inode (and so its links,
/// owner and mode); `stamp`, when given, gets what the file is then. 0 or errno.
int rewriteInPlace(const QByteArray& path, const QByteArray& bytes, FileStamp* stamp) {
  const int descriptor = ::open(path.constData(), O_WRONLY | O_CLOEXEC);
  if (descriptor < 0) return errno;
  int error = 0;
  struct stat status {};
  if (!writeAll(descriptor, bytes, 0) || ::ftruncate(descriptor, bytes.size()) != 0 ||
      ::fdatasync(descriptor) != 0 || ::fstat(descriptor, &status) != 0)
    error = errno;
  ::close(descriptor);
  if (!error && stamp) setFrom(*stamp, status);
  return error;
}

// The whole group of temporary files that are open at once: a quarter of what the process may open.
size_t openFilesAllowed() {
  rlimit limit{};
  if (::getrlimit(RLIMIT_NOFILE, &limit) != 0 || limit.rlim_cur == RLIM_INFINITY) return 256;
  return std::clamp<size_t>(size_t(limit.rlim_cur) / 4, 4, 256);
}

}  // namespace

// ---------------------------------------------------------------------------------------------------
// Stamps and reading

FileStamp FileStamp::of(const QString& path) {
  FileStamp stamp;
  stamp.path = path;
  stamp.taken = now();
  const QByteArray name = QFile::encodeName(path);
  struct stat status {};
  const int descriptor = ::open(name.constData(), O_RDONLY | O_CLOEXEC);
  if (descriptor < 0) {
    // Unreadable: its size and times alone tell whether it changes again.
    if (::stat(name.constData(), &status) == 0) setFrom(stamp, status);
    return stamp;
  }
  QByteArray bytes;
  if (::fstat(descriptor, &status) == 0 && readAll(descriptor, bytes)) {
    setFrom(stamp, status);
    stamp.hash = hashOf(bytes);
  }
  ::close(descriptor);
  return stamp;
}

QByteArray readFileBytes(const QString& path, FileStamp* stamp) {
  struct stat status {};
  if (::stat(QFile::encodeName(path).constData(), &status) != 0) {
    if (errno == ENOENT || errno == ENOTDIR)
      throw ide::Error(ide::err::FileNotFound, QStringLiteral("File not found: %1").arg(path));
    throw ide::Error(
        ide::err::PathFileAccessError,
        QStringLiteral("Cannot read %1: %2").arg(path, QString::fromLocal8Bit(std::strerror(errno))));
  }
  // Checked before opening: the file is never opened for reading unless it is a regular file.
  if (const QString kind = unreadableKind(status.st_mode); !kind.isEmpty()) {
    throw ide::Error(ide::err::PathFileAccessError, QStringLiteral("Cannot read %1: %2").arg(path, kind));
  }
  const qint64 taken = now();
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly)) {
    throw ide::Error(ide::err::PathFileAccessError,
                     QStringLiteral("Cannot read %1: %2").arg(path, file.errorString()));
  }
  QByteArray bytes = file.readAll();
  if (file.error() != QFileDevice::NoError) {
    throw ide::Error(ide::err::PathFileAccessError,
                     QStringLiteral("Cannot read %1: %2").arg(path, file.errorString()));
  }
  if (stamp) {
    *stamp = FileStamp();
    stamp->path = path;
    stamp->taken = taken;
    if (::fstat(file.handle(), &status) == 0) setFrom(*stamp, status);
    stamp->hash = hashOf(bytes);
  }
  return bytes;
}

namespace {

enum class OnDisk { AsRead, Changed, Deleted };

/// Whether `target` still is the file `expected` describes. Size, inode and modification time answer
/// when they can; the content decides when they cannot (the time changed but perhaps not the text, or
/// the file was read in the same tick of the file system's clock as it was last changed, when a change
/// right after the read would leave the time as it was).
OnDisk compareWithDisk(const FileStamp& expected, const QByteArray& target) {
  struct stat status {};
  if (::stat(target.constData(), &status) != 0)
    return errno == ENOENT && expected.exists ? OnDisk::Deleted : OnDisk::AsRead;
  if (!expected.exists || status.st_size != expected.size) return OnDisk::Changed;
  // File systems that keep whole seconds (or two) have no fraction in their times.
  const qint64 tick = expected.modified % kSecond == 0 ? 2 * kSecond : 20'000'000;
  if (status.st_dev == expected.device && status.st_ino == expected.inode &&
      nanoseconds(status.st_mtim) == expected.modified && expected.taken - expected.modified > tick)
    return OnDisk::AsRead;
  QByteArray bytes;
  if (!readPath(target, bytes)) return OnDisk::AsRead;  // the write tells what is wrong
  return hashOf(bytes) == expected.hash ? OnDisk::AsRead : OnDisk::Changed;
}

}  // namespace

FilesChangedOnDisk::FilesChangedOnDisk(QStringList changedFiles, QStringList deletedFiles)
    : ide::Error(ide::err::PathFileAccessError,
                 QStringLiteral("Not saved: changed by another program since it was read: %1")
                     .arg((changedFiles + deletedFiles).join(QStringLiteral(", ")))),
      changed(std::move(changedFiles)),
      deleted(std::move(deletedFiles)) {}

SaveHalfDone::SaveHalfDone(const QString& description, QStringList files)
    : ide::Error(ide::err::PathFileAccessError, description), newText(std::move(files)) {}

void setFileFaultHook(std::function<int(FileStep, const QString&)> hook) {
  faultHook() = std::move(hook);
}

void writeFileAtomically(const QString& path, const QByteArray& bytes) {
  FileWriteBatch batch;
  batch.add({path, bytes, std::nullopt});
  batch.commit();
}

// ---------------------------------------------------------------------------------------------------
// Batches

namespace {

struct Pending {
  QString path;
  QByteArray bytes;  // the new content, until it is written (for a file rewritten in place, until then)
  std::optional<FileStamp> expected;
  QByteArray target;  // the file that gets the content
  bool existed = false;
  bool inPlace = false;
  QByteArray oldBytes;   // what a file rewritten in place (or one that could not be linked) had
  QByteArray temporary;  // the new content's hidden name (empty while unnamed)
  QByteArray backup;     // a link to the old file while the batch replaces
  int descriptor = -1;
  bool replaced = false;  // holds its new content
  FileStamp stamp;        // of the new content
};

/// Whether the user may not write the file: read-only by its mode (which binds even root, as the
/// read-only attribute does on Windows), or by its permissions.
int refusal(const struct stat& status, const QByteArray& target) {
  if ((status.st_mode & 0222) == 0) return EROFS;
  if (::geteuid() != 0 && ::faccessat(AT_FDCWD, target.constData(), W_OK, AT_EACCESS) != 0) return errno;
  return 0;
}

/// Gives the temporary file `descriptor` the old file's mode, owner and group (or those of a new file);
/// 0, EPERM when the owner cannot be kept, or another errno.
int takeOver(int descriptor, const Pending& file, const struct stat& old, mode_t newFileMode) {
  if (!file.existed) return ::fchmod(descriptor, newFileMode) == 0 ? 0 : errno;
  // The owner first: changing it clears the set-user-ID bit that the mode may set again.
  if ((old.st_uid != ::geteuid() || old.st_gid != ::getegid()) &&
      ::fchown(descriptor, old.st_uid, old.st_gid) != 0)
    return errno;
  return ::fchmod(descriptor, old.st_mode & 07777) == 0 ? 0 : errno;
}

void closeTemporary(Pending& file) {
  if (file.descriptor >= 0) ::close(std::exchange(file.descriptor, -1));
  if (!file.temporary.isEmpty()) ::unlink(std::exchange(file.temporary, {}).constData());
}

/// Writes the new content of `file` to a temporary file beside its target (or, for a file rewritten in
/// place, takes the copy of the old one). Throws ide::Error.
void stage(Pending& file, mode_t newFileMode) {
  if (interrupted()) failInterrupted();
  if (const int error = injected(FileStep::Write, file.path)) failWrite(file.path, error);
  file.target = finalTarget(QFile::encodeName(file.path));
  if (file.target.isEmpty()) failWrite(file.path, errno);
  struct stat old {};
  if (::stat(file.target.constData(), &old) == 0) {
    if (S_ISDIR(old.st_mode)) failWrite(file.path, EISDIR);
    if (!S_ISREG(old.st_mode))
      throw ide::Error(ide::err::PathFileAccessError,
                       QStringLiteral("Cannot write %1: it is not a regular file").arg(file.path));
    if (const int refused = refusal(old, file.target))
      throw ide::Error(ide::err::PermissionDenied,
                       refused == EROFS
                           ? QStringLiteral("Cannot write %1: the file is read-only").arg(file.path)
                           : QStringLiteral("Cannot write %1: %2").arg(file.path, reasonOf(refused)));
    file.existed = true;
    // Replacing the file would split it from its other links.
    file.inPlace = old.st_nlink > 1;
  } else if (errno != ENOENT) {
    failWrite(file.path, errno);
  }
  file.stamp.path = file.path;
  file.stamp.hash = hashOf(file.bytes);
  if (!file.inPlace) {
    const QByteArray directory = directoryOf(file.target);
    if (unnamedFilesUsable())
      file.descriptor = ::open(directory.constData(), O_TMPFILE | O_WRONLY | O_CLOEXEC, 0600);
    if (file.descriptor < 0) {
      // The file system has no unnamed files: a hidden name from the start.
      QByteArray name = hiddenPrefix(file.target) + "XXXXXX";
      file.descriptor = ::mkostemp(name.data(), O_CLOEXEC);
      if (file.descriptor < 0) failWrite(file.path, errno);
      file.temporary = name;
    }
    const int error = takeOver(file.descriptor, file, old, newFileMode);
    if (error == EPERM && file.existed) {
      // The owner cannot be kept by a new file: the old one gets the new content.
      closeTemporary(file);
      file.inPlace = true;
    } else {
      if (error) failWrite(file.path, error);
      file.stamp.taken = now();
      if (!writeAll(file.descriptor, file.bytes)) failWrite(file.path, errno);
      // The disk starts on it now, while the rest of the batch is made; the flush at the end then waits
      // for less. Only a hint: where it cannot be given, the flush does all the work.
      ::sync_file_range(file.descriptor, 0, 0, SYNC_FILE_RANGE_WRITE);
      // Freed at once, so that the next file's content is put together in memory already in use.
      file.bytes = QByteArray();
      return;
    }
  }
  if (!readPath(file.target, file.oldBytes)) failWrite(file.path, errno);
  // Room for the new content is taken now, so that rewriting the file cannot run out of it half way.
  const int descriptor = ::open(file.target.constData(), O_WRONLY | O_CLOEXEC);
  if (descriptor < 0) failWrite(file.path, errno);
  const bool full = file.bytes.size() > file.oldBytes.size() &&
                    ::fallocate(descriptor, FALLOC_FL_KEEP_SIZE, 0, file.bytes.size()) != 0 &&
                    errno == ENOSPC;
  ::close(descriptor);
  if (full) failWrite(file.path, ENOSPC);
}

/// Puts the new content of `file` in place. 0 or errno.
int replace(Pending& file) {
  if (const int error = injected(FileStep::Replace, file.path)) return error;
  if (file.inPlace) {
    file.stamp.taken = now();
    // Even a rewrite that fails may have written part of it: it is put back too.
    file.replaced = true;
    return rewriteInPlace(file.target, file.bytes, &file.stamp);
  }
  file.stamp.taken = now();
  if (file.existed) {
    // The old file stays reachable until the whole batch is in place: swapped with the new one, else
    // under a second link, else (no hard links) its content is kept.
    if (::renameat2(AT_FDCWD, file.temporary.constData(), AT_FDCWD, file.target.constData(),
                    RENAME_EXCHANGE) == 0) {
      file.backup = std::exchange(file.temporary, {});
      file.replaced = true;
      return 0;
    }
    file.backup = linkHidden(file.target, file.target.constData());
    if (file.backup.isEmpty() && !readPath(file.target, file.oldBytes)) return errno;
  }
  if (::rename(file.temporary.constData(), file.target.constData()) != 0) {
    const int error = errno;
    if (!file.backup.isEmpty()) ::unlink(std::exchange(file.backup, {}).constData());
    return error;
  }
  file.temporary.clear();
  file.replaced = true;
  return 0;
}

/// Puts the old content of a replaced file back. 0 or errno.
int restore(Pending& file) {
  if (const int error = injected(FileStep::Restore, file.path)) return error;
  if (!file.existed) return ::unlink(file.target.constData()) == 0 ? 0 : errno;
  if (file.backup.isEmpty()) return rewriteInPlace(file.target, file.oldBytes, nullptr);
  if (::rename(file.backup.constData(), file.target.constData()) != 0) return errno;
  file.backup.clear();
  return 0;
}

}  // namespace

struct FileWriteBatch::State {
  std::vector<Pending> files;
  size_t staged = 0;   // files before this one are written to their temporary files
  size_t flushed = 0;  // files before this one are on disk and closed
  bool underWay = false;
  bool finished = false;

  void begin() {
    if (underWay) return;
    underWay = true;
    holdSignals();
  }
  void end() {
    finished = true;
    if (std::exchange(underWay, false)) releaseSignals();
  }
  void abandon() {
    for (Pending& file : files)
      closeTemporary(file);
    end();
  }
  [[noreturn]] void fail(const std::exception_ptr& failure) {
    abandon();
    std::rethrow_exception(failure);
  }
  void stopIfInterrupted() {
    if (!interrupted()) return;
    abandon();
    failInterrupted();
  }

  /// Flushes the open temporary files together (the file system then writes them in a few journal
  /// commits instead of one per file, one after the other), names the unnamed ones and closes them all.
  void flush() {
    stopIfInterrupted();
    const size_t first = flushed;
    std::vector<std::exception_ptr> failures;
    parallelFor(
        staged - first,
        [&](size_t i) {
          Pending& file = files[first + i];
          if (file.descriptor < 0) return;
          struct stat status {};
          if (::fdatasync(file.descriptor) != 0 || ::fstat(file.descriptor, &status) != 0)
            failWrite(file.path, errno);
          setFrom(file.stamp, status);
          if (file.temporary.isEmpty()) {
            file.temporary = linkHidden(file.target, nullptr, file.descriptor);
            if (file.temporary.isEmpty()) failWrite(file.path, errno);
          }
          ::close(std::exchange(file.descriptor, -1));
        },
        failures, 16);
    flushed = staged;
    for (const std::exception_ptr& failure : failures)
      if (failure) fail(failure);
  }

  /// Writes the files added but not written yet, in groups small enough to be open at once.
  void stageRest() {
    // Read once, before any thread runs: reading the umask means setting it.
    const mode_t mask = ::umask(0);
    ::umask(mask);
    const mode_t newFileMode = static_cast<mode_t>(0666 & ~mask);
    const size_t group = openFilesAllowed();
    while (staged < files.size()) {
      const size_t count = std::min(group, files.size() - staged);
      if (staged - flushed + count > group) flush();
      std::vector<std::exception_ptr> failures;
      const size_t first = staged;
      parallelFor(
          count, [&](size_t i) { stage(files[first + i], newFileMode); }, failures);
      staged += count;
      for (const std::exception_ptr& failure : failures)
        if (failure) fail(failure);
    }
  }

  /// Puts every file in place, or puts back those replaced when one fails.
  void replaceAll(const std::set<QByteArray>& directories);
};

FileWriteBatch::FileWriteBatch() : m_state(std::make_unique<State>()) {}

FileWriteBatch::~FileWriteBatch() {
  m_state->abandon();
}

bool FileWriteBatch::empty() const {
  return m_state->finished || m_state->files.empty();
}

const FileStamp* FileWriteBatch::written(size_t i) const {
  return i < m_state->files.size() && m_state->files[i].replaced ? &m_state->files[i].stamp : nullptr;
}

void FileWriteBatch::add(File file) {
  std::vector<File> files;
  files.push_back(std::move(file));
  addAll(std::move(files));
}

void FileWriteBatch::addAll(std::vector<File> files) {
  State& state = *m_state;
  if (state.finished) state = State();
  state.begin();
  for (File& file : files)
    state.files.push_back({std::move(file.path), std::move(file.bytes), std::move(file.expected)});
  state.stageRest();
}

void FileWriteBatch::commit() {
  State& state = *m_state;
  if (state.files.empty() || state.finished) return;
  state.flush();
  std::vector<Pending>& files = state.files;

  // Nothing is replaced while a file is not what was read.
  std::vector<OnDisk> onDisk(files.size(), OnDisk::AsRead);
  std::vector<std::exception_ptr> failures;
  parallelFor(
      files.size(),
      [&](size_t i) {
        if (files[i].expected) onDisk[i] = compareWithDisk(*files[i].expected, files[i].target);
      },
      failures);
  QStringList changed;
  QStringList deleted;
  for (size_t i = 0; i < files.size(); ++i) {
    if (onDisk[i] == OnDisk::Changed) changed << files[i].path;
    if (onDisk[i] == OnDisk::Deleted) deleted << files[i].path;
  }
  if (!changed.isEmpty() || !deleted.isEmpty()) {
    state.abandon();
    throw FilesChangedOnDisk(changed, deleted);
  }

  std::set<QByteArray> directories;
  for (const Pending& file : files)
    directories.insert(directoryOf(file.target));
  for (const QByteArray& directory : directories)
    removeStaleTemporaries(directory);
  // From here on a signal waits until every file is in place: that takes no longer than a few renames.
  state.stopIfInterrupted();
  state.replaceAll(directories);
  // The renames themselves are on disk once their directories are.
  syncDirectories(directories);
  state.end();
}

void FileWriteBatch::State::replaceAll(const std::set<QByteArray>& directories) {
  for (size_t i = 0; i < files.size(); ++i) {
    const int error = replace(files[i]);
    if (!error) continue;
    const QString failure = QStringLiteral("Cannot write %1: %2").arg(files[i].path, reasonOf(error));
    QStringList newText;
    QStringList where;
    for (size_t j = i + 1; j-- > 0;) {
      Pending& file = files[j];
      if (!file.replaced) continue;
      if (restore(file) == 0) {
        file.replaced = false;
        continue;
      }
      newText.prepend(file.path);
      if (!file.backup.isEmpty())
        where.prepend(QStringLiteral("the old text of %1 is in %2")
                          .arg(file.path, QFile::decodeName(std::exchange(file.backup, {}))));
    }
    syncDirectories(directories);
    for (Pending& file : files)
      if (!file.backup.isEmpty()) ::unlink(std::exchange(file.backup, {}).constData());
    abandon();
    if (newText.isEmpty()) throw ide::Error(ide::err::PathFileAccessError, failure);
    QString description = failure +
                          QStringLiteral(". The files replaced before it could not all be put back: ") +
                          newText.join(QStringLiteral(", ")) +
                          (newText.size() == 1 ? QStringLiteral(" holds") : QStringLiteral(" hold")) +
                          QStringLiteral(" the new text; every other file holds its old text");
    if (!where.isEmpty()) description += QStringLiteral(" (") + where.join(QStringLiteral("; ")) + u')';
    throw SaveHalfDone(description + u'.', newText);
  }
  for (Pending& file : files)
    if (!file.backup.isEmpty()) ::unlink(std::exchange(file.backup, {}).constData());
}

}  // namespace fileio
