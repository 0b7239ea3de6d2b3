// Posting, reading and looking for messages.

#include <gtest/gtest.h>

#include "platform/sync_kit.h"
#include "platform/thread_kit.h"

namespace {

using sync_kit::HandleValue;
using sync_kit::Load;
using sync_kit::OnAnotherThread;
using sync_kit::Worker;
using thread_kit::OwnQueue;
using thread_kit::Thread;

MSG Unread() {
    return MSG{HandleValue(0x11), 0x22, 0x33, 0x44};
}

// Takes the oldest message and compares it; the window's field is never written.
void ExpectMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    MSG read = Unread();
    EXPECT_EQ(GetMessage(&read, nullptr, 0, 0), 1);
    EXPECT_EQ(read.hwnd, HandleValue(0x11));
    EXPECT_EQ(read.message, message);
    EXPECT_EQ(read.wParam, wParam);
    EXPECT_EQ(read.lParam, lParam);
}

bool IsEmpty() {
    MSG message = Unread();
    return PeekMessage(&message, nullptr, 0, 0, PM_NOREMOVE) == 0;
}

TEST(Message, ArrivesWhole) {
    const OwnQueue queue;
    EXPECT_EQ(PostThreadMessage(queue.id(), 0xFFFFFFFF, 0xFEDCBA98, -5), 1);
    ExpectMessage(0xFFFFFFFF, 0xFEDCBA98, -5);
}

TEST(Message, CarriesAnAddress) {
    const OwnQueue queue;
    int object = 0;
    EXPECT_EQ(PostThreadMessage(queue.id(), 1, 0, reinterpret_cast<LPARAM>(&object)), 1);
    ExpectMessage(1, 0, reinterpret_cast<LPARAM>(&object));
}

TEST(Message, ComesInTheOrderOfPosting) {
    const OwnQueue queue;
    for (UINT i = 0; i < 100; ++i)
        EXPECT_EQ(PostThreadMessage(queue.id(), 1000 + i, i, 0), 1);
    for (UINT i = 0; i < 100; ++i)
        ExpectMessage(1000 + i, i, 0);
    EXPECT_TRUE(IsEmpty());
}

TEST(Message, FiltersAreNotLookedAt) {
    const OwnQueue queue;
    PostThreadMessage(queue.id(), 500, 0, 0);
    PostThreadMessage(queue.id(), 501, 0, 0);
    MSG message = Unread();
    EXPECT_EQ(PeekMessage(&message, HandleValue(9), 1, 2, PM_REMOVE), 1);
    EXPECT_EQ(message.message, 500u);
    EXPECT_EQ(GetMessage(&message, HandleValue(9), 1, 2), 1);
    EXPECT_EQ(message.message, 501u);
}

// 1024 slots, of which 1005 can be filled. Clients rely on the refusal: kept.
TEST(Message, Of1006PostsTheLastIsRefused) {
    const OwnQueue queue;
    for (UINT i = 0; i < 1005; ++i)
        ASSERT_EQ(PostThreadMessage(queue.id(), 100 + i, 0, 0), 1) << i;
    EXPECT_EQ(PostThreadMessage(queue.id(), 1, 0, 0), 0);
    EXPECT_EQ(static_cast<CLinuxThread*>(queue.id())->PostMessage(1, 0, 0), 0);
    ExpectMessage(100, 0, 0);
    EXPECT_EQ(PostThreadMessage(queue.id(), 7777, 0, 0), 1) << "one read, one more fits";
    EXPECT_EQ(PostThreadMessage(queue.id(), 1, 0, 0), 0);
    for (UINT i = 1; i < 1005; ++i)
        ExpectMessage(100 + i, 0, 0);
    ExpectMessage(7777, 0, 0);
    EXPECT_TRUE(IsEmpty());
}

TEST(Message, LimitIsExactWithManyPosters) {
    const OwnQueue queue;
    std::atomic<int> taken{0};
    {
        std::vector<std::unique_ptr<Worker>> posters;
        for (int i = 0; i < 8; ++i) {
            posters.push_back(std::make_unique<Worker>([&] {
                for (int k = 0; k < 200; ++k)
                    taken += PostThreadMessage(queue.id(), 1, 0, 0);
            }));
        }
    }
    EXPECT_EQ(taken, 1005);
}

TEST(Message, PostIsRefusedWithoutAReceiver) {
    EXPECT_EQ(PostThreadMessage(nullptr, 1, 0, 0), 0);
    EXPECT_EQ(PostThreadMessage(INVALID_HANDLE_VALUE, 1, 0, 0), 0);
}

TEST(Message, PostToAClosedThreadIsRefused) {
    HANDLE closed = nullptr;
    {
        const OwnQueue queue;
        closed = queue.id();
        EXPECT_EQ(PostThreadMessage(closed, 1, 0, 0), 1);
    }
    EXPECT_EQ(PostThreadMessage(closed, 1, 0, 0), 0);
}

TEST(Message, ThreadBesideTheTableReceivesToo) {
    unsigned long id = 0;
    const HANDLE thread = _beginthreadex(
        nullptr, 0, [](void*) { return 0u; }, nullptr, 0, &id);
    EXPECT_EQ(PostThreadMessage(thread, 4, 5, 6), 1);
    ExpectMessage(4, 5, 6);
    WaitForSingleObject(thread, INFINITE);
    CloseHandle(thread);
}

TEST(Message, ReadingNeedsACurrentThread) {
    OnAnotherThread([] {
        MSG message = Unread();
        EXPECT_EQ(GetMessage(&message, nullptr, 0, 0), 0);
        EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, PM_REMOVE), 0);
        EXPECT_EQ(message.message, 0x22u);
    });
}

