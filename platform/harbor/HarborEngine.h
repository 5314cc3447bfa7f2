#pragma once
// The tool framework's engine base: what every tool's setup record inherits (setup name, log
// location, verification, the run slot) and the two services tools call without an object:
// starting the tool's engine program and judging a file name.
#include "platform/system/Types.h"

#include <vector>

class COkaFileSelectorDlg; // the rbx0 file selector; tools may narrow what it offers

class CHarborEngine {
public:
    CHarborEngine() = default;
    CHarborEngine(const CHarborEngine&) = delete;
    CHarborEngine& operator=(const CHarborEngine&) = delete;

    // The virtual slots, in the order tools rely on.
    virtual ~CHarborEngine() = default;
    // Sets defaults that depend on the input data; the framework itself has none.
    virtual void SetDataDepDefaultValues();
    // Appends the summary the overview page shows; the framework's own names the setup.
    virtual void GetOverviewText(CString& text);
    // Gives the tool a chance to narrow the rbx0 file selector; the framework leaves it as is.
    virtual void SetInputFileConstraints(COkaFileSelectorDlg* dlg);
    // Runs the tool; the framework's own only verifies, as a tool without an engine has nothing
    // to start. Returns 0 on success.
    virtual int RunTool(int silent);
    // 0 when the setup may run; otherwise nonzero with the reason in `message` (see docs/harbor.md).
    virtual int _Verify(CString& message);

    void GetSetupName(CString& name) const { name = m_strSetupName; }
    void SetSetupName(CString name) { m_strSetupName = std::move(name); }
    void GetLogFileDir(CString& dir) const { dir = m_strLogFileDir; }
    void SetLogFileDir(const CString& dir) { m_strLogFileDir = dir; }

    // Starts `program` with the arguments `setupFile` and `flag` (as decimal text) and waits for it.
    // Returns its exit status: 0 on success, nonzero when it failed, could not be started or was
    // killed by a signal. Where the program is looked for is described in docs/harbor.md.
    static int RunEngine(CString program, CString setupFile, int flag);
    // The same with `options` after the flag (the engine program's own options, such as "--threads").
    static int RunEngine(CString program, CString setupFile, int flag, const std::vector<CString>& options);
    // Nonzero when `name` can name a file to create or read (rule in docs/harbor.md).
    static int IsValidFileName(CString name);

    // The full path RunEngine would start for `program`, or empty when none is found.
    static CString FindEngineProgram(const CString& program);

private:
    CString m_strSetupName;
    CString m_strLogFileDir;
};
