// Whole files in and out of the tool: the project file, the floorplan's constraint files and the
// timing reports all go through these two.
//
// A write never leaves a part of a file behind. The text goes into a new temporary file in the
// target's folder, made with mkostemp (O_CREAT | O_EXCL: it never opens a file or a symbolic link
// that is there already, so nothing planted beside the target is written through). The temporary
// gets the target's permissions (a new file 0666 less the umask), is synced and renamed over the
// target, and the folder is synced last. Readers see the old file or the new one; a failed write
// removes the temporary and leaves the target as it was.
//
// A target that is a symbolic link stays one: the write goes to the file the link leads to, as
// editors do, so that a project kept elsewhere and linked into a folder is saved where it lives.
#pragma once

#include <string>
#include <string_view>

namespace kelmartool {

// The content of a regular file. False with `error` saying why (without the file's name, which
// the caller puts in its own words).
bool ReadTextFile(const std::string& file, std::string& text, std::string& error);

// Replaces the content of `file` with `text` as described above. False with `error` saying why;
// the file is then as it was and no temporary is left.
bool WriteTextFile(const std::string& file, std::string_view text, std::string& error);

}  // namespace kelmartool
