// PathBase: a Windows path as text, with the rules to split, check, shorten and use it.
//
// Every file-system location the library handles travels as a path object: the text of a
// drive-letter (C:\dir\f.txt), UNC (\\machine\share\f.txt) or relative (dir\f.txt) path,
// backslash-separated. The rules are those of Windows paths on every platform; file operations
// hand the text to the host system unchanged.
//
//   Path file("C:\\data\\report.ini");
//   DynamicString extension;
//   file.GetExtension(extension);                 // "ini"
//   if (!file.IsValid(false, &message)) ...       // "Path contains two adjacent ..."
//   file.SetExtension("bak");                     // C:\data\report.bak
//
// PathBase holds no text of its own: StaticPath and Path keep it in 260 characters (longer
// text is cut), DynamicPath on the heap. Construction and the setters turn a drive-relative
// form into an absolute one (C:dir becomes C:\dir), so that form never survives in a path.
//
// All indices are character indices: in multibyte mode a double-byte character is one
// character, and a trail byte that equals a backslash is never taken for a separator.
//
// Levels. After the root, a path is a list of levels separated by single backslashes. The
// root is "X:\" for a drive path, "\\machine\share\" for a UNC path, "\" for a path that
// starts with one backslash (rooted on the current drive), and nothing for a relative path. A
// trailing backslash ends the last level and adds none; two adjacent backslashes make an empty
// level. C:\a\b.txt has the levels "a" and "b.txt"; \\srv\sh\d\ has the level "d". Texts
// compare without regard to ASCII case, as Windows file names do. A UNC text with no
// backslash after the machine name (\\srv) has no levels: the operations on levels raise
// TE_PROGRAM_ERROR ("invalid UNC path") for it.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"
#include "tekit/strings/DynamicString.h"

#include <cstdint>
#include <set>
#include <string>

namespace tekit {

class Path;
class StringVector;

class TEKIT_API PathBase {
public:
    class PathVector;
    /// An ordering of paths by text, without regard to ASCII case: the order of operator<.
    struct TEKIT_API PathCompareObj {
        bool operator()(Path const& a, Path const& b) const;
    };
    /// The ordered set that FindFilesEx fills.
    using PathSet = std::set<Path, PathCompareObj>;

    /// Which file time GetFileTime and SetFileTime address.
    enum FileTimeOptions { kCreationTime = 0, kLastAccessTime = 1, kLastWriteTime = 2 };

    /// Filled by DirectoryContainsPath and SubDirectoryContainsPath when the contained path
    /// names an entry inside a library file of the graphical environment (a level ending in
    /// ".lwb" followed by the entry's name), which lives in the library, not in a directory.
    struct VINamespaceInfo {
        bool isInLibrary = false;
        /// The library file, from the root up to and including its ".lwb" level.
        DynamicString libraryPath;
        /// The entry's name inside the library: the text after the library's level.
        DynamicString entryName;
    };

    /// The longest extension (after the dot) still recognised as an extension.
    static std::int32_t const kMaxFileExtensionLength; // 254
    /// "exe", "com", "cmd", "bat".
    static std::int32_t const kNumCmdFileExtensions; // 4

    virtual ~PathBase();

    // ---- Text access and assignment. ----------------------------------------------------
    char const* CStr() const;
    String const& GetString() const;
    void GetPathName(String& out) const;
    void SetPathName(char const* text);
    void SetPathName(String const& text);
    void SetPathName(PathBase const& other);
    PathBase& operator=(char const* text);
    PathBase& operator=(String const& text);
    PathBase& operator=(PathBase const& other);
    void Clear();
    bool IsEmpty() const;
    /// Equality ignores ASCII case, as Windows file names do.
    bool operator==(PathBase const& other) const;
    bool operator==(String const& other) const;
    bool operator==(char const* other) const;
    bool operator!=(PathBase const& other) const { return !(*this == other); }
    bool operator!=(String const& other) const { return !(*this == other); }
    bool operator!=(char const* other) const { return !(*this == other); }
    /// Text order without regard to ASCII case, consistent with ==.
    bool operator<(PathBase const& other) const;
    /// Equal as text, or, with `askFileSystem`, both naming the same existing file: on
    /// Windows the texts' long forms (which expand 8.3 short names) are equal; on POSIX both
    /// are the same file (device and inode).
    bool ShortPathNameAwareEquals(char const* other, bool askFileSystem) const;
    bool ShortPathNameAwareEquals(String const& other, bool askFileSystem) const;
    bool ShortPathNameAwareEquals(PathBase const& other, bool askFileSystem) const;