TEST(Message, ReadingAfterTheCurrentThreadIsClosedGivesNothing) {
    OnAnotherThread([] {
        { const OwnQueue queue; }
        MSG message = Unread();
        EXPECT_EQ(GetMessage(&message, nullptr, 0, 0), 0);
        EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, PM_REMOVE), 0);
    });
}

// A creator reads the messages of the thread that it made last. Clients rely on it: kept.
TEST(Message, CreatorReadsWhatIsPostedToItsLastThread) {
    OnAnotherThread([] {
        const OwnQueue first;
        const OwnQueue second;
        PostThreadMessage(first.id(), 1, 0, 0);
        PostThreadMessage(second.id(), 2, 0, 0);
        ExpectMessage(2, 0, 0);
        EXPECT_TRUE(IsEmpty());
        unsigned int message = 0;
        unsigned int wParam = 0;
        long lParam = 0;
        EXPECT_EQ(static_cast<CLinuxThread*>(first.id())->GetMessage(&message, &wParam, &lParam),
                  1);
        EXPECT_EQ(message, 1u);
    });
}

TEST(Message, ReaderSleepsUntilThereIsOne) {
    std::atomic<HANDLE> id{nullptr};
    Worker reader([&] {
        const OwnQueue queue;
        id = queue.id();
        ExpectMessage(8, 9, 10);
    });
    while (id == nullptr)
        std::this_thread::yield();
    reader.WaitUntilAsleep();
    EXPECT_FALSE(reader.done());
    EXPECT_EQ(PostThreadMessage(id, 8, 9, 10), 1);
}

TEST(Peek, LeavesTheMessageUnlessToldToRemoveIt) {
    const OwnQueue queue;
    MSG message = Unread();
    EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, PM_REMOVE), 0);
    EXPECT_EQ(message.message, 0x22u) << "nothing is written when there is nothing";
    PostThreadMessage(queue.id(), 60, 61, 62);
    PostThreadMessage(queue.id(), 70, 71, 72);
    for (UINT flag : {PM_NOREMOVE, 2u, 3u, 0xFFFFFFFFu}) {
        message = Unread();
        EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, flag), 1);
        EXPECT_EQ(message.hwnd, HandleValue(0x11));
        EXPECT_EQ(message.message, 60u);
        EXPECT_EQ(message.wParam, 61u);
        EXPECT_EQ(message.lParam, 62);
    }
    EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, PM_REMOVE), 1);
    EXPECT_EQ(message.message, 60u);
    EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, PM_REMOVE), 1);
    EXPECT_EQ(message.message, 70u);
    EXPECT_TRUE(IsEmpty());
}

TEST(Peek, DoesNotEndTheProcessForWmQuit) {
    const OwnQueue queue;
    PostThreadMessage(queue.id(), WM_QUIT, 0, 0);
    MSG message = Unread();
    EXPECT_EQ(PeekMessage(&message, nullptr, 0, 0, PM_REMOVE), 1);
    EXPECT_EQ(message.message, 18u);
}

TEST(Message, WmTimerPassesWhateverItsTimer) {
    const OwnQueue queue;
    for (WPARAM wParam : {0u, 1u, 0xFFFFFFFFu}) {
        PostThreadMessage(queue.id(), 275, wParam, 0);
        ExpectMessage(WM_TIMER, wParam, 0);
    }
}

TEST(MessageLoad, EightPostersKeepTheirOrder) {
    constexpr UINT kPosters = 8;
    const UINT messages = static_cast<UINT>(Load(5000));
    const OwnQueue queue;
    std::vector<std::unique_ptr<Worker>> posters;
    for (UINT p = 0; p < kPosters; ++p) {
        posters.push_back(std::make_unique<Worker>([&, p] {
            for (UINT i = 0; i < messages;) {
                if (PostThreadMessage(queue.id(), 100 + p, i, static_cast<LPARAM>(p) << 16) != 0) {
                    ++i;
                } else {
                    std::this_thread::yield();  // full
                }
            }
        }));
    }
    std::vector<UINT> next(kPosters, 0);
    for (UINT i = 0; i < kPosters * messages; ++i) {
        MSG message = Unread();
        ASSERT_EQ(GetMessage(&message, nullptr, 0, 0), 1);
        const UINT poster = message.message - 100;
        ASSERT_LT(poster, kPosters);
        ASSERT_EQ(message.wParam, next[poster]++) << "of poster " << poster;
        ASSERT_EQ(message.lParam, static_cast<LPARAM>(poster) << 16);
    }
    EXPECT_TRUE(IsEmpty());
}

// Receivers are closed while others post to them: each post arrives or is refused.
TEST(MessageLoad, ReceiversCloseUnderTheirPosters) {
    const size_t rounds = Load(500);
    std::atomic<HANDLE> receiver{nullptr};
    std::atomic<bool> stop{false};
    std::vector<std::unique_ptr<Worker>> posters;
    for (int p = 0; p < 3; ++p) {
        posters.push_back(std::make_unique<Worker>([&] {
            while (!stop) {
                if (PostThreadMessage(receiver, 1, 0, 0) == 0) std::this_thread::yield();
            }
        }));
    }
    for (size_t i = 0; i < rounds; ++i) {
        const OwnQueue queue;
        receiver = queue.id();
        if (i % 8 == 0) ExpectMessage(1, 0, 0);
    }
    stop = true;
}

}  // namespace
