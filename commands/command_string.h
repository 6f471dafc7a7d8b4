// CommandString: the install commands of one update file. The text from the file's "Command"
// cell is a ";"-separated list of items, each a bracketed tag followed by its parameter:
//   [RUN] setup.exe /quiet; [TRY-DEL] old.dll; [REGISTRY](DWORD)HKLM\Software\Maker\Flags=1
// Execute runs the items in order through the five executors, which are virtual so that a
// test (or a caller) can replace what an item does while keeping the list rules.
#pragma once
#include <cstdint>
#include <string>

class CommandString {
public:
    // directory: the base directory of the commands (the update file's install directory, with
    // or without its trailing backslash). Bare file names resolve against it and programs run
    // in it.
    explicit CommandString(const std::string& directory);
    virtual ~CommandString();

    // Runs every item whose tag is known; unknown and empty items are skipped. Returns true when
    // every item ran without throwing, false when an item with a TRY- tag threw (its error is
    // ignored and the next item runs). When an item without TRY- throws, the remaining items do
    // not run and that same exception propagates: a const char* holding a fixed message, or
    // plat::CFileException from the deletions.
    bool Execute(std::string commands);

    // How long [RUN] waits for its program before the item fails (the program keeps running).
    static constexpr std::uint32_t kDefaultRunTimeoutMs = 600000;
    static std::uint32_t RunTimeoutMs();
    // For tests, which cannot wait ten minutes.
    static void SetRunTimeoutMs(std::uint32_t timeoutMs);

protected:
    // The executors, one per command; each takes the item's parameter (the item after its tag,
    // trimmed) and reports failure only by throwing.

    // [RUN]: runs the command line in the base directory and waits for it; the exit code is not
    // examined. Throws "process failed" when the program cannot be started or outlives the
    // time-out.
    virtual void ExecuteRun(std::string parameter);
    // [DEL]: deletes the file (a bare name in the base directory). Throws plat::CFileException
    // with the system's error when the deletion fails.
    virtual void ExecuteDel(std::string parameter);
    // [REGSVR]: calls DllRegisterServer of a library whose version information carries the
    // "OLESelfRegister" string. Throws "Registration Failed!" unless the call returned 0.
    virtual void ExecuteRegSvr(std::string parameter);
    // [DELIFEXISTS]: as [DEL], except that a missing file or folder (error 2 or 3) is success.
    virtual void ExecuteDelIfExists(std::string parameter);
    // [REGISTRY]: (TYPE)ROOT\Key\Path\ValueName=Data writes one value; throws one of the
    // "Invalid Registration Parameter ..." or "Unable to create ..." messages.
    virtual void ExecuteRegistry(std::string parameter);

    const std::string& Directory() const { return directory_; }

private:
    struct CommandRow;  // one row of the tag table
    static const CommandRow* FindCommand(const std::string& item);

    std::string directory_;
};
