#pragma once
// What the Preview button does on a page that has nothing of its own to add: check the template
// against the preview file the way the engine will read it, parse the file, and show the result
// (or, when the template does not fit, the file as it stands).
class CEngine;

// 0 when there was nothing to show; otherwise the preview's result.
int RunDefaultPreview(CEngine* engine);
// Saves the template to the working copy, asks the bridge whether it fits the preview file, and
// removes the working copy again whatever the answer.
bool TemplateFitsPreviewFile(CEngine& engine);
