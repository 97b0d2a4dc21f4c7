// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

/// Operations on the text of a path. They never look at the file system.
///
/// The elements of a path: a leading run of slashes is one element, "/", the root; then come the
/// names between runs of slashes. A trailing slash adds no element.
namespace fl::filesystem::detail
{

/// Length of the leading run of slashes; 0 for a relative path.
VCLINK_HOST_EXPORT unsigned long get_root_path_length(const ustring &path);

/// The first element of `path`, whose root has `root_length` code units; empty for an empty path.
VCLINK_HOST_EXPORT ustring extract_first_element(const ustring &path, unsigned long root_length);

/// Moves from the element that begins at `position` to the next one.
/// @param position in: where the current element begins; out: where the next one begins, or the
///        path's length when there is none
/// @param element out: the next element, empty when there is none
VCLINK_HOST_EXPORT void move_down(const ustring &path, unsigned long root_length,
                                  unsigned long &position, ustring &element);

/// Appends `name` to `path`, with exactly one separator between the two where both are non-empty;
/// one that either brings counts. An empty `name` changes nothing.
/// @param native whether the path is in native form; both forms separate with a slash here
VCLINK_HOST_EXPORT void concatenate_pathname(ustring &path, const ustring &name, bool native);

/// Replaces the extension of the last element (from its last dot on, a leading dot not counting)
/// by `extension`, adding a dot if `extension` has none; an empty one removes it.
VCLINK_HOST_EXPORT void replace_extension(ustring &path, const ustring &extension);

/// The path with forward slashes. Paths of this platform have them already, and a backslash is an
/// ordinary character of a name, so the text comes back as it is.
VCLINK_HOST_EXPORT ustring make_generic_form(const ustring &path);

/// The path with the platform's separators.
/// @param native whether `path` is in native form already
VCLINK_HOST_EXPORT ustring make_native_form(const ustring &path, bool native);

/// The path in the form in which the system's calls take it.
VCLINK_HOST_EXPORT ustring make_native_access_form(const ustring &path);

} // namespace fl::filesystem::detail
