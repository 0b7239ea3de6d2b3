// Every property of the presenter, read and written.

#include <vector>

#include "presenter/presenter_fixture.h"

namespace {

using PresenterPropertiesTest = PresenterFixture;

struct GetRow {
    DWORD id;
    size_t bytes;    // written to the data
    DWORD reported;  // stored into *pcbReturned; 0: untouched
};

constexpr GetRow kGetRows[] = {
    {0x0000, 4, 4}, {0x0001, 4, 0}, {0x0002, 16, 16}, {0x0003, 16, 16}, {0x0303, 4, 4},
    {0x0310, 8, 0}, {0x0401, 4, 4}, {0x0402, 4, 4},   {0x0409, 4, 4},   {0x0603, 40, 0},
};

constexpr DWORD kSetIds[] = {0x0001, 0x0002, 0x0003, 0x0303, 0x030A,
                             0x0313, 0x0401, 0x0402, 0x0403};

template <size_t N>
bool IsListed(const DWORD (&ids)[N], DWORD id) {
    for (const DWORD known : ids) {
        if (known == id) return true;
    }
    return false;
}

bool IsReadable(DWORD id) {
    for (const GetRow& row : kGetRows) {
        if (row.id == id) return true;
    }
    return false;
}

// How many leading bytes differ from the two different fills.
size_t BytesWritten(CVidshow* presenter, DWORD id) {
    size_t written = 0;
    for (const uint8_t fill : {uint8_t{0x11}, uint8_t{0xEE}}) {
        uint8_t data[64];
        std::memset(data, fill, sizeof data);
        EXPECT_EQ(presenter->Get(kAnyPropertySet, id, nullptr, 0, data, 0, nullptr), S_OK);
        for (size_t i = 0; i < sizeof data; ++i) {
            if (data[i] != fill && i + 1 > written) written = i + 1;
        }
    }
    return written;
}

TEST_F(PresenterPropertiesTest, GetWritesTheValueAndSomeReportItsSize) {
    ASSERT_EQ(Open(), S_OK);
    for (const GetRow& row : kGetRows) {
        SCOPED_TRACE(row.id);
        EXPECT_EQ(BytesWritten(presenter, row.id), row.bytes);
        uint8_t data[64];
        DWORD returned = 0xDDDDDDDD;
        EXPECT_EQ(GetData(row.id, data, &returned), S_OK);
        EXPECT_EQ(returned, row.reported != 0 ? row.reported : 0xDDDDDDDD);
    }
}

TEST_F(PresenterPropertiesTest, GetStatusWrites4GetEnableLeavesTheCount) {
    DWORD value = 1;
    DWORD returned = 77;
    EXPECT_EQ(GetData(0x0000, &value, &returned), S_OK);
    EXPECT_EQ(value, 0u);
    EXPECT_EQ(returned, 4u);
    returned = 77;
    EXPECT_EQ(GetData(0x0001, &value, &returned), S_OK);
    EXPECT_EQ(returned, 77u);
}

TEST_F(PresenterPropertiesTest, GetNeedsNeitherOpenNorSizeNorPropertySet) {
    for (const GetRow& row : kGetRows) {
        SCOPED_TRACE(row.id);
        uint8_t data[64];
        EXPECT_EQ(presenter->Get(kAnyPropertySet, row.id, nullptr, 0, data, 0, nullptr), S_OK);
        EXPECT_EQ(presenter->Get(IID_IJxFont, row.id, data, 64, data, 1, nullptr), S_OK);
        EXPECT_EQ(GetData(row.id, nullptr), E_POINTER);
    }
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(PresenterPropertiesTest, GetOfUnknownIdIsNotImplemented) {
    ASSERT_EQ(Open(), S_OK);
    for (DWORD id = 0; id < 0x1000; ++id) {
        if (IsReadable(id)) continue;
        uint8_t data[64] = {};
        DWORD returned = 0xDDDDDDDD;
        EXPECT_EQ(GetData(id, data, &returned), E_NOTIMPL) << id;
        EXPECT_EQ(GetData(id, nullptr), E_NOTIMPL) << id << ": the id is looked at first";
        EXPECT_EQ(returned, 0xDDDDDDDDu);
    }
    EXPECT_EQ(GetData(0x10002, nullptr), E_NOTIMPL);
    EXPECT_EQ(GetData(0xFFFFFFFF, nullptr), E_NOTIMPL);
}

TEST_F(PresenterPropertiesTest, OptionsComeBackWholeAndAsPair) {
    ASSERT_EQ(Open(), S_OK);
    VP_OpenOptionsAdv all = {};
    EXPECT_EQ(GetData(0x0603, &all), S_OK);
    EXPECT_EQ(std::memcmp(&all, &options, 40), 0);
    DWORD pair[2] = {};
    EXPECT_EQ(GetData(0x0310, pair), S_OK);
    EXPECT_EQ(pair[0], 0x0A000004u);
    EXPECT_EQ(pair[1], 0x0A000005u);
}

TEST_F(PresenterPropertiesTest, SetOnClosedFailsForEveryIdEvenUnknownOnes) {
    for (DWORD id = 0; id < 0x1000; ++id)
        EXPECT_EQ(SetWord(id, 1), E_FAIL) << id;
    EXPECT_EQ(SetData(0x0001, nullptr), E_FAIL) << "before the null check";
    EXPECT_EQ(SetSurface(0x0313, window.get()), E_FAIL);
    EXPECT_EQ(window.state().strongCount, 1) << "no reference taken";
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(SetWord(0x0303, 1), E_FAIL);
    EXPECT_EQ(GetWord(0x0303), 0u);
}

TEST_F(PresenterPropertiesTest, SetOfUnknownIdIsNotImplemented) {
    ASSERT_EQ(Open(), S_OK);
    for (DWORD id = 0; id < 0x1000; ++id) {
        if (IsListed(kSetIds, id)) continue;
        EXPECT_EQ(SetWord(id, 1), E_NOTIMPL) << id;
        EXPECT_EQ(SetData(id, nullptr), E_NOTIMPL) << id;
    }
}

TEST_F(PresenterPropertiesTest, SetOfNullEnableAndDestination) {
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(SetData(0x0001, nullptr), E_POINTER);
    EXPECT_EQ(SetData(0x0002, nullptr), E_POINTER);
    EXPECT_EQ(GetWord(0x0001), 1u);
}

TEST_F(PresenterPropertiesTest, WordsAreStoredWhole) {
    ASSERT_EQ(Open(), S_OK);
    for (const DWORD id : {0x0001u, 0x0303u, 0x0401u, 0x0402u}) {
        for (const DWORD value : {0x89ABCDEFu, 0u, 0xFFFFFFFFu, 1u}) {
            EXPECT_EQ(SetWord(id, value), S_OK);
            EXPECT_EQ(GetWord(id), value) << id;
        }
    }
    EXPECT_EQ(SetWord(0x0403, 0x89ABCDEF), S_OK);
    EXPECT_EQ(ImageOf(*presenter).deinterlaceMode, 0x89ABCDEFu);
    EXPECT_EQ(GetData(0x0403, nullptr), E_NOTIMPL) << "write-only";
    EXPECT_EQ(SetWord(0x0409, 1), E_NOTIMPL) << "read-only";
    EXPECT_EQ(GetWord(0x0409), 16u);
    EXPECT_EQ(SetWord(0x0000, 1), E_NOTIMPL) << "read-only";
    EXPECT_EQ(GetWord(0x0000), 0u);
}

TEST_F(PresenterPropertiesTest, SizesAndPropertySetAreNotLookedAt) {
    ASSERT_EQ(Open(), S_OK);
    DWORD value = 5;
    EXPECT_EQ(presenter->Set(IID_IJxFont, 0x0401, nullptr, 99, &value, 0), S_OK);
    EXPECT_EQ(GetWord(0x0401), 5u);
}

TEST_F(PresenterPropertiesTest, DataMayLieAtAnyAddress) {
    ASSERT_EQ(Open(), S_OK);
    const RECT rect = {-1, 2, -3, 4};
    uint8_t block[1 + sizeof rect];
    std::memcpy(block + 1, &rect, sizeof rect);
    EXPECT_EQ(SetData(0x0002, block + 1), S_OK);
    EXPECT_EQ(SetData(0x0003, block + 1), S_OK);
    EXPECT_EQ(SetData(0x0303, block + 1), S_OK);
    uint8_t out[1 + sizeof rect] = {};
    EXPECT_EQ(GetData(0x0002, out + 1), S_OK);
    EXPECT_EQ(std::memcmp(out + 1, &rect, sizeof rect), 0);
    EXPECT_EQ(GetWord(0x0303), 0xFFFFFFFFu);
}

TEST_F(PresenterPropertiesTest, RectanglesAreStoredAsGiven) {
    ASSERT_EQ(Open(), S_OK);
    RECT source = {4, 3, 2, 1};
    RECT destination = {-5, 6, 70000, -8};
    EXPECT_EQ(SetData(0x0003, &source), S_OK);
    EXPECT_EQ(SetData(0x0002, &destination), S_OK);
    RECT got = {};
    EXPECT_EQ(GetData(0x0003, &got), S_OK);
    EXPECT_EQ(std::memcmp(&got, &source, sizeof got), 0);
    EXPECT_EQ(GetData(0x0002, &got), S_OK);
    EXPECT_EQ(std::memcmp(&got, &destination, sizeof got), 0);
}

TEST_F(PresenterPropertiesTest, SetSourceEqualToTheCurrentOneLogsNothing) {
    ASSERT_EQ(Open(), S_OK);
    RECT source = {0, 0, 16, 9};
    EXPECT_EQ(SetData(0x0003, &source), S_OK);
    EXPECT_EQ(SetData(0x0003, &source), S_OK);
    EXPECT_EQ(log.take(), Lines());
    RECT got = {};
    EXPECT_EQ(GetData(0x0003, &got), S_OK);
    EXPECT_EQ(std::memcmp(&got, &source, sizeof got), 0);
}

}  // namespace
