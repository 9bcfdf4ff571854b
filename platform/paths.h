// Pieces of paths, for the PC and the device alike: both use "\" between components.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace orvane {

// Both sides keep paths in buffers of this many characters, the terminator included: MAX_PATH.
inline constexpr std::size_t kPathBufferChars = 260;

// Whether a path of that many characters fits a path buffer.
constexpr bool FitsPathBuffer(std::size_t characters) {
    return characters < kPathBufferChars;
}

// The path without any "\" at its end. The root "\" becomes empty.
std::wstring_view WithoutTrailingBackslashes(std::wstring_view path);

// The path with exactly the "\" at its end that it has, or one more if it has none; an empty path gives "\".
std::wstring WithTrailingBackslash(std::wstring_view path);

// `folder`, one "\" unless the folder ends in one already, and `name`.
std::wstring JoinPath(std::wstring_view folder, std::wstring_view name);

// The path without trailing "\", cut before its last "\"; empty when there is none.
std::wstring_view ParentPath(std::wstring_view path);

// Whether the path is a network's root, "\\server" or "\\server\share" with or without "\" at its end: no
// folder that a program could make.
bool IsUncRoot(std::wstring_view path);

// Whether the text names a folder of the PC. An empty one, and "\" alone, would come to mean the root of
// whatever drive is the current one; who means the root of a drive names the drive.
bool IsPcFolderNamed(std::wstring_view folder);

// Whether `name` can be one component of a path at all: not empty, not "." or "..", free of control
// characters and of < > : " / \ | ? *. Names listed by a device are not trusted before they pass this.
bool IsPathComponent(std::wstring_view name);

// Whether `name` can be that of an ordinary file or folder on the PC: a path component that does not end in a
// dot or a blank (the PC would strip it and mean another file) and is not one of the PC's device names (CON,
// NUL, COM1 ..., with any extension).
bool IsSafePcName(std::wstring_view name);

// Whether every component of `relative` (with or without a leading "\") is such a name.
bool IsSafePcRelativePath(std::wstring_view relative);

}  // namespace orvane
