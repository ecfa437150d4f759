#define WIN32_LEAN_AND_MEAN
#define NOMINMAX
#include <windows.h>

#include <algorithm>
#include <string>
#include <vector>

#include "lock_wait.h"
#include "orxutils/file_error.h"
#include "orxutils/path.h"
#include "os_file.h"

namespace orx::os {
namespace {

constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;
/// What one call reads or writes at most.
constexpr std::size_t kLargestCall = 1U << 30U;
/// Locks bar readers from the bytes that they cover, so the byte that is locked lies behind any
/// file's end.
constexpr DWORD kLockedByteHigh = 0x7FFFFFFF;

/// FILE_RENAME_INFO for FileRenameInfoEx, which not every header knows.
constexpr auto kFileRenameInfoEx = static_cast<FILE_INFO_BY_HANDLE_CLASS>(22);
constexpr DWORD kReplaceIfExists = 1;
constexpr DWORD kPosixSemantics = 2;

/// Keeps the system's error when a call has failed.
bool Check(bool done) {
  if (!done) KeepFileError();
  return done;
}

HANDLE Open(const std::filesystem::path& path, DWORD access, DWORD disposition,
            DWORD flags = FILE_ATTRIBUTE_NORMAL) {
  const HANDLE handle =
      CreateFileW(path.c_str(), access, kShareAll, nullptr, disposition, flags, nullptr);
  return handle == INVALID_HANDLE_VALUE ? nullptr : handle;
}

std::uint64_t Join(DWORD high, DWORD low) { return (std::uint64_t{high} << 32U) | low; }

OVERLAPPED At(std::uint64_t offset) {
  OVERLAPPED place = {};
  place.Offset = static_cast<DWORD>(offset);
  place.OffsetHigh = static_cast<DWORD>(offset >> 32U);
  return place;
}

/// \return nothing without a handle
std::optional<FileStamp> StampOfOpen(HANDLE handle) {
  BY_HANDLE_FILE_INFORMATION information;
  if (!GetFileInformationByHandle(handle, &information)) return std::nullopt;
  FileStamp stamp;
  stamp.device = information.dwVolumeSerialNumber;
  stamp.file = Join(information.nFileIndexHigh, information.nFileIndexLow);
  stamp.size = Join(information.nFileSizeHigh, information.nFileSizeLow);
  stamp.modified = static_cast<std::int64_t>(
      Join(information.ftLastWriteTime.dwHighDateTime, information.ftLastWriteTime.dwLowDateTime));
  return stamp;
}

bool Lock(HANDLE handle, const std::filesystem::path& path) {
  const auto ask = [handle] {
    OVERLAPPED place = {};
    place.OffsetHigh = kLockedByteHigh;
    constexpr DWORD kHow = LOCKFILE_EXCLUSIVE_LOCK | LOCKFILE_FAIL_IMMEDIATELY;
    return LockFileEx(handle, kHow, 0, 1, 0, &place) != 0;
  };
  LockWait wait(path);
  while (!ask()) {
    const DWORD error = GetLastError();
    const bool isHeld = error == ERROR_LOCK_VIOLATION || error == ERROR_IO_PENDING;
    if (isHeld && wait.GoOn()) continue;
    SetLastError(isHeld ? ERROR_LOCK_VIOLATION : error);
    return Check(false);
  }
  return true;
}

/// Replaces a file that others have open: they keep the old one.
bool RenameOver(const std::filesystem::path& from, const std::filesystem::path& to) {
  const std::wstring name = AbsoluteName(to.wstring());
  std::vector<unsigned char> buffer(sizeof(FILE_RENAME_INFO) + name.size() * sizeof(wchar_t));
  auto* const info = reinterpret_cast<FILE_RENAME_INFO*>(buffer.data());
  *reinterpret_cast<DWORD*>(info) = kReplaceIfExists | kPosixSemantics;
  info->FileNameLength = static_cast<DWORD>(name.size() * sizeof(wchar_t));
  std::copy(name.begin(), name.end(), info->FileName);
  // Through such a handle the change of the directory is durable, too.
  const HANDLE handle = Open(from, DELETE | SYNCHRONIZE, OPEN_EXISTING, FILE_FLAG_WRITE_THROUGH);
  if (!handle) return false;
  const bool renamed = SetFileInformationByHandle(handle, kFileRenameInfoEx, info,
                                                  static_cast<DWORD>(buffer.size()));
  CloseHandle(handle);
  return renamed;
}

bool Move(const std::filesystem::path& from, const std::filesystem::path& to, DWORD flags) {
  return MoveFileExW(from.c_str(), to.c_str(), flags | MOVEFILE_WRITE_THROUGH) != 0;
}

std::filesystem::path OldNameOf(const std::filesystem::path& path) {
  std::filesystem::path old = path;
  return old += ".replaced";
}

/// Replaces a file that others have open where the file system cannot do so at once, as on a
/// network share: moves it out of the way first, so that for a moment there is none of that name.
/// The caller has locked the file.
bool SwapIn(const std::filesystem::path& from, const std::filesystem::path& to) {
  const std::filesystem::path old = OldNameOf(to);
  if (!Move(to, old, MOVEFILE_REPLACE_EXISTING)) return false;
  if (!Move(from, to, 0)) {
    Move(old, to, 0);
    return false;
  }
  Remove(old);
  return true;
}

/// Waits for a process that is swapping in a file, or puts back the one that a process left moved
/// out of the way when it was stopped. The caller has not locked it.
/// \return true when there may be a file of that name now
bool PutBack(const std::filesystem::path& path) {
  const std::filesystem::path old = OldNameOf(path);
  const HANDLE handle = Open(old, GENERIC_READ, OPEN_EXISTING);
  if (!handle) return false;
  if (Lock(handle, path)) Move(old, path, 0);  // fails where there is a file of that name again
  CloseHandle(handle);
  return true;
}

HANDLE OpenOrPutBack(const std::filesystem::path& path, DWORD access, DWORD disposition) {
  const HANDLE handle = Open(path, access, disposition);
  if (handle || GetLastError() != ERROR_FILE_NOT_FOUND || !PutBack(path)) return handle;
  return Open(path, access, disposition);
}

/// True when a path leads to an open file.
bool IsNamed(HANDLE handle, const std::filesystem::path& path) {
  const std::optional<FileStamp> opened = StampOfOpen(handle);
  const std::optional<FileStamp> named = StampOf(path);
  return opened && named && opened->IsSameFile(*named);
}

/// Removes a file that a process left when it was stopped before the file got its name. Waits for
/// one that is at work.
/// \return false when there is something else of that name, or it cannot be removed
bool RemoveLeftOver(const std::filesystem::path& path) {
  const HANDLE handle = Open(path, GENERIC_READ | GENERIC_WRITE, OPEN_EXISTING);
  if (!handle) return Check(GetLastError() == ERROR_FILE_NOT_FOUND);
  bool isDone = Lock(handle, path);
  // While this waited, the file may have got its name.
  if (isDone && IsNamed(handle, path)) isDone = Check(DeleteFileW(path.c_str()) != 0);
  CloseHandle(handle);
  return isDone;
}

}  // namespace

std::optional<File> File::OpenToRead(const std::filesystem::path& path) {
  const HANDLE handle = OpenOrPutBack(path, GENERIC_READ, OPEN_EXISTING);
  if (!Check(handle != nullptr)) return std::nullopt;
  return File(handle);
}

std::optional<File> File::OpenLocked(const std::filesystem::path& path) {
  for (;;) {
    const HANDLE handle = OpenOrPutBack(path, GENERIC_READ | GENERIC_WRITE, OPEN_EXISTING);
    if (!Check(handle != nullptr)) return std::nullopt;
    File file(handle);
    if (!Lock(handle, path)) return std::nullopt;
    // While this waited, the file may have been replaced by another of the same name.
    if (!file.Stamp()) return std::nullopt;
    if (IsNamed(handle, path)) {
      // What was moved aside for this file has no use any more, and must not be put back.
      Remove(OldNameOf(path));
      return file;
    }
  }
}

std::optional<File> File::CreateLocked(const std::filesystem::path& path) {
  for (;;) {
    const HANDLE handle = Open(path, GENERIC_READ | GENERIC_WRITE, CREATE_NEW);
    if (!handle) {
      if (!Check(GetLastError() == ERROR_FILE_EXISTS) || !RemoveLeftOver(path)) return std::nullopt;
      continue;
    }
    File file(handle);
    if (!Lock(handle, path)) {
      Remove(path);
      return std::nullopt;
    }
    // Somebody may have taken it for one that was left over.
    if (IsNamed(handle, path)) return file;
  }
}

File::~File() {
  if (handle_ != kNone) CloseHandle(handle_);
}

std::optional<FileStamp> File::Stamp() const { return StampOfOpen(handle_); }

std::optional<std::size_t> File::Read(std::uint64_t offset, unsigned char* to,
                                      std::size_t size) const {
  std::size_t done = 0;
  while (done < size) {
    OVERLAPPED place = At(offset + done);
    const auto wanted = static_cast<DWORD>(std::min(size - done, kLargestCall));
    DWORD count = 0;
    if (!ReadFile(handle_, to + done, wanted, &count, &place)) {
      if (GetLastError() == ERROR_HANDLE_EOF) break;
      KeepFileError();
      return std::nullopt;
    }
    if (count == 0) break;
    done += count;
  }
  return done;
}

bool File::Write(std::uint64_t offset, const unsigned char* from, std::size_t size) {
  std::size_t done = 0;
  while (done < size) {
    OVERLAPPED place = At(offset + done);
    const auto wanted = static_cast<DWORD>(std::min(size - done, kLargestCall));
    DWORD count = 0;
    const bool written = WriteFile(handle_, from + done, wanted, &count, &place) && count > 0;
    if (!Check(written)) return false;
    done += count;
  }
  return true;
}

bool File::Truncate(std::uint64_t size) {
  LARGE_INTEGER end;
  end.QuadPart = static_cast<LONGLONG>(size);
  return Check(SetFilePointerEx(handle_, end, nullptr, FILE_BEGIN) && SetEndOfFile(handle_));
}

bool File::TakeAccessOf(const File&) { return true; }

bool File::Flush() { return Check(FlushFileBuffers(handle_) != 0); }

Memory::Memory(std::size_t size) : bytes_(new unsigned char[size]) {}

void Memory::Free::operator()(unsigned char* bytes) const { delete[] bytes; }

std::optional<FileStamp> StampOf(const std::filesystem::path& path) {
  const HANDLE handle = Open(path, GENERIC_READ, OPEN_EXISTING);
  const std::optional<FileStamp> stamp = StampOfOpen(handle);
  if (handle) CloseHandle(handle);
  return stamp;
}

bool Rename(const std::filesystem::path& from, const std::filesystem::path& to, bool replace) {
  if (!replace) {
    PutBack(to);
    return Check(Move(from, to, 0));
  }
  return Check(RenameOver(from, to) || Move(from, to, MOVEFILE_REPLACE_EXISTING) ||
               SwapIn(from, to));
}

std::filesystem::path WithoutLinks(const std::filesystem::path& path) { return path; }

void Remove(const std::filesystem::path& path) { DeleteFileW(path.c_str()); }

}  // namespace orx::os
