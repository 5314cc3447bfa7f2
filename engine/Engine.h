#pragma once
// The tool's setup record: what the user chose in the wizard, how it is stored in a parameter
// document, how the engine program is run on it, and the working objects the wizard needs.
#include "parsers/FilePreviewParser.h"
#include "platform/harbor/HarborEngine.h"
#include "platform/system/Types.h"
#include "platform/wpx/Wpx.h"
#include "engine/ModuleHandle.h"
#include "templates/Specification.h"

#include <memory>

class CEngine : public CHarborEngine {
public:
    CEngine() = default;
    ~CEngine() override;

    void GetOverviewText(CString& text) override;
    int RunTool(int silent) override;

    // Empties `name`, then sets the bridge name of format 1, 2 or 3; any other format leaves it empty.
    static void GetBridgeName(int format, CString& name);

    // Reads INPUT, TEMPLATE and OUTPUT from inside `section`; missing keywords keep the fields.
    void ReadSetupSections(WPXHANDLE section);
    // Writes INPUT, TEMPLATE and OUTPUT at the document's current position.
    void WriteSetupSections(WPXHANDLE document);
    // Writes the setup into a temporary file under target "VELMORA", runs the engine program on
    // it, deletes the file; returns the program's result.
    int LaunchEngine();
    // The same with `options` handed to the engine program after its flag ("--threads", "4").
    int LaunchEngine(const std::vector<CString>& options);
    // The name of the temporary setup file: the setup name with blanks turned into underscores,
    // followed by ".wpx". What could make it more than one name inside the temporary folder is
    // made safe too: separators, control characters and leading dots become underscores, and a
    // name longer than 200 bytes is cut.
    CString EngineFileName() const;
    // "Template_name" as it is stored: the template object's save file once the template is
    // being modified or made by hand, else the chosen template name.
    CString StoredTemplateName() const;

    // Input selection and working objects.
    void SetInput(int type, int format, const CString& file, const CString& folder);
    void SetTemplate(int option, const CString& name);
    void SetItems(const CUIntArray& items);
    void ResetSetup();

    // Checks of files and templates; `message` receives a string-table text on failure.
    int FolderExists(const CString& path);
    int CheckFileExtension(const CString& path, int format, CString& message);
    int IsTextFile(const CString& path);
    int BridgeAccepts(const CString& file, const CString& templatePath, int format, short folderScan);
    int FindMatchingFile(const CString& folder, CString& firstMatch, int format, const CString& templatePath);
    int VerifyTemplate(const int& option, const CString& templatePath, CString& message);
    int VerifyOutput(int format, const CString& file, const CString& folder, CString title, CString& message);
    int LoadTemplate(const CString& path);
    int ParseInputFile(const CString& path);
    int ReadItemNames(const CString& path, CStringList& names);

    // The working files.
    int SetPreviewFile(const CString& path);
    int GetPreviewFile(CString& path);
    int SetWorkTemplate(const CString& path);
    int GetWorkTemplate(CString& path);

    int m_bConstraintsApplied = 0;
    int m_nInputType = 1;   // 1 single file, 2 every file of a folder
    int m_nInputFormat = 1; // sys::FileFormat: 1 rbx0, 2 ASCII, 3 Excel
    CString m_strInputFile;
    CString m_strInputBridge;
    CString m_strInputFolder;
    CUIntArray m_arrItems;
    int m_nTemplateOption = 1; // 1 use a template, 2 modify a template, 3 define by hand
    CString m_strTemplateName;
    int m_nOutputFormat = 1;
    CString m_strOutputBridge;
    CString m_strOutputFile;
    CString m_strOutputFolder;
    CString m_strOutputTitle;
    std::unique_ptr<CSpecification> m_pSpecification;
    std::unique_ptr<CFilePreviewParser> m_pParser;
    CString m_strPreviewFile;
    CString m_strWorkTemplate;
    int m_bParsed = 0;
};

// Fills `engine` from the module's document: 1 when no document is set, -1 when it has no first
// section under its first target, 0 after reading.
int ReadSetup(CEngine& engine);
// Replaces the module's document by a new one holding the setup: 0 done, -1 when no document can
// be created (the old one stays).
int WriteSetup(CEngine& engine);

// A file name for the working copy of the template in the temporary folder that does not exist yet.
CString MakeWorkTemplateName();
