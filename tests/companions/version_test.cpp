// Every file of the product and of the simulated build carries the build's
// one version number and the product's name.
#include <gtest/gtest.h>
#include <string>
#include <vector>

#include "support/support.h"

namespace {

std::string StringValue(const std::vector<char>& block, const char* name)
{
    char* value = NULL;
    UINT length = 0;
    std::string path = std::string("\\StringFileInfo\\040904E4\\") + name;
    return VerQueryValueA(block.data(), path.c_str(), (void**)&value, &length) && value ? value : "(none)";
}

TEST(VersionResource, OneVersionInEveryFile)
{
    const std::string product = VISTREL_PRODUCT_DIR "/", sim = SimBuildFolder();
    const struct { std::string path; const char* name; } files[] = {
        {product + "vistrel.exe", "vistrel.exe"}, {product + "HookKeep.dll", "HookKeep.dll"},
        {product + "gatectl.exe", "gatectl.exe"}, {product + "loupe.exe", "loupe.exe"},
        {product + "dxprobe.exe", "dxprobe.exe"}, {sim + "vistrel-sim.exe", "vistrel.exe"},
        {sim + "HookKeep.dll", "HookKeep.dll"},   {sim + "dxprobe.exe", "dxprobe.exe"},
    };
    const std::string text = std::to_string(VISTREL_VERSION_MAJOR) + "." + std::to_string(VISTREL_VERSION_MINOR) +
                             "." + std::to_string(VISTREL_VERSION_PATCH);
    for (const auto& f : files) {
        DWORD handle, size = GetFileVersionInfoSizeA(f.path.c_str(), &handle);
        ASSERT_NE(0u, size) << f.path;
        std::vector<char> block(size, 'x');
        ASSERT_TRUE(GetFileVersionInfoA(f.path.c_str(), 0, size, block.data())) << f.path;
        VS_FIXEDFILEINFO* fixed = NULL;
        UINT length = 0;
        ASSERT_TRUE(VerQueryValueA(block.data(), "\\", (void**)&fixed, &length)) << f.path;
        EXPECT_EQ((DWORD)MAKELONG(VISTREL_VERSION_MINOR, VISTREL_VERSION_MAJOR), fixed->dwFileVersionMS) << f.path;
        EXPECT_EQ((DWORD)MAKELONG(0, VISTREL_VERSION_PATCH), fixed->dwFileVersionLS) << f.path;
        EXPECT_EQ(fixed->dwFileVersionMS, fixed->dwProductVersionMS) << f.path;
        EXPECT_EQ(fixed->dwFileVersionLS, fixed->dwProductVersionLS) << f.path;
        EXPECT_EQ("Vistrel", StringValue(block, "ProductName")) << f.path;
        EXPECT_EQ(text, StringValue(block, "FileVersion")) << f.path;
        EXPECT_EQ(text, StringValue(block, "ProductVersion")) << f.path;
        EXPECT_EQ(f.name, StringValue(block, "OriginalFilename")) << f.path;
    }
}

}  // namespace
