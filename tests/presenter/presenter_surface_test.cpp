// The presenter's window: who holds how many references after which change.

#include <memory>
#include <thread>
#include <vector>

#include "presenter/presenter_fixture.h"

namespace {

constexpr DWORD kOpenStreamsKeepTheirs = 0x030A;
constexpr DWORD kAllStreamsMove = 0x0313;

class PresenterSurfaceTest : public PresenterFixture {
  protected:
    PresenterSurfaceTest() {
        EXPECT_EQ(Open(), S_OK);
        g_pWindow = nullptr;
        g_jLastSurface = nullptr;
    }

    ANativeWindow* Surface() const { return ImageOf(*presenter).surface; }

    // What the cache of the Java look-up holds before a window is released.
    static jobject SomeJavaSurface() {
        static int something;
        return reinterpret_cast<jobject>(&something);
    }
};

TEST_F(PresenterSurfaceTest, TakesOneReferenceAndCloseGivesItBack) {
    EXPECT_EQ(SetSurface(kAllStreamsMove, window.get()), S_OK);
    EXPECT_EQ(Surface(), window.get());
    EXPECT_EQ(window.state().strongCount, 2);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(Surface(), nullptr);
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(window.state().strongCount, 1) << "only once";
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(PresenterSurfaceTest, BothIdsChangeTheSurface) {
    EXPECT_EQ(SetSurface(kOpenStreamsKeepTheirs, window.get()), S_OK);
    EXPECT_EQ(Surface(), window.get());
    EXPECT_EQ(SetSurface(kAllStreamsMove, otherWindow.get()), S_OK);
    EXPECT_EQ(Surface(), otherWindow.get());
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_EQ(otherWindow.state().strongCount, 2);
}

TEST_F(PresenterSurfaceTest, SameWindowTwiceKeepsTheExtraReference) {
    CVidshowStream* const stream = CreateStream();
    ASSERT_EQ(stream->Open(), S_OK);
    EXPECT_EQ(SetSurface(kAllStreamsMove, window.get()), S_OK);
    ASSERT_EQ(ImageOf(*stream).surface, window.get());
    *MemberOf(stream, &StreamImage::setScaling) = 0;  // a call of the stream would set it to 1
    EXPECT_EQ(SetSurface(kAllStreamsMove, window.get()), S_OK);
    EXPECT_EQ(Surface(), window.get());
    EXPECT_EQ(window.state().strongCount, 3);
    EXPECT_EQ(ImageOf(*stream).setScaling, 0u) << "the stream was not called";
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(window.state().strongCount, 2) << "the extra reference is not given back";

    ReleaseAndroidSurface(window.get());
}

TEST_F(PresenterSurfaceTest, ReleasingTheOldWindowForgetsTheLastAcquired) {
    EXPECT_EQ(SetSurface(kAllStreamsMove, window.get()), S_OK);
    EXPECT_EQ(g_pWindow, window.get());
    g_jLastSurface = SomeJavaSurface();
    EXPECT_EQ(SetSurface(kAllStreamsMove, otherWindow.get()), S_OK);
    EXPECT_EQ(g_pWindow, nullptr) << "although the new window was just recorded";
    EXPECT_EQ(g_jLastSurface, nullptr);
    EXPECT_EQ(Surface(), otherWindow.get());
}

TEST_F(PresenterSurfaceTest, RecordsTheVirtualMachine) {
    int something = 0;
    VR_ANDROID_SURFACE_PARAM record = {reinterpret_cast<JavaVM*>(&something), window.get()};
    EXPECT_EQ(SetData(kAllStreamsMove, &record), S_OK);
    EXPECT_EQ(g_pJavaVM, record.m_pJvm);
    g_pJavaVM = nullptr;
}

TEST_F(PresenterSurfaceTest, NullRecordTakesTheWindowAway) {
    EXPECT_EQ(SetData(kAllStreamsMove, nullptr), S_OK) << "none before, none after";
    EXPECT_EQ(log.take(), Lines{"[GetAndroidSurface #] GetAndroidSurface faile  pParam = 0x0 \n"});
    CVidshowStream* const stream = CreateStream();
    ASSERT_EQ(stream->Open(), S_OK);
    EXPECT_EQ(SetSurface(kAllStreamsMove, window.get()), S_OK);
    EXPECT_EQ(SetData(kAllStreamsMove, nullptr), S_OK);
    EXPECT_EQ(Surface(), nullptr);
    EXPECT_EQ(ImageOf(*stream).surface, nullptr);
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(PresenterSurfaceTest, OneIdMovesOpenStreamsTheOtherLeavesThem) {
    EXPECT_EQ(SetSurface(kAllStreamsMove, window.get()), S_OK);
    CVidshowStream* const open = CreateStream();
    CVidshowStream* const closed = CreateStream();
    ASSERT_EQ(open->Open(), S_OK);
    EXPECT_EQ(ImageOf(*open).surface, window.get()) << "a new stream has the presenter's";

    EXPECT_EQ(SetSurface(kOpenStreamsKeepTheirs, otherWindow.get()), S_OK);
    EXPECT_EQ(Surface(), otherWindow.get());
    EXPECT_EQ(ImageOf(*open).surface, window.get()) << "deliberately left behind";

    Window third;
    EXPECT_EQ(SetSurface(kAllStreamsMove, third.get()), S_OK);
    EXPECT_EQ(ImageOf(*open).surface, third.get());
    EXPECT_EQ(ImageOf(*closed).surface, window.get()) << "a closed stream refuses";
}

// A stream that keeps what it was told.
class RecordingStream : public CVidshowStream {
  public:
    struct Call {
        const GUID* propertySet;
        DWORD id;
        void* instanceData;
        DWORD instanceBytes;
        void* data;
        DWORD bytes;
        bool locked;  // the presenter's lock was held
        int order;
    };

    RecordingStream(VP_OPEN_STREAM_PARAMS* params, CVidshow* presenter, int* counter)
        : CVidshowStream(params, nullptr, nullptr), m_presenter(presenter), m_counter(counter) {}

    HRESULT Set(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData, DWORD cbInstanceData,
                void* pPropData, DWORD cbPropData) override {
        calls.push_back({&guidPropSet, dwPropID, pInstanceData, cbInstanceData, pPropData,
                         cbPropData, IsLocked(), (*m_counter)++});
        return E_FAIL;  // ignored
    }

    std::vector<Call> calls;

  private:
    // The section is recursive: only its count tells this thread whether it is inside.
    bool IsLocked() const {
        CRITICAL_SECTION* const section = MemberOf(m_presenter, &PresenterImage::lock);
        bool free = false;
        std::thread([&] {
            free = TryEnterCriticalSection(section) == 1;
            if (free) LeaveCriticalSection(section);
        }).join();
        return !free;
    }

    CVidshow* m_presenter;
    int* m_counter;
};

class StreamCallsTest : public PresenterSurfaceTest {
  protected:
    StreamCallsTest() {
        for (const size_t slot : {size_t{0}, size_t{2}, size_t{3}}) {
            PresenterImage::Slot& place = (*MemberOf(presenter, &PresenterImage::streams))[slot];
            streams.push_back(std::make_unique<RecordingStream>(&params, presenter, &counter));
            place.used = 1;
            place.stream = streams.back().get();
        }
    }

    ~StreamCallsTest() override {
        for (PresenterImage::Slot& slot : *MemberOf(presenter, &PresenterImage::streams))
            slot = {};
    }

    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    int counter = 0;
    std::vector<std::unique_ptr<RecordingStream>> streams;
};

TEST_F(StreamCallsTest, EnableGoesToUsedSlotsInOrderAsItCame) {
    DWORD enable = 0x1234;
    int instance = 0;
    const GUID set = IID_IJxFont;
    EXPECT_EQ(presenter->Set(set, 0x0001, &instance, 77, &enable, 3), S_OK) << "results ignored";
    EXPECT_EQ(GetWord(0x0001), 0x1234u);
    int order = 0;
    for (const auto& stream : streams) {
        ASSERT_EQ(stream->calls.size(), 1u);
        const RecordingStream::Call& call = stream->calls[0];
        EXPECT_EQ(call.propertySet, &set);
        EXPECT_EQ(call.id, 0x0001u);
        EXPECT_EQ(call.instanceData, &instance);
        EXPECT_EQ(call.instanceBytes, 77u);
        EXPECT_EQ(call.data, &enable);
        EXPECT_EQ(call.bytes, 3u);
        EXPECT_FALSE(call.locked);
        EXPECT_EQ(call.order, order++);
    }
}

TEST_F(StreamCallsTest, SurfaceGoesAsTheWindowItselfUnderTheIdReceived) {
    int instance = 0;
    const GUID set = IID_IJxFont;
    int order = 0;
    for (const DWORD id : {kOpenStreamsKeepTheirs, kAllStreamsMove}) {
        ANativeWindow* const target = id == kAllStreamsMove ? window.get() : otherWindow.get();
        VR_ANDROID_SURFACE_PARAM record = {nullptr, target};
        EXPECT_EQ(presenter->Set(set, id, &instance, 55, &record, sizeof record), S_OK);
        for (const auto& stream : streams) {
            const RecordingStream::Call& call = stream->calls.back();
            EXPECT_EQ(call.propertySet, &set);
            EXPECT_EQ(call.id, id);
            EXPECT_EQ(call.instanceData, &instance);
            EXPECT_EQ(call.instanceBytes, 55u);
            EXPECT_EQ(call.data, target);
            EXPECT_EQ(call.bytes, 4u) << "also where an address is wider";
            EXPECT_FALSE(call.locked);
            EXPECT_EQ(call.order, order++);
        }
    }
}

TEST_F(StreamCallsTest, NothingElseReachesTheStreams) {
    DWORD words[4] = {1, 2, 3, 4};
    for (const DWORD id : {0x0002u, 0x0003u, 0x0303u, 0x0401u, 0x0402u, 0x0403u, 0x0404u}) {
        SetData(id, words);
    }
    EXPECT_EQ(SetData(0x0001, nullptr), E_POINTER);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(counter, 0);
}

}  // namespace
