// The table of vector kernels: 120 entries at their published indices.

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cstdio>
#include <string>
#include <vector>

#include "kernels/vec_model.h"
#include "kernels/vec_table.h"

namespace {

using vidshow::kVectorKernels;

/// The published order, built from the scheme of the names.
std::vector<std::string> PublishedNames() {
    std::vector<std::string> names;
    const auto four = [&](const std::string& head, const std::string& tail = "") {
        for (int n = 0; n < 4; ++n)
            names.push_back(head + std::to_string(n) + tail);
    };
    for (const char* format : {"RGB565ToX_C2P3_", "ARGB32ToX_C4P3_", "ABGR32ToX_C4P3_"}) {
        for (const char* yuv : {"YCbCr420", "YUV420"}) {
            std::string name = std::string("_QZ") + format;
            four(name.replace(name.find('X'), 1, yuv));
        }
    }
    for (const char* order : {"rgb_", "bgr_"}) {
        for (const char* yuv : {"ycbcr2", "yuv2"}) {
            four(std::string("_convert_") + yuv + order, "_neon");
        }
    }
    for (const char* format : {"RGB565_P3C2_", "BGR565_P3C2_", "RGB888_P3C3_", "BGR888_P3C3_",
                               "ARGB32_P3C4_", "ABGR32_P3C4_", "RGB5551_P3C2_", "BGR5551_P3C2_"}) {
        for (const char* yuv : {"_YCbCr420To", "_YUV420To"})
            four(std::string(yuv) + format);
    }
    for (const char* format : {"RGB565_P3C2_", "BGR565_P3C2_"}) {
        for (const char* nv12 : {"_NV12To", "_NV12FRTo"})
            four(std::string(nv12) + format);
    }
    return names;
}

TEST(VecTable, EveryNameStandsAtItsPublishedIndex) {
    const std::vector<std::string> names = PublishedNames();
    ASSERT_EQ(names.size(), 120u);
    for (size_t i = 0; i < names.size(); ++i) {
        void* const entry = reinterpret_cast<void*>(vec_model::Entry<void()>(names[i]));
        ASSERT_NE(entry, nullptr) << names[i];
        EXPECT_EQ(kVectorKernels[i], entry) << names[i] << " at " << i;
    }
}

TEST(VecTable, IndicesThatTheLookUpsCountOn) {
    const auto at = [](size_t i, const char* name) {
        EXPECT_EQ(kVectorKernels[i], reinterpret_cast<void*>(vec_model::Entry<void()>(name))) << i;
    };
    at(0, "_QZRGB565ToYCbCr420_C2P3_0");
    at(23, "_QZABGR32ToYUV420_C4P3_3");
    at(24, "_convert_ycbcr2rgb_0_neon");
    at(28, "_convert_yuv2rgb_0_neon");
    at(40, "_YCbCr420ToRGB565_P3C2_0");
    at(44, "_YUV420ToRGB565_P3C2_0");
    at(56, "_YCbCr420ToRGB888_P3C3_0");
    at(72, "_YCbCr420ToARGB32_P3C4_0");
    at(88, "_YCbCr420ToRGB5551_P3C2_0");
    at(104, "_NV12ToRGB565_P3C2_0");
    at(108, "_NV12FRToRGB565_P3C2_0");
    at(119, "_NV12FRToBGR565_P3C2_3");
}

TEST(VecTable, NoneIsNullAndNoTwoAreTheSame) {
    for (size_t i = 0; i < 120; ++i) {
        EXPECT_NE(kVectorKernels[i], nullptr) << i;
        for (size_t j = 0; j < i; ++j)
            EXPECT_NE(kVectorKernels[i], kVectorKernels[j]) << i;
    }
}

TEST(VecTable, TheLibraryExportsEveryName) {
    void* const library = dlopen("libvidshowhw2-19.so", RTLD_NOW);
    ASSERT_NE(library, nullptr) << dlerror();
    std::vector<std::string> names = PublishedNames();
    names.insert(names.end(), {"_vlerp_neon", "_vlerp12_neon", "_hlerp_neon"});
    for (const std::string& name : names)
        EXPECT_NE(dlsym(library, name.c_str()), nullptr) << name;
    dlclose(library);
}

TEST(VecTable, LiesInReadOnlyMemory) {
    std::FILE* const maps = std::fopen("/proc/self/maps", "r");
    ASSERT_NE(maps, nullptr);
    const auto address = reinterpret_cast<uintptr_t>(kVectorKernels);
    char line[512];
    bool found = false;
    while (std::fgets(line, sizeof line, maps) != nullptr) {
        unsigned long first = 0, end = 0;
        char access[5] = "";
        if (std::sscanf(line, "%lx-%lx %4s", &first, &end, access) != 3) continue;
        if (address < first || address >= end) continue;
        found = true;
        EXPECT_EQ(access[1], '-') << line;
    }
    std::fclose(maps);
    EXPECT_TRUE(found);
}

}  // namespace