    // ---- Components. ------------------------------------------------------------------------
    /// The text before the file name, without its trailing separator unless that is a root
    /// (C:\a\b.txt gives C:\a, C:\b.txt gives C:\, b.txt gives ""); a directory text (ending
    /// in a separator) gives itself without that separator.
    void GetDirectoryPathName(String& out) const;
    void GetFileName(String& out) const;
    void GetBaseName(String& out) const;
    /// The extension without its dot ("ini" for a.ini; "" when there is none).
    void GetExtension(String& out) const;
    /// Keeps the file name and puts it under `directory` (empty: the file name alone).
    void SetDirectoryPathName(char const* directory);
    void SetDirectoryPathName(String const& directory);
    /// Replaces the file name; a directory text or an empty path gets `name` appended.
    void SetFileName(char const* name);
    void SetFileName(String const& name);
    /// Replaces the base name and keeps the extension (C:\.profile with "a" gives
    /// C:\a.profile); without a file name, `name` becomes the file name.
    void SetBaseName(char const* name);
    void SetBaseName(String const& name);
    /// Replaces the extension or adds one; `extension` may start with its dot. An empty one
    /// removes the extension and its dot. A path without a file name is left alone.
    void SetExtension(char const* extension);
    void SetExtension(String const& extension);
    bool HasExtension() const;
    /// True when the extension equals `extension` (with or without its dot) ignoring case.
    bool HasExtension(char const* extension) const;
    /// Adds a separator unless the path is empty or ends in ':' or a separator, then
    /// `component` unchanged.
    void Append(char const* component);
    void Append(String const& component);
    /// Removes the file name and the separator before it (C:\a\b.txt gives C:\a, C:\b.txt
    /// gives C:\). A root is never removed; a directory text is left alone.
    void RemoveFileComponent();
    /// Removes the last level, whether file or directory (C:\a\b\ gives C:\a); the root
    /// stays (C:\ stays C:\).
    void RemoveLastComponent();
    void StripTrailingSeparator();
    /// Makes the path a directory text by adding a trailing separator. False, and nothing
    /// changed, for an empty path, or, with `mustExist`, when the file system has no
    /// directory there.
    bool ConvertToDirectory(bool mustExist);

    // ---- Static text functions. -------------------------------------------------------------
    static bool FindFileName(String const& path, int& start, int& length);
    /// The extension's start is its dot; its length runs from the dot to the end.
    static bool FindExtension(String const& path, int& start, int& length);
    static bool FindBaseName(String const& path, int& start, int& length);
    /// Text ends in a backslash or ':'.
    static bool sIsDirectory(String const& path);
    static bool UsesUNC(String const& path);
    /// Removes one trailing backslash except from "", "\" and a drive root "X:\".
    static void StripTrailingSeparatorIfNeeded(String& path);
    /// None of < > | : / \ " CR LF, and '*' '?' only when `allowWildcards`.
    static bool IsValidPathComponent(String& component, bool allowWildcards);
    /// As a component without wildcards, and neither "." nor "..".
    static bool IsValidNetworkName(String& name);
    static bool IsValidShareDirName(String& name);
    static bool IsCmdFileExtension(String const& extension);
    /// Index 0 to 3; any other index raises TE_PROGRAM_ERROR.
    static void GetCmdFileExtension(long index, String& extension);
    static unsigned short GetSeparatorChar();
    static bool IsSeparator(unsigned short ch);
    /// The process's current directory; false when the system cannot give it in 260 bytes.
    static bool GetCurrentDir(PathBase& out);
    /// The text for the system's long-path calls: \\srv\sh\f becomes \\?\UNC\srv\sh\f, any
    /// other text gets \\?\ in front. No check for a prefix already there: callers pass
    /// absolute backslash paths. Failing allocation raises TE_OUT_OF_MEMORY.
#if TEKIT_HAS_OLE
    static _bstr_t ConvertForLongPathCalls(String const& path);
#else
    static std::wstring ConvertForLongPathCalls(String const& path);
#endif
    /// The same conversion as narrow text.
    static void ConvertForLongPathCalls(String const& path, String& converted);
    /// The longest run of whole levels that both paths start with, compared ignoring case:
    /// C:\a\b\c and C:\a\B\d give C:\a\b, C:\ab and C:\abc give C:\; different roots give
    /// an empty path. The result is taken from `a` and has no trailing separator except a
    /// root's.
    static Path FindCommonPrefix(PathBase const& a, PathBase const& b);

