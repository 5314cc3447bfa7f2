#pragma once
// Dialog and control ids. Page dialog ids double as the page identifiers of the wizard flow.

namespace res {

// Wizard pages and dialogs.
constexpr int IDD_SELECT_INPUT = 2278;
constexpr int IDD_DEFINE_TEMPLATE = 2279;
constexpr int IDD_DELIMITERS = 2280;
constexpr int IDD_TIME_DESC_ASCII = 2281;
constexpr int IDD_SAVE_TEMPLATE = 2282;
constexpr int IDD_OUTPUT = 2283;
constexpr int IDD_PROPPAGE = 2284;
constexpr int IDD_ITEM_SELECTION = 2285;
constexpr int IDD_FILE_PREVIEW = 2288;
constexpr int IDD_TIME_DESC_EXCEL = 2289;
constexpr int IDD_DATA_DESC = 2290;

// Wizard commands.
constexpr int ID_WIZBACK = 12323;
constexpr int ID_WIZNEXT = 12324;
constexpr int ID_WIZFINISH = 12325;
constexpr int ID_HELP = 57670;
constexpr int IDC_PREVIEW_BUTTON = 277;

// File preview dialog.
constexpr int IDC_LIST_INPUT = 315;
constexpr int IDC_LIST_RESULT = 316;
constexpr int IDC_STATIC_INPUT = 317;
constexpr int IDC_STATIC_RESULT = 318;

} // namespace res
