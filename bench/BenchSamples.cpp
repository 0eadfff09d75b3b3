// BenchSamples.cpp: the words of each script and how they are joined.

#include "BenchSamples.h"

#include <random>
#include <span>
#include <string_view>

namespace bench {

namespace {

using Words = std::span<std::string_view const>;

constexpr std::string_view kAsciiWords[] = {"the",     "course", "opens",  "with",     "a",      "short", "question",
                                            "about",   "safety", "at",     "work,",    "and",    "each",  "answer",
                                            "leads",   "to",     "its",    "own",      "page.",  "Click", "Next",
                                            "when",    "you",    "have",   "finished", "(about", "10",    "minutes)",
                                            "chapter", "of",     "slides", "in",       "order.", "Then"};

constexpr std::string_view kLatinWords[] = {
    "Größe",     "der",       "Schriftart,", "für",    "jede",   "Übung", "élève",   "à",     "l’école", "où",
    "ça",        "commence.", "número",      "página", "año",    "señal", "también", "más",   "příliš",  "kůň",
    "žluťoučký", "je",        "lekce",       "Œuvre",  "smørre", "brød",  "på",      "ærlig", "façade",  "naïve"};

constexpr std::string_view kCyrillicWords[] = {"курс",    "начинается", "с",       "короткого", "вопроса,", "и",
                                               "каждый",  "ответ",      "ведёт",   "на",        "свою",     "страницу.",
                                               "Нажмите", "Далее",      "когда",   "закончите", "раздел",   "урока",
                                               "слайд",   "в",          "порядке", "тест",      "проверка", "знаний."};

constexpr std::string_view kCjkWords[] = {"课程", "从",       "一个", "关于",     "安全", "的",       "问题", "开始",
                                          "，",   "每个",     "答案", "都",       "有",   "自己",     "的",   "页面",
                                          "。",   "「次へ」", "を",   "クリック", "して", "ください", "。",   "学習",
                                          "内容", "の",       "確認", "テスト",   "、",   "章"};

constexpr std::string_view kEmojiWords[] = {"😀",   "🎓📚", "👍",   "🚀🚀🚀", "🧑‍🏫", "✅",
                                            "❤️",    "🎉🎊", "🤔💡", "📈📊📉", "🔥",          "🖼️",
                                            "🧪🔬", "😂😂", "🌍",   "🏆🥇",   "🎧🎬",        "👩‍💻"};

constexpr Words WordsOf(Script script) {
    switch (script) {
    case Script::kAscii:
        return kAsciiWords;
    case Script::kLatin:
        return kLatinWords;
    case Script::kCyrillic:
        return kCyrillicWords;
    case Script::kCjk:
        return kCjkWords;
    case Script::kEmoji:
        return kEmojiWords;
    }
    return {};
}

} // namespace

char const *NameOf(Script script) {
    constexpr char const *kNames[] = {"ascii", "latin", "cyrillic", "cjk", "emoji"};
    return kNames[static_cast<std::size_t>(script)];
}

std::string SampleText(Script script, std::size_t size) {
    Words const words = WordsOf(script);
    bool const spaced = script != Script::kCjk;
    std::minstd_rand random(20240501U);
    std::string text;
    text.reserve(size);
    for (;;) {
        std::string_view const word = words[random() % words.size()];
        if (text.size() + word.size() + 1 > size) {
            text.append(size - text.size(), ' ');
            return text;
        }
        text += word;
        if (spaced) {
            text += ' ';
        }
    }
}

} // namespace bench