    // ---- Classification. ----------------------------------------------------------------
    /// Drive-letter or UNC path.
    bool IsAbsolute() const;
    /// Has a root: drive letter, UNC, or a leading backslash.
    bool IsRooted() const;
    /// A root and no level: C:\, \\srv\share, \\srv\share\, \.
    bool IsRootDirectory() const;
    bool UsesDriveLetter() const;
    bool UsesUNC() const;
    /// The text ends in a separator, or the file system has a directory there.
    bool IsDirectory();

    // ---- Levels and prefixes. ---------------------------------------------------------------
    /// Levels after the root (C:\ has 0, C:\a\b.txt 2, C:\a\ 1, a\b 2).
    long GetNumLevels() const;
    /// Levels plus one for the root when there is one (C:\a\b has 3, a\b 2).
    long GetNumPathNameComponents() const;
    /// The first `count` components as counted by GetNumPathNameComponents (C:\a\b with 1
    /// gives C:\, with 2 C:\a); 0 or less gives "", more than there are the whole path. No
    /// trailing separator except a root's.
    void GetUpToCntPathNameComponents(long count, String& out) const;
    /// The root and the first `numLevels` levels. False, and `out` unchanged, when
    /// `numLevels` is negative or more than there are.
    bool GetPrefix(long numLevels, PathBase& out) const;
    /// The part of this path before `suffix` when this path ends with the levels of
    /// `suffix` (C:\a\b\c with b\c gives C:\a). A rooted suffix matches only the whole path
    /// (the prefix is then empty). False, and `prefix` unchanged, otherwise.
    bool GetPrefix(PathBase& suffix, PathBase& prefix) const;
    /// The levels of this path after `prefix` when this path starts with the root and levels
    /// of `prefix` (C:\a\b\c with C:\a gives b\c; equal paths give ""). False, and `suffix`
    /// unchanged, otherwise.
    bool GetSuffix(PathBase const& prefix, PathBase& suffix) const;
    /// This path is the root and leading levels of the absolute `path`; equal paths count
    /// only with `allowEqual`.
    bool IsPrefixOfAbsolutePath(PathBase const& path, bool allowEqual) const;
    /// This path's levels are the last levels of the absolute `path` (b\c.txt of C:\a\b\c.txt).
    /// A rooted path counts only when equal to `path`; an empty one never does.
    bool IsSuffixOfAbsolutePath(PathBase const& path) const;
    /// The root as a directory text: C:\, \\srv\share\, \, or empty for a relative path.
    Path GetRootDir() const;

    /// This directory holds `path` itself (C:\d holds C:\d\f, not C:\d\s\f). An entry of a
    /// library file that the directory holds counts as held, and `info` (may be null) says so.
    bool DirectoryContainsPath(PathBase const& path, VINamespaceInfo* info) const;
    /// As DirectoryContainsPath, at any depth below this directory.
    bool SubDirectoryContainsPath(PathBase const& path, VINamespaceInfo* info) const;

    // ---- Normalisation. ---------------------------------------------------------------------
    /// Every run of separators becomes one, except the two that open a UNC path.
    void CoalesceDoubleSeparators();
    /// Drops "." levels and resolves ".." against the levels before it, for a path that
    /// IsValid(false) accepts (others are left alone, result true). A ".." with nothing to
    /// resolve is kept on a relative path (and, counting as a kept level, a later ".."
    /// removes it) and skipped on an absolute one. The text is rewritten only when a "." was
    /// dropped or a ".." resolved, so C:\.. stays. False when a ".." had to be kept.
    bool CollapseDots();
    /// `out` is this path with double separators coalesced, dots collapsed, and each leading
    /// level that exists replaced by its name as stored on disk (same name ignoring case;
    /// on Windows the stored case). Relative paths stay relative.
    void GetCanonicalPath(PathBase& out) const;
    /// Replaces every %NAME% by the environment variable NAME. An undefined one stays as
    /// written when `keepUndefined`, and becomes empty otherwise; "%%" and a '%' without a
    /// partner stay as written.
    void ParseSysVariables(bool keepUndefined);

    // ---- Presentation. ------------------------------------------------------------------
    /// The path shortened to `maxChars` characters by replacing middle levels with "...":
    /// C:\first\...\last\file.txt. When the file name alone is too long, the file name.
    void GetAbbreviatedName(int maxChars, String& out) const;
#if defined(_WIN32)
    /// The same against a pixel width measured with `font` (null: the system font). When
    /// even the file name is too wide, `cutFileName` cuts it to fit with "..." at its end;
    /// otherwise the file name is given whole.
    void GetAbbreviatedNameToFit(long pixelWidth, String& out, HFONT font, bool cutFileName) const;
#endif
    /// C:\dir\f.c as /C/dir/f.c, \\srv\sh\f as //srv/sh/f; "" for a path that is not
    /// absolute. The text lives in one process-wide buffer that the next call overwrites.
    char const* GetCRXStylePathString() const;

