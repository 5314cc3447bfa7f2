#pragma once
// wpx: parameter documents. A document holds targets; a target holds sections and keywords; a
// section holds sections and keywords; a keyword holds an ordered list of parameters, each an int,
// a text or a file name. Documents live in memory and are written to / read from a readable UTF-8
// text file (syntax: docs/wpx-format.md).
//
// Handles. Every document, target, section, keyword and parameter is reached through a handle, an
// opaque pointer whose value is a small positive number from a process-wide handle table, so a
// handle survives a round trip through a 32-bit int (wpxHandleToInt / wpxHandleFromInt). A null
// handle means "none"; every call accepts null and stale handles and then does nothing. Handles of
// a document's parts stay valid until the document is closed.
//
// Reading a setup file, the usual way:
//
//     WPXHANDLE doc = nullptr;
//     CString error;
//     if (!wpxRead("setup.wpx", &doc, &error)) { report(error); return; } // "file:line: ..."
//     WPXHANDLE target = wpxTargetByNum(doc, 1);
//     WPXHANDLE input = wpxSectionByNameNum(target, "INPUT", 1);
//     int type = 1;                     // the default stays when the keyword is missing
//     wpxGetParam(input, "Type", &type, 1, 1);
//     CString file;
//     wpxGetParamFilename(input, "File_name", &file, 1, 1);
//     wpxClose(&doc);
//
// Threads: the handle table is safe to use from several threads; one document must not be used by
// two threads at once.
#include "platform/system/Types.h"

#include <cstdint>

struct WpxObject; // never defined: handles are numbers, not addresses
using WPXHANDLE = WpxObject*;

// Handle <-> 32-bit int. The int form is what a host keeps; it is sign-extended back.
int wpxHandleToInt(WPXHANDLE handle);
WPXHANDLE wpxHandleFromInt(int handle);

// ---- Building. Keywords go into the innermost open target or section. Results: 1 done, 0 not. ----

// A new empty document; null when the handle table is full.
WPXHANDLE wpxCreate();
// Opens a target at top level; refused while a target is open.
int wpxAddTarget(WPXHANDLE doc, const CString& name);
// Opens a section inside the open target or section.
int wpxAddSection(WPXHANDLE doc, const CString& name);
// Closes the innermost open section or target.
int wpxEndSection(WPXHANDLE doc);
// Adds a keyword with one parameter: an int, a text, a file name.
int wpxPutParam(WPXHANDLE doc, const CString& key, int value);
int wpxPutParam(WPXHANDLE doc, const CString& key, const CString& value);
int wpxPutParamFilename(WPXHANDLE doc, const CString& key, const char* value);
// Adds a keyword without parameters; wpxAddInt appends int parameters to the last added keyword.
int wpxAddKeyword(WPXHANDLE doc, const CString& key);
int wpxAddInt(WPXHANDLE doc, int value);
// Writes the whole document to `path` (open targets and sections are written as if closed).
int wpxWrite(WPXHANDLE doc, const CString& path);
// Frees the document and every handle of its parts, and sets `*doc` to null.
int wpxClose(WPXHANDLE* doc);

// ---- Reading. Numbers count from 1; names compare exactly. ----

// Reads a document from a file. On success `*doc` is a new document and the result 1. On failure
// the result is 0, `*doc` null and `*error` says "path:line: what is wrong; what was expected".
// Relative file-name parameters are resolved against the folder of `path` (absolute ones and
// empty ones are kept as written).
int wpxRead(const CString& path, WPXHANDLE* doc, CString* error);
// Reads a document from text; `sourceName` names it in messages, `baseFolder` anchors relative
// file names (empty: kept as written).
int wpxParse(const CString& text, const CString& sourceName, const CString& baseFolder, WPXHANDLE* doc,
             CString* error);
// The document as it would be written.
CString wpxFormat(WPXHANDLE doc);

// The n-th target of a document.
WPXHANDLE wpxTargetByNum(WPXHANDLE doc, int n);
// The n-th section directly inside a target or section.
WPXHANDLE wpxSectionByNum(WPXHANDLE section, int n);
// The n-th section / keyword of that name directly inside a target or section.
WPXHANDLE wpxSectionByNameNum(WPXHANDLE section, const CString& name, int n);
WPXHANDLE wpxKeywordByNameNum(WPXHANDLE section, const CString& name, int n);
// The name of a target, section or keyword; empty for anything else.
CString wpxGetName(WPXHANDLE handle);

// Parameters of a keyword.
int wpxGetNoParams(WPXHANDLE keyword);
WPXHANDLE wpxParamByNum(WPXHANDLE keyword, int n);
enum WpxParamKind { wpxNone = 0, wpxInt = 1, wpxText = 2, wpxFilename = 3 };
WpxParamKind wpxGetParamKind(WPXHANDLE param);
// The value of an int parameter; 0 for anything else.
int wpxGetInt(WPXHANDLE param);
// The value of a text or file-name parameter; empty for anything else.
CString wpxGetText(WPXHANDLE param);

// The value of parameter `paramNum` of keyword number `keyNum` named `key` in `section`. Result 1
// when found with the right kind; otherwise 0 and `*value` is left unchanged. The CString forms
// accept a text and a file name alike (a text is never resolved against the document's folder).
int wpxGetParam(WPXHANDLE section, const CString& key, int* value, int keyNum, int paramNum);
int wpxGetParam(WPXHANDLE section, const CString& key, CString* value, int keyNum, int paramNum);
int wpxGetParamFilename(WPXHANDLE section, const CString& key, CString* value, int keyNum, int paramNum);

// Rewrites every absolute file-name parameter that names something inside `folder` (an absolute
// folder) relative to it, so a document saved there keeps working when the folder moves. Names
// outside the folder, empty names and texts stay as they are. Returns the number rewritten.
int wpxMakeFileNamesRelative(WPXHANDLE doc, const CString& folder);

// Number of handles in use, for tests that look for leaks.
int wpxHandlesInUse();
