/// ImageDecoding: decodes image files for the factory. The base library decodes "mki" files. Java decodes all
/// other formats, after MKBitmapFactory_OnLoad has found its classes (see moka/graphics/jni/OnLoad.h). A
/// process without Java calls MKBitmapFactory_UseNativeDecoder() once; the base library then decodes all
/// formats.
#pragma once

#include "moka/base/Export.h"

namespace Moka {

class Bitmap;
class String;

/// Sets *extension to the part of path after the last ".", or to the whole path if it has none. Returns false
/// if an argument is null.
MOKA_API bool GetExtensionByFile(String const* path, String* extension);

/// True if the extension of path equals `extension` exactly, including case. False if an argument is null.
MOKA_API bool CompareExtensionByFile(String const* path, char const* extension);

/// Makes later calls decode files without Java. Off by default. Any thread.
MOKA_API void MKBitmapFactory_UseNativeDecoder();

/// Decodes a file other than "mki" and scales it to width x height, unless one of them is 0. The caller owns
/// the result. Logs an error and returns null if the file cannot be decoded or no decoder is set. Any thread:
/// the call attaches it to the Java VM if necessary.
MOKA_API Bitmap* CreateBitmapJNI(String const* path, int width, int height);

namespace detail {
/// The decoder that CreateBitmapJNI calls; null until one is set.
using JavaDecoder = Bitmap* (*)(String const* path, int width, int height);
void SetJavaDecoder(JavaDecoder decoder);

/// Decodes a file of any format, chosen by its extension.
Bitmap* DecodeFile(String const* path, int width, int height);
} // namespace detail

} // namespace Moka
