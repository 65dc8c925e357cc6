#include "zrRenderProgress.h"

#include <csignal>
#include <cstdio>

#include "exRenderCancelled.h"

namespace Zr {

namespace {

std::atomic<bool> interruptedFlag{false};
static_assert(std::atomic<bool>::is_always_lock_free, "the signal handler needs a lock-free flag");

extern "C" void onInterrupt(int) {
    interruptedFlag.store(true, std::memory_order_relaxed);
    // A second Ctrl-C is not polite any more: it ends the process the usual way.
    std::signal(SIGINT, SIG_DFL);
}

}  // namespace

void ZrRenderProgress::catchInterrupts() { std::signal(SIGINT, onInterrupt); }

bool ZrRenderProgress::interrupted() { return interruptedFlag.load(std::memory_order_relaxed); }

void ZrRenderProgress::onInterruptCheck() {
    if (interrupted()) throw ExRenderCancelled();
    // A look at the clock every few hundred scanlines keeps the check cheap.
    if (_showBar && (_checks.fetch_add(1, std::memory_order_relaxed) & 255u) == 0) draw(false);
}

void ZrRenderProgress::startFrame(int frame, int frameCount, int tileCount) {
    const std::lock_guard<std::mutex> hold(_drawing);
    _frame = frame;
    _frameCount = frameCount;
    _tileCount = tileCount > 0 ? tileCount : 1;
    _tilesDone = 0;
}

void ZrRenderProgress::tileDone() {
    ++_tilesDone;
    if (_showBar) draw(false);
}

void ZrRenderProgress::draw(bool force) {
    const std::unique_lock<std::mutex> hold(_drawing, std::try_to_lock);
    if (!hold.owns_lock()) return;
    const auto now = std::chrono::steady_clock::now();
    if (!force && _drawn && now - _lastDrawn < std::chrono::milliseconds(100)) return;
    _lastDrawn = now;
    _drawn = true;
    constexpr int width = 40;
    const int done = std::min(_tilesDone.load(), _tileCount);
    const int filled = done * width / _tileCount;
    char bar[width + 1];
    for (int i = 0; i < width; ++i) bar[i] = i < filled ? '#' : '-';
    bar[width] = '\0';
    if (_frameCount > 1)
        std::fprintf(stderr, "\rframe %d/%d [%s] %3d%%", _frame, _frameCount, bar, done * 100 / _tileCount);
    else
        std::fprintf(stderr, "\r[%s] %3d%%", bar, done * 100 / _tileCount);
    std::fflush(stderr);
}

void ZrRenderProgress::finish() {
    const std::lock_guard<std::mutex> hold(_drawing);
    if (_drawn) std::fprintf(stderr, "\r\033[K");
    std::fflush(stderr);
    _drawn = false;
}

}  // namespace Zr
