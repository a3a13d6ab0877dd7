// SPDX-License-Identifier: MIT
// Tells what a file is, and draws a picture of its middle.
// usage: example-describe FILE PICTURE
#include <filesystem>
#include <iostream>
#include <qnsmedia/Discoverer.h>
#include <qnsmedia/Error.h>

int main(int argc, char** argv) {
    if (argc != 3)
        return 2;
    try {
        qnsmedia::Connection connection;
        qnsmedia::Discoverer discoverer(connection);
        discoverer.open(std::filesystem::absolute(argv[1])).get();
        const qnsmedia::Metadata metadata = discoverer.metadata().get();
        for (const auto& [name, value] : metadata.tags)
            std::cout << name << ": " << value << '\n';
        for (const qnsmedia::VideoStream& video : metadata.video)
            std::cout << video.description << ", " << video.width << "x" << video.height << '\n';
        for (const qnsmedia::AudioStream& audio : metadata.audio)
            std::cout << audio.description << ", " << audio.sampleRate << " Hz\n";
        discoverer.makeImage(metadata.duration / 2, 160, 0, std::filesystem::absolute(argv[2]))
            .get();
        return 0;
    } catch (const qnsmedia::Error& error) {
        std::cerr << error.what() << '\n';
        return 1;
    }
}
