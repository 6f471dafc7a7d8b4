// CManifestParser: processes one product: its settings, its content file, the analysis of the
// rows and the apply pipeline. Exported to hosts, which may drive it for a single product.
#pragma once
#include <cstdint>
#include <set>
#include <string>

#include "commands/platform_utilities.h"
#include "entry/mendler_api.h"
#include "entry/progress_data.h"
#include "manifest/content_table.h"
#include "model/master_list.h"
#include "model/run_journal.h"
#include "platform/bstr.h"

class MENDLER_API CManifestParser {
public:
    CManifestParser();
    ~CManifestParser();
    CManifestParser(const CManifestParser&) = delete;
    CManifestParser& operator=(const CManifestParser&) = delete;

    // Processes the product; the number of failures, 0 for complete success or nothing to do.
    std::int32_t ProcessUpdateInformation(_bstr_t project, ProgressCallback callback);
    // Adds a file name, trimmed and upper-cased, to the special-file list.
    void AddToSpecialList(std::string name);
    // Empties the special-file list and clears the special-file-attempted flag.
    void ClearSpecialFileList();
    bool WasSpecialFileUpdateAttempted() const { return specialFileAttempted_; }
    const std::set<std::string>& SpecialFiles() const { return specialFiles_; }

    // --- product settings ---
    bool Init(std::string project);
    std::string DefaultPath() const;
    void ParseSiteString(std::string* site, std::string* path) const;
    static std::string sGetSiteSpecificInfo(const std::string& site, const std::string& item,
                                            const std::string& dflt);
    static std::string UBranch(const std::string& site);
    static std::string sResolveDirectoryInformation(const std::string& home,
                                                    const std::string& dflt);
    static std::string sGetTempFileName() { return ::sGetTempFileName(); }

    // --- content file ---
    bool LoadManifest(const std::string& project, bool* present);
    bool WriteManifest();
    void ResetCursor() { cursor_ = -1; }
    bool NextRow();
    bool MoveToRow(std::int32_t index);
    std::string GetField(const std::string& column) const;
    bool SetField(std::int32_t row, const std::string& column, const std::string& value);
    bool DiscardContentFile();

    // --- analysis ---
    // Admits the current row (row index rowNumber) into the master list when it takes part.
    void AnalyzeRow(std::int32_t rowNumber, ProgressCallback callback);
    std::uint32_t DetermineDownloadtype(const std::string& parties);
    static std::string sGetInterestedPartiesInformation(const std::string& component);
    static std::uint32_t ConvertCompressionType(const std::string& name);
    static std::uint32_t PickBest(std::uint32_t last, const std::set<std::uint32_t>& supported);
    static std::uint32_t NextWorst(std::uint32_t type);

    // --- apply pipeline ---
    // Decompresses, applies the groups in dependency order and cleans up; returns the final
    // failure count, which it also leaves in result.
    std::int32_t iProcessUpdateInformation(std::int32_t& result, ProgressCallback callback);

    // Read access for tests and tools.
    const CContentTable& Table() const { return table_; }
    CContentTable& Table() { return table_; }
    const std::string& DefaultDirectory() const { return defaultDirectory_; }
    std::int32_t PromptThreshold() const { return promptThreshold_; }
    const std::string& Site() const { return site_; }
    const std::string& FtpPath() const { return ftpPath_; }
    const std::string& PBranch() const { return pBranch_; }
    const std::string& UBranchSetting() const { return uBranch_; }
    const std::string& GetScript() const { return getScript_; }
    bool MandatoryOnly() const { return mandatoryOnly_; }
    const std::string& ContentFilePath() const { return contentFilePath_; }
    const std::string& ContentFileTarget() const { return contentFileTarget_; }
    const CMasterList& MasterList() const { return masterList_; }

private:
    // Records whether the normalised name is in the special-file list.
    void TestSpecialFile(const std::string& fileName);
    // Forgets what an earlier product run of this parser left: master list, work step count,
    // content table and file, and the special-file-attempted flag. The special-file list stays
    // (the host fills it before the run), and so do the settings read from the last project's
    // section (Init reads DefaultPath from there).
    void ResetRunState();
    // Handles a content file that LoadManifest could not load (content_rejection.cpp);
    // returns the failures to count for it.
    std::int32_t RejectContentFile();
    // Removes the product's three content file entries, "ContentFileName" last; true when all
    // three are gone.
    bool RemoveContentFileEntries();
    // Pipeline steps.
    void DecompressFiles(std::int32_t& result, ProgressCallback callback);
    void ApplyGroups(std::int32_t& result, ProgressCallback callback);
    void ApplyGroup(CFileGroup& group, std::int32_t& result, ProgressCallback callback);
    bool ApplyMember(CFile_& file, std::int32_t& result, ProgressCallback callback,
                     std::vector<std::uint32_t>* appliedRows);
    void CleanUp(std::int32_t result, ProgressCallback callback);
    // Finishes or undoes what an interrupted earlier run of the product left, as its journal
    // names it, checked against the loaded table (none when it did not load). The number of rows
    // that could not be recovered: each counts as a failure and is not applied by this run.
    std::uint32_t RecoverEarlierRun(const CContentTable* table);
    // *cleanedRows gets the row when its clean-up is done.
    void CleanUpFile(CFile_& file, bool* cleaned, std::vector<std::uint32_t>* cleanedRows);

    std::set<std::string> specialFiles_;
    bool specialFileAttempted_ = false;
    CProfile profile_;

    std::string projectSection_;
    std::string defaultDirectory_;
    std::int32_t promptThreshold_ = 0;
    std::string defaultContentFile_;
    std::string site_, ftpPath_, pBranch_, uBranch_, getScript_;

    CContentTable table_;
    std::int32_t cursor_ = -1;
    std::string contentFilePath_;
    bool mandatoryOnly_ = false;
    std::string contentFileTarget_;

    CMasterList masterList_;
    std::uint32_t workSteps_ = 0;
    CRunJournal journal_;
};
