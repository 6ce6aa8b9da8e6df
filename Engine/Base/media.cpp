#include <Engine/Base/media.h>

#include <Engine/Base/detail/immortal.h>

#include <array>
#include <cctype>
#include <cstddef>
#include <ostream>
#include <string_view>
#include <utility>

namespace tarn::engine {

namespace {

template <class Kind>
struct Extension {
    std::string_view text;
    Kind kind;
};

// In the order of comparison. The first extension of a format is the one that is returned.
constexpr std::array<Extension<ImageFormat>, 3> kImageExtensions{{
    {"jpg", ImageFormat::JPEG},
    {"jpeg", ImageFormat::JPEG},
    {"png", ImageFormat::PNG},
}};

constexpr std::array<Extension<MediaContainer>, 6> kMediaExtensions{{
    {"mov", MediaContainer::MOV},
    {"mp4", MediaContainer::MP4},
    {"mp3", MediaContainer::MP3},
    {"aiff", MediaContainer::AIFF},
    {"wav", MediaContainer::WAV},
    {"m4a", MediaContainer::M4A},
}};

template <class Kind, std::size_t count>
Kind kindForExtension(std::array<Extension<Kind>, count> const& table, std::string extension) {
    for (char& c : extension) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    for (Extension<Kind> const& row : table) {
        if (row.text == extension) return row.kind;
    }
    return Kind::Unknown;
}

template <class Kind, std::size_t count>
std::string extensionForKind(std::array<Extension<Kind>, count> const& table, Kind kind) {
    for (Extension<Kind> const& row : table) {
        if (row.kind == kind) return std::string(row.text);
    }
    return std::string();
}

}  // namespace

std::ostream& operator<<(std::ostream& stream, ImageFormat format) {
    switch (format) {
        case ImageFormat::Unknown: return stream << "Unknown";
        case ImageFormat::JPEG: return stream << "JPEG";
        case ImageFormat::PNG: return stream << "PNG";
    }
    return stream << "ImageFormat(" << int(format) << ")";
}

std::ostream& operator<<(std::ostream& stream, MediaContainer container) {
    switch (container) {
        case MediaContainer::Unknown: return stream << "Unknown";
        case MediaContainer::MOV: return stream << "MOV";
        case MediaContainer::MP4: return stream << "MP4";
        case MediaContainer::AIFF: return stream << "AIFF";
        case MediaContainer::MP3: return stream << "MP3";
        case MediaContainer::WAV: return stream << "WAV";
        case MediaContainer::M4A: return stream << "M4A";
    }
    return stream << "MediaContainer(" << int(container) << ")";
}

std::vector<std::string> const& keyboardTypes() {
    static detail::Immortal<std::vector<std::string>> const names(
        {"Default", "ASCII Only", "Numbers and Punctuation", "URL", "Number Pad", "Phone Pad",
         "Name or Phone", "Email Address", "Decimal Pad", "Twitter", "Web Search",
         "ASCII Numbers"});
    return names.value;
}

std::vector<std::string> cameraTypeNames() { return {"Front-Facing", "Rear-Facing"}; }

ImageFormat imageFormatForExtension(std::string extension) {
    return kindForExtension(kImageExtensions, std::move(extension));
}

std::string extensionForImageFormat(ImageFormat format) {
    return extensionForKind(kImageExtensions, format);
}

MediaContainer mediaContainerForExtension(std::string extension) {
    return kindForExtension(kMediaExtensions, std::move(extension));
}

std::string extensionForMediaContainer(MediaContainer container) {
    return extensionForKind(kMediaExtensions, container);
}

}  // namespace tarn::engine
