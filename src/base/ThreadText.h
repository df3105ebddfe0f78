#pragma once

#include <atomic>
#include <string>

inline namespace korvex {

// An empty text for the length of a scope whose memory the thread keeps for the next one, so that a
// text no longer than its forerunners takes none from the heap (a tenth of what a line to a file
// costs). Several may be in use at once, the last one built being the first to go: by logging
// inside logging, or in a signal handler. Where nothing can be kept (no memory, too many at once, a
// thread that is ending) it is a text like any other.
class ThreadText {
  public:
    ThreadText() noexcept : _kept(take()) {}
    ThreadText(const ThreadText&) = delete;
    ThreadText& operator=(const ThreadText&) = delete;
    ~ThreadText() {
        if (_kept != nullptr) giveBack(*_kept);
    }

    std::string& operator*() { return _kept != nullptr ? *_kept : _own; }

    // Makes what all threads share, if it is not there yet.
    static bool makeKey() noexcept;

  private:
    static constexpr int kTexts = 4;  // a message and its line, and those of a report

    struct Texts {
        std::string text[kTexts];
        int used = 0;
    };

    static std::string* take() noexcept {
        Texts* const texts = _texts != nullptr ? _texts : makeTexts();
        if (texts == nullptr || texts->used == kTexts) return nullptr;
        std::string* const taken = &texts->text[texts->used++];
        // A signal handler must not find a text in use that is not counted yet, or any more.
        std::atomic_signal_fence(std::memory_order_seq_cst);
        return taken;
    }
    static void giveBack(std::string& text) {
        if (text.capacity() > kMostKept) std::string().swap(text);
        text.clear();
        std::atomic_signal_fence(std::memory_order_seq_cst);
        --_texts->used;
    }
    static Texts* makeTexts() noexcept;
    static void dropTexts(void* dropped);

    static constexpr std::size_t kMostKept = 16384;  // bytes; what grew beyond is freed

    // Plain values need no construction and no destruction, so they work in exit handlers and in
    // ending threads. The main thread's texts are never freed.
    static inline thread_local Texts* _texts = nullptr;
    static inline thread_local bool _nothingKept = false;

    std::string* const _kept;
    std::string _own;
};

}  // namespace korvex
