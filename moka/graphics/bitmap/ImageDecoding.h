/// ImageDecoding: how the factory turns a file into pixels. "mki" files go to the base library's codec. Every
/// other format is decoded by the platform's Java side once MKBitmapFactory_OnLoad has found it (see
/// moka/graphics/jni/OnLoad.h), or, in a process without Java that says so once, by the base library as well.
#pragma once

#include "moka/base/Export.h"

namespace Moka {

class Bitmap;
class String;

/// The part after the last "." of path; the whole path without one. False when either is null.
MOKA_API bool GetExtensionByFile(String const* path, String* extension);

/// Whether that is exactly extension; case matters. False when either is null.
MOKA_API bool CompareExtensionByFile(String const* path, char const* extension);

/// From now on files are decoded without Java. For hosts that have none; off by default. Any thread.
MOKA_API void MKBitmapFactory_UseNativeDecoder();

/// Decodes a file other than "mki": scaled to width x height unless one of them is 0. Owned by the caller;
/// null, with an error line, when it cannot be decoded or there is nothing to decode it with. Any thread:
/// Java gets to know it for the call.
MOKA_API Bitmap* CreateBitmapJNI(String const* path, int width, int height);

namespace detail {
/// The decoder that CreateBitmapJNI calls; null until one is set.
using JavaDecoder = Bitmap* (*)(String const* path, int width, int height);
void SetJavaDecoder(JavaDecoder decoder);

/// Any file, by its extension.
Bitmap* DecodeFile(String const* path, int width, int height);
} // namespace detail

} // namespace Moka
