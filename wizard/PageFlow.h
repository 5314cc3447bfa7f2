#pragma once
// Where Next and Back lead from each tool page, read from the setup record: the input format, the
// input kind and the template option decide which pages a road passes. Each answer is a page's
// dialog id, or -1 when the page makes no choice (the wizard then takes the neighbour in sheet
// order); without a record every answer is -1.
class CEngine;

// The dialog id Next leads to from page `pageId`.
int NextPageOf(int pageId, const CEngine* engine);
// The dialog id Back leads to from page `pageId`.
int BackPageOf(int pageId, const CEngine* engine);
