// A product on a fresh emulated machine for end-to-end runs of the apply pipeline: its
// registry entries, its content file, its downloads and its installed files.
#pragma once
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "manifest/content_table.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace pextest {

// One row of the content file: column name -> cell. Missing cells are empty; only the usual
// columns are written.
using ContentRow = std::map<std::string, std::string>;

class PipelineTest : public ::testing::Test {
protected:
    static constexpr const char* kProduct = "Zendor32";
    static constexpr const char* kContent = "C:\\Pex\\Zendor32_content.txt";
    static constexpr const char* kHome = "C:\\App";

    // Registers the product with its content file (mode empty); writes the content file with the
    // usual columns.
    void Publish(const std::vector<ContentRow>& rows, const std::string& product = kProduct,
                 const std::string& content = kContent);
    // A row installing fileName from a download of bytes (C:\Pex\cache\<fileName>.new), in
    // status Downloaded.
    ContentRow Row(const std::string& fileName, const std::string& bytes, const std::string& group = "",
                   const std::string& dependancies = "");

    // The content file as it is now on disk.
    CContentTable Content() const;
    bool ContentEntriesPresent() const;

    std::string Installed(const std::string& fileName) const;  // bytes at C:\App\fileName

    TestMachine machine;
    TraceCapture trace;
};

}  // namespace pextest
