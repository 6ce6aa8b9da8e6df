#include <Engine/Base/media.h>

#include <gtest/gtest.h>

#include <sstream>

using namespace tarn::engine;

TEST(KeyboardTypes, AreTheSameListOfTwelve) {
    EXPECT_EQ(keyboardTypes(),
              (std::vector<std::string>{"Default", "ASCII Only", "Numbers and Punctuation", "URL",
                                        "Number Pad", "Phone Pad", "Name or Phone", "Email Address",
                                        "Decimal Pad", "Twitter", "Web Search", "ASCII Numbers"}));
    EXPECT_EQ(&keyboardTypes(), &keyboardTypes());
}

TEST(CameraTypeNames, AreANewListOfTwo) {
    std::vector<std::string> names = cameraTypeNames();
    EXPECT_EQ(names, (std::vector<std::string>{"Front-Facing", "Rear-Facing"}));
    names.clear();
    EXPECT_EQ(cameraTypeNames().size(), 2u);
}

TEST(ImageFormat, IsFoundByItsExtensionInAnyCase) {
    struct Row {
        std::string extension;
        ImageFormat format;
        int number;
    };
    for (Row const& row : {
             Row{"jpg", ImageFormat::JPEG, 2},
             Row{"jpeg", ImageFormat::JPEG, 2},
             Row{"JPEG", ImageFormat::JPEG, 2},
             Row{"Jpg", ImageFormat::JPEG, 2},
             Row{"png", ImageFormat::PNG, 3},
             Row{"PNG", ImageFormat::PNG, 3},
             Row{"gif", ImageFormat::Unknown, 0},
             Row{"", ImageFormat::Unknown, 0},
             Row{".png", ImageFormat::Unknown, 0},
             Row{"a.png", ImageFormat::Unknown, 0},
             Row{"png ", ImageFormat::Unknown, 0},
             Row{"jp\xc9g", ImageFormat::Unknown, 0},
             Row{"mov", ImageFormat::Unknown, 0},
             Row{std::string("png\0", 4), ImageFormat::Unknown, 0},
         }) {
        SCOPED_TRACE(row.extension);
        EXPECT_EQ(imageFormatForExtension(row.extension), row.format);
        EXPECT_EQ(static_cast<int>(row.format), row.number);
    }
    static_assert(std::is_same_v<std::underlying_type_t<ImageFormat>, unsigned char>);
}

TEST(ImageFormat, HasOneExtension) {
    EXPECT_EQ(extensionForImageFormat(ImageFormat::JPEG), "jpg");
    EXPECT_EQ(extensionForImageFormat(ImageFormat::PNG), "png");
    for (int number : {0, 1, 4, 5, 255}) {
        EXPECT_EQ(extensionForImageFormat(ImageFormat(number)), "") << number;
    }
}

TEST(MediaContainer, IsFoundByItsExtensionInAnyCase) {
    struct Row {
        std::string extension;
        MediaContainer container;
        int number;
    };
    for (Row const& row : {
             Row{"mov", MediaContainer::MOV, 1},
             Row{"mp4", MediaContainer::MP4, 2},
             Row{"aiff", MediaContainer::AIFF, 3},
             Row{"AIFF", MediaContainer::AIFF, 3},
             Row{"mp3", MediaContainer::MP3, 4},
             Row{"Mp3", MediaContainer::MP3, 4},
             Row{"wav", MediaContainer::WAV, 5},
             Row{"m4a", MediaContainer::M4A, 6},
             Row{"M4A", MediaContainer::M4A, 6},
             Row{"aif", MediaContainer::Unknown, 0},
             Row{".mov", MediaContainer::Unknown, 0},
             Row{"", MediaContainer::Unknown, 0},
             Row{"png", MediaContainer::Unknown, 0},
         }) {
        SCOPED_TRACE(row.extension);
        EXPECT_EQ(mediaContainerForExtension(row.extension), row.container);
        EXPECT_EQ(static_cast<int>(row.container), row.number);
    }
    static_assert(std::is_same_v<std::underlying_type_t<MediaContainer>, unsigned char>);
}

TEST(MediaContainer, HasOneExtension) {
    for (char const* extension : {"mov", "mp4", "aiff", "mp3", "wav", "m4a"}) {
        EXPECT_EQ(extensionForMediaContainer(mediaContainerForExtension(extension)), extension);
    }
    for (int number : {0, 7, 255}) {
        EXPECT_EQ(extensionForMediaContainer(MediaContainer(number)), "") << number;
    }
}

TEST(Media, FormatsArePrintedByEnumerator) {
    std::ostringstream formats;
    for (int number = 0; number < 5; ++number) formats << ImageFormat(number) << " ";
    formats << ImageFormat(255);
    EXPECT_EQ(formats.str(), "Unknown ImageFormat(1) JPEG PNG ImageFormat(4) ImageFormat(255)");
    std::ostringstream containers;
    for (int number = 0; number < 8; ++number) containers << MediaContainer(number) << " ";
    containers << MediaContainer(255);
    EXPECT_EQ(containers.str(),
              "Unknown MOV MP4 AIFF MP3 WAV M4A MediaContainer(7) MediaContainer(255)");
}