    // ---- Validation. ------------------------------------------------------------------------
    /// Checks the Windows path rules in their order; the first failure gives false and its
    /// message (section "ERR_DESCR") in `errorText` when given.
    bool IsValid(bool allowWildcards, String* errorText) const;
    /// The following raise TE_INVALID_PATHNAME: with the IsValid message; with "Invalid path:
    /// '<path>'", two line feeds and that message; and that, or "The path is not absolute:
    /// '<path>'" for a valid relative path.
    void Validate(bool allowWildcards) const;
    void ValidateEx(bool allowWildcards) const;
    void ValidateAbsolute(bool allowWildcards) const;

    // ---- Module path. -------------------------------------------------------------------
    /// The file of `module` (null: the program); empty when the system cannot say. On POSIX a
    /// non-null `module` is any address inside the shared object.
    void SetUsingGetModuleFileName(HINSTANCE module);

    // ---- File operations. ---------------------------------------------------------------
    //
    // The text goes to the system unchanged. A failure raises the TEError converted from the
    // system's error, with the path in the message and the system call and its code as the
    // exception's API function and error code, and leaves the file system as it was.
    // Read-only files follow the Windows rules everywhere: they cannot be deleted, nor
    // replaced by a copy or a move (TE_ACCESS_DENIED).

    /// A file or directory exists there.
    bool Exists() const;
    std::uint64_t GetFileSize() const;
    /// In 100-nanosecond intervals since 1 January 1601 (UTC), as Windows FILETIME. Where the
    /// file system keeps no creation time, the last status change stands in for it.
    std::uint64_t GetFileTime(FileTimeOptions which) const;
    /// Setting the creation time raises TE_NOT_SUPPORTED where the system cannot.
    void SetFileTime(FileTimeOptions which, std::uint64_t fileTime) const;
    bool IsReadOnly() const;
    /// Sets or clears the read-only attribute (on POSIX: clears or gives write permission).
    void SetReadOnly(bool readOnly) const;
    /// Deletes a file or an empty directory.
    void Delete() const;
    /// Copies the file, with its contents, permissions and last write time, through a
    /// temporary file beside `destination` so that a failure leaves no partial copy.
    void CopyTo(PathBase const& destination, bool overwrite) const;
    /// Moves (renames) a file or directory; fails when `destination` exists.
    void MoveTo(PathBase const& destination) const;
    /// Moves, replacing an existing `destination` file.
    void MoveToReplacing(PathBase const& destination) const;
    /// Copies the file to the same path with ".bak" added (report.ini to report.ini.bak),
    /// replacing an older backup; `backup` receives its path.
    void MakeBackupCopy(PathBase& backup) const;
    /// Creates every missing directory of the path (all of it names a directory). Directories
    /// made before a failure are removed again. On Windows absolute paths go through the
    /// long-path calls, so they may exceed 260 characters.
    void MakeAllDirectoriesInPathNameLong() const;
    /// Adds the files matching this path's wildcard file name (* and ?, case ignored;
    /// "*.*" is every name) to `files`, with their directory as written here; directories
    /// only when `includeDirectories`. Returns how many matched; none is not an error, a
    /// missing directory is.
    long FindFilesEx(PathSet& files, bool includeDirectories) const;
    /// Creates a new empty file named `prefix`, six characters and ".tmp" in the directory of
    /// this path (this path itself when it ends in a separator), and sets `created` to it.
    void CreateUniqueTempFile(char const* prefix, PathBase& created) const;

protected:
    PathBase() = default;
    PathBase(PathBase const&) = default;

    virtual String& GetPathString() = 0;
    virtual String const& GetPathString() const = 0;

    /// Inserts a backslash after a drive letter not followed by one (C: and C:x).
    void DisallowRelativePathsWithDriveSpec();
    /// Moves the file name into `out` and removes it from this path.
    void ExtractFileComponent(PathBase& out);

private:
    /// Index where the first ordinary level starts (see the header comment).
    int GetTopLevel() const;
    /// From `start`, the characters spanned by `count` levels and the separators between
    /// them; false when fewer levels follow.
    bool GetNextLevels(int start, long count, int& length) const;
    /// End of the root and first level with its separator (what abbreviation keeps), or -1.
    int HeadEnd(int top) const;
    /// `other`'s text is the same path, ignoring case.
    bool EqualsText(char const* other) const;
};

} // namespace tekit
