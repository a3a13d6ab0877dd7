// SPDX-License-Identifier: MIT
#include "tests/engine_double/MetadataText.h"

#include <cstddef>
#include <utility>

#include "tests/engine_double/ScriptText.h"

using LibMediaPlayer::MediaMetaInfo;

namespace script {

namespace {

/** Both directions go through the same list of fields. */
template<typename Visitor, typename Info>
void visitSystem(Visitor& visit, Info& info) {
    visit(info.mediaType);
    visit(info.tags);
    visit(info.seekable);
    visit(info.live);
    visit(info.duration);
}

template<typename Visitor, typename Info>
void visitVideo(Visitor& visit, Info& info) {
    visit(info.mediaType);
    visit(info.description);
    for (auto* number :
         {&info.width, &info.height, &info.depth, &info.frameRateNumerator,
          &info.frameRateDenominator, &info.pixelAspectNumerator, &info.pixelAspectDenominator})
        visit(*number);
    visit(info.interlaced);
    visit(info.bitRate);
    visit(info.maxBitRate);
    visit(info.stillPicture);
}

template<typename Visitor, typename Info>
void visitAudio(Visitor& visit, Info& info) {
    visit(info.mediaType);
    visit(info.description);
    for (auto* number :
         {&info.channels, &info.sampleRate, &info.depth, &info.bitRate, &info.maxBitRate})
        visit(*number);
}

class Writer {
public:
    explicit Writer(std::string line) : mLine(std::move(line)) {}

    void operator()(const std::string& text) {
        word(quoted(std::wstring(text.begin(), text.end())));
    }
    void operator()(const std::wstring& text) { word(quoted(text)); }
    template<typename Number>
    void operator()(const Number& number) {
        word(std::to_string(number));
    }
    void word(const std::string& text) { mLine += ' ' + text; }

    [[nodiscard]] const std::string& line() const { return mLine; }

private:
    std::string mLine;
};

class Reader {
public:
    Reader(const std::vector<std::wstring>& words, std::size_t first)
        : mWords(words), mNext(first) {}

    void operator()(std::string& text) {
        const std::wstring wide = word();
        text.clear();
        for (const wchar_t character : wide)
            text += static_cast<char>(character);
    }
    void operator()(std::wstring& text) { text = word(); }
    void operator()(bool& flag) { flag = number(word()) != 0; }
    template<typename Number>
    void operator()(Number& value) {
        value = static_cast<Number>(number(word()));
    }

    [[nodiscard]] bool isAtEnd() const { return mNext >= mWords.size(); }
    std::wstring word() { return isAtEnd() ? std::wstring() : mWords[mNext++]; }

private:
    const std::vector<std::wstring>& mWords;
    std::size_t mNext;
};

} // namespace

std::string metadataAnswer(int result, const MediaMetaInfo& info) {
    Writer write("return " + std::to_string(result));
    visitSystem(write, info.system);
    if (info.videoCount > 0) {
        write.word("video");
        visitVideo(write, info.video);
    }
    for (std::size_t i = 0; i < static_cast<std::size_t>(info.audioCount); ++i) {
        write.word("audio");
        visitAudio(write, info.audio.at(i));
    }
    return write.line();
}

MediaMetaInfo metadataIn(const std::vector<std::wstring>& answer) {
    MediaMetaInfo info;
    Reader read(answer, 2);
    if (read.isAtEnd())
        return info;
    visitSystem(read, info.system);
    while (!read.isAtEnd()) {
        if (read.word() == L"video") {
            visitVideo(read, info.video);
            info.videoCount = 1;
        } else {
            visitAudio(read, info.audio.at(static_cast<std::size_t>(info.audioCount++)));
        }
    }
    return info;
}

} // namespace script
