// Engine/Base/media.h: names of input devices, and file extensions of media formats.
//
//     ImageFormat format = imageFormatForExtension("JPEG");        // ImageFormat::JPEG
//     std::string extension = extensionForImageFormat(format);    // "jpg"

#ifndef TARN_ENGINE_BASE_MEDIA_H
#define TARN_ENGINE_BASE_MEDIA_H

#include <Engine/Base/export.h>

#include <iosfwd>
#include <string>
#include <vector>

namespace tarn::engine {

/// Image formats. Deliberate: 1 is not used, and has no extension.
enum class ImageFormat : unsigned char {
    Unknown = 0,
    JPEG = 2,
    PNG = 3,
};

/// Container formats of video and audio files.
enum class MediaContainer : unsigned char {
    Unknown = 0,
    MOV = 1,
    MP4 = 2,
    AIFF = 3,
    MP3 = 4,
    WAV = 5,
    M4A = 6,
};

/// Writes the enumerator, such as "JPEG", or "ImageFormat(1)" and "MediaContainer(77)" for
/// undefined ones.
TARN_API std::ostream& operator<<(std::ostream& stream, ImageFormat format);
TARN_API std::ostream& operator<<(std::ostream& stream, MediaContainer container);

/// The twelve kinds of on-screen keyboard, "Default" first. The list lives until the program ends.
TARN_API std::vector<std::string> const& keyboardTypes();

/// "Front-Facing" and "Rear-Facing". Returns a new list at every call.
TARN_API std::vector<std::string> cameraTypeNames();

/// The format of files with this extension, in any case, without a dot: "jpg", "jpeg" or "png".
/// `Unknown` for everything else.
TARN_API ImageFormat imageFormatForExtension(std::string extension);

/// The extension in lower case without a dot. Empty for everything but the named formats.
TARN_API std::string extensionForImageFormat(ImageFormat format);

/// The container of files with this extension, in any case, without a dot: "mov", "mp4", "aiff",
/// "mp3", "wav" or "m4a". `Unknown` for everything else.
TARN_API MediaContainer mediaContainerForExtension(std::string extension);

/// The extension in lower case without a dot. Empty for everything but the named containers.
TARN_API std::string extensionForMediaContainer(MediaContainer container);

}  // namespace tarn::engine

#endif
