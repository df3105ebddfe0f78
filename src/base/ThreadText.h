#pragma once

#include <atomic>
#include <string>

inline namespace korvex {

// An empty text for a scope. The thread keeps its memory for the next one, so a text that is not
// longer than earlier ones needs no memory from the heap (a tenth of the cost of a line to a file).
// Several may be in use at once, by logging inside logging or in a signal handler; the last one
// built is destroyed first. If no memory can be kept (out of memory, too many at once, a thread
// that is ending), it is an ordinary text.
class ThreadText {
  public:
    ThreadText() noexcept : _kept(take()) {}
    ThreadText(const ThreadText&) = delete;
    ThreadText& operator=(const ThreadText&) = delete;
    ~ThreadText() {
        if (_kept != nullptr) giveBack(*_kept);
    }

    std::string& operator*() { return _kept != nullptr ? *_kept : _own; }

    // Creates what all threads share, unless it exists.
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
