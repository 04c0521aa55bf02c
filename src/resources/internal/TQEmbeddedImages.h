#pragma once
// The PNG files of resources/images as compiled into the library (generated at build time by
// cmake/EmbedImages.cmake). Internal to BNImage.cpp and its tests.

#include <cstddef>
#include <span>

struct TQEmbeddedImageFile {
    const char* fileName;  // "Name.png" or "Name@2x.png"
    const unsigned char* bytes;
    std::size_t size;
};

// Every embedded file, sorted by file name.
std::span<const TQEmbeddedImageFile> TQEmbeddedImageFiles();
