// UpdateAll: the loop over the products registered below HKLM\software\Vantric\Pex.
#include "entry/update_all.h"

#include <cstring>

#include "diag/trace_log.h"
#include "entry/run_guard.h"
#include "manifest/manifest_parser.h"
#include "platform/cfile.h"
#include "platform/registry.h"

namespace reg = plat::reg;

namespace {

void ProcessProduct(UpdateAllRun& run, const char* name, ProgressCallback callback) {
    CManifestParser parser;
    parser.ClearSpecialFileList();
    parser.AddToSpecialList("mendler.DLL");
    parser.AddToSpecialList("fetchwell.DLL");
    parser.AddToSpecialList("pellow.exe");
    parser.AddToSpecialList("zendor32.exe");
    const _bstr_t project(name);
    run.HandOverToProduct();
    parser.ProcessUpdateInformation(project, callback);
    if (parser.WasSpecialFileUpdateAttempted()) ResetUpdateScheduleDates();
}

void LoopOverProducts(UpdateAllRun& run, reg::HKey products, ProgressCallback callback) {
    TRACE(g_TraceLog, "UpdateAll, main key is open");
    std::uint32_t subKeys = 0;
    if (callback && reg::QueryInfoKey(products, &subKeys, nullptr) == 0) {
        g_ProgressData.SetTotalSteps(static_cast<std::int32_t>(subKeys));
        callback(&g_ProgressData);
    }
    for (std::uint32_t index = 0;; ++index) {
        char name[256];
        std::memset(name, 0, sizeof name);
        std::uint32_t size = 255;
        const long rc = reg::EnumKey(products, index, name, &size);
        if (rc != 0) {
            TRACE(g_TraceLog, "UpdateAll, RegEnumKey returned %d", static_cast<int>(rc));
            break;
        }
        if (callback) {
            g_ProgressData.IncrementCurrentStep();
            callback(&g_ProgressData);
        }
        TRACE(g_TraceLog, "UpdateAll, key %d is '%s'", static_cast<int>(index + 1), name);
        ProcessProduct(run, name, callback);
    }
}

}  // namespace

extern "C" bool UpdateAll(ProgressCallback callback) {
    UpdateAllRun run;
    if (!run.Entered()) return false;  // a nested call: the run in progress goes on untouched
    try {
        reg::Key products;
        if (reg::OpenKey(reg::kLocalMachine, "software\\vantric\\Pex", reg::kKeyRead, products.out()) == 0)
            LoopOverProducts(run, products.get(), callback);
    } catch (const plat::CFileException& e) {
        // A product run that throws (a content file that cannot be written) ends the loop; the
        // remaining products wait for the next run. The trace says why the run stopped where
        // it did: the run itself had no chance to.
        TRACE(g_TraceLog, "UpdateAll, product run stopped, file error %u on '%s'", static_cast<unsigned>(e.OsError()),
              e.FileName().c_str());
    } catch (...) {
        TRACE(g_TraceLog, "UpdateAll, product run stopped by an exception");
    }
    try {
        g_TraceLog.Close();
    } catch (...) {
    }
    return false;
}
