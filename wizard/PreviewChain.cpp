#include "wizard/PreviewChain.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"

bool TemplateFitsPreviewFile(CEngine& engine)
{
    CString workTemplate;
    if (!engine.GetWorkTemplate(workTemplate))
        return false;
    bool fits = engine.m_pSpecification && engine.m_pSpecification->Save(workTemplate);
    if (fits) {
        CString previewFile;
        fits = engine.GetPreviewFile(previewFile) &&
               engine.BridgeAccepts(previewFile, workTemplate, engine.m_nInputFormat, 0);
    }
    sys::DeleteFile(workTemplate);
    return fits;
}

int RunDefaultPreview(CEngine* engine)
{
    if (!engine || !engine->m_pParser)
        return 0;
    const bool rbx = engine->m_nInputFormat == 1;
    bool parsed = false;
    if (rbx || TemplateFitsPreviewFile(*engine))
        parsed = engine->ParseInputFile(CString()) != 0;
    if (!parsed) {
        // Without a fitting template the file is still worth seeing as it stands.
        auto* general = dynamic_cast<CGeneralFileParser*>(engine->m_pParser.get());
        if (!general || !general->ReadRawLines(CString()))
            return 0;
    }
    return engine->m_pParser->ShowPreview(CString());
}
