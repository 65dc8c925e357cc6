// The interrupt check, with the two ways a host stops work: the cancel flag and a handler.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "exRenderCancelled.h"
#include "pxRequestMgr.h"

namespace Zr {
namespace {

// Counts checks and cancels once a budget of them is spent: a host's progress meter and stop
// button in one.
class CountingHandler : public PxInterruptHandler {
public:
    explicit CountingHandler(int budget) : _budget(budget) {}
    void onInterruptCheck() override {
        if (++_calls > _budget) throw ExRenderCancelled("stopped by the host");
    }
    int _budget;
    int _calls = 0;
};

// Stands for a rasteriser: one check per scanline; returns the scanlines finished.
int drawRows(PxRequestMgr& mgr, int rows) {
    int done = 0;
    for (int y = 0; y < rows; ++y) {
        mgr.checkInterrupt();
        ++done;
    }
    return done;
}

TEST(PxRequestMgr, WithNothingInstalledEveryCheckReturns) {
    PxRequestMgr mgr;
    EXPECT_EQ(drawRows(mgr, 1000), 1000);
    EXPECT_FALSE(mgr.isCancelRequested());
    EXPECT_TRUE(mgr.getInterruptHandler().isNull());
}

TEST(PxRequestMgr, TheCancelFlagStopsEveryCheckUntilCleared) {
    PxRequestMgr mgr;
    mgr.requestCancel();
    EXPECT_TRUE(mgr.isCancelRequested());
    for (int attempt = 0; attempt < 3; ++attempt) {
        EXPECT_THROW(drawRows(mgr, 10), ExRenderCancelled);
    }
    // The failure is one of the system's: a host catching ExBase catches it.
    try {
        mgr.checkInterrupt();
        FAIL() << "no failure";
    } catch (const ExBase& failure) {
        EXPECT_EQ(failure.getMessage(), "render cancelled");
    }
    mgr.clearCancel();
    EXPECT_EQ(drawRows(mgr, 10), 10);
}

TEST(PxRequestMgr, AHandlerSeesEveryCheckAndItsFailureLeavesThroughTheCheck) {
    PxRequestMgr mgr;
    const RCShdPtr<CountingHandler> handler = makeShared<CountingHandler>(25);
    mgr.setInterruptHandler(handler);
    EXPECT_EQ(mgr.getInterruptHandler().get(), handler.get());
    EXPECT_EQ(drawRows(mgr, 20), 20);
    EXPECT_EQ(handler->_calls, 20);

    int finished = 0;
    try {
        for (int y = 0; y < 100; ++y) {
            mgr.checkInterrupt();
            ++finished;
        }
    } catch (const ExRenderCancelled& failure) {
        EXPECT_EQ(failure.getMessage(), "stopped by the host");
    }
    EXPECT_EQ(finished, 5);  // the budget of 25 ran out on the 26th check

    mgr.setInterruptHandler(nullptr);
    EXPECT_EQ(drawRows(mgr, 50), 50);
    EXPECT_EQ(handler->_calls, 26);  // no calls after removal
    // The manager held a reference while installed and dropped it on removal.
    EXPECT_EQ(handler->getReferenceCount(), 1);
}

TEST(PxRequestMgr, TheCancelFlagTakesPrecedenceOverTheHandler) {
    PxRequestMgr mgr;
    const RCShdPtr<CountingHandler> handler = makeShared<CountingHandler>(1000);
    mgr.setInterruptHandler(handler);
    mgr.requestCancel();
    EXPECT_THROW(mgr.checkInterrupt(), ExRenderCancelled);
    EXPECT_EQ(handler->_calls, 0);
    mgr.clearCancel();
    mgr.checkInterrupt();
    EXPECT_EQ(handler->_calls, 1);
}

TEST(PxRequestMgr, ACancelFromAnotherThreadStopsTheWork) {
    PxRequestMgr mgr;
    std::atomic<bool> started{false};
    std::atomic<bool> cancelled{false};
    std::thread worker([&] {
        try {
            for (;;) {
                mgr.checkInterrupt();
                started.store(true);
            }
        } catch (const ExRenderCancelled&) {
            cancelled.store(true);
        }
    });
    while (!started.load()) std::this_thread::yield();
    mgr.requestCancel();
    worker.join();
    EXPECT_TRUE(cancelled.load());
}

TEST(PxRequestMgr, TheProcessWideInstanceIsOne) {
    PxRequestMgr* first = PxRequestMgr::getInstance();
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(PxRequestMgr::getInstance(), first);
    first->checkInterrupt();  // nothing installed by default
}

}  // namespace
}  // namespace Zr
