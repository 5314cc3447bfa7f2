#include "resources/StringTable.h"

#include <unordered_map>

namespace res {
namespace {

const std::unordered_map<int, const char*>& Table()
{
    static const std::unordered_map<int, const char*> table = {
        {IDS_VELMORA, "Velmora"},
        {IDS_VELMORA_PPG, "Velmora Property Page"},
        {IDS_ERROR_RUNNING_ENGINE, "Error running engine."},
        {IDS_FOLDER_FILES_SKIPPED, "Conversion complete. Some files are skipped because they do not match the template."},
        {IDS_RUN_ENGINE_CAPTION, "Run Engine"},
        {IDS_STATUS_OK, "Status: OK"},
        {IDS_EXCEL_MISSING, "Excel is either not installed on this computer, or your Excel version is too old."},
        {IDS_FILE_INVALID, "The file is invalid or the file does not exist."},
        {IDS_TEMPLATE_NO_MATCH, "Template does not match any file in the folder."},
        {IDS_SELECT_FOLDER, "Please select the folder to convert"},
        {IDS_SINGLE_ASCII, "You have chosen to convert a single ASCII file."},
        {IDS_SPECIFY_FORMAT, "To convert it, you need to specify the format manually or through a template"},
        {IDS_FOLLOWING_OPTIONS, "You have the following options:"},
        {IDS_CREATE_TEMPLATE_HINT, "If you do not have a template file, you can create one by re-starting this tool and choosing to convert a single EXCEL file with manual specification of the format."},
        {IDS_FOLDER_ASCII, "You have chosen to convert all ASCII files in a folder."},
        {IDS_FOLDER_NEEDS_TEMPLATE, "To proceed, you need to specify a template file containing a format description. The template file may be selected below."},
        {IDS_FOLDER_EXCEL, "You have chosen to convert all EXCEL files in a folder."},
        {IDS_SINGLE_EXCEL, "You have chosen to convert a single Excel file."},
        {IDS_NO_TEMPLATE_SELECTED, "No template was selected. Please select a template to proceed."},
        {IDS_COLUMN_NOT_POSITIVE, "Date/time column, Date column, Time column number must be greater than zero."},
        {IDS_FILE_NAME_INVALID, "File name is invalid."},
        {IDS_START_ROW_TOO_SMALL, "The data start row needs to be greater than any heading rows. Please correct this to continue."},
        {IDS_ITEM_NAME_ROW_CLASH, "The item name row should not equal any of the other header rows. Please correct this to continue."},
        {IDS_HEADER_ROW_ZERO, "Item name, Item type, Unit and Value Type rows must not be equal to 0. Please correct this to continue."},
        {IDS_RECONFIGURE_ITEMS, "To proceed, you must re-configure item name, item type, unit type and value type setting."},
        {IDS_SELECT_MORE_ITEMS, "You must select more than one item."},
        {IDS_TEMPLATE_NAME_INVALID, "The name of template is invalid."},
        {IDS_FILE_EXISTS_REPLACE, "The specified file name already exists. Do you want to replace it?"},
        {IDS_DATETIME_FORMAT_LETTERS, "Only the letters 'Y', 'y', 'M', 'm', 'D', 'd', 'H', 'h' are allowed when specifying the date/time format."},
        {IDS_QUOTE_OR_DELIMITER_MISSING, "A quote ('\"') or delimiter is missing in the item description line."},
        {IDS_ITEM_NAME_LINE_EMPTY, "The line specified as containing item names must not be empty."},
        {IDS_ITEM_NAME_LINE_NO_DELIMITER, "There is no delimiter in the line specified as containing item names."},
        {IDS_ITEM_TYPE_LINE_EMPTY, "The line specified as item type line must not be empty."},
        {IDS_UNIT_LINE_EMPTY, "The line specified as containing units must not be empty."},
        {IDS_VALUE_TYPE_INVALID, "The Value Type of one of the items in the ASCII file is not valid."},
        {IDS_VALUE_TYPE_LINE_EMPTY, "The line specified as value type line must not be empty. "},
        {IDS_START_ROW_NO_DELIMITER, "The line specified as the data start row has not delimiters."},
        {IDS_ITEM_COUNT_WRONG, "The input file contains consecutive delimiter(s), or the number of variables (data items) is incorrect."},
        {IDS_NAME_COLUMNS_MISMATCH, "The number of columns in the item name row must match the number of columns in the data rows."},
        {IDS_NO_ITEM_COLUMN, "There are no item column in one or more lines in the file."},
        {IDS_OVERWRITE_INPUT_TEMPLATE, "Do you want to overwrite the input template file? If not, please specify a new name for the output template file."},
        {IDS_NO_DELIMITERS, "There are no delimiters in one or more lines in the file."},
        {IDS_DECIMAL_SEPARATOR_MISMATCH, "The specified decimal separator does not match those used in the file."},
        {IDS_NO_DATETIME_COLUMN, "There is no date/time column in at least one of the data rows."},
        {IDS_SHEET_INDEX_TOO_LARGE, "The sheet index is greater than the total number of sheets in the file."},
        {IDS_NO_ITEM_TYPE, "There is no Item Type available. Please verify the contents of the specified Item Type row."},
        {IDS_NO_UNIT_TYPE, "There is no Unit Type available. Please verify the contents of the specified Unit Type row."},
        {IDS_NO_VALUE_TYPE, "There is no Value Type available. Please verify the contents of the specified Value Type row."},
        {IDS_FAILED_TO_OPEN_FILE, "Failed to open file: "},
        {IDS_DATETIME_UNPARSABLE, "Unable to parse date and time according to the specified format."},
        {IDS_FOLDER_INVALID, "The folder does not exist, or files in the folder are invalid."},
        {IDS_UNIT_TYPE_MISMATCH, "The unit of the items does not match the Item Type."},
        {IDS_VALUE_TYPE_LINE_SHORT, "The line specified as containing value type has no delimiters. "},
        {IDS_ITEM_NAME_EMPTY, "Item name can not be empty. Please correct this to continue."},
        {IDS_PPG_CAPTION, "General"},
    };
    return table;
}

} // namespace

std::string LoadString(int id)
{
    auto it = Table().find(id);
    return it == Table().end() ? std::string() : std::string(it->second);
}

} // namespace res
