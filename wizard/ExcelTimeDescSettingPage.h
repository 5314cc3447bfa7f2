#pragma once
// The page on which the user says where the dates and times of an Excel sheet stand, and whether
// they are texts to be read with a format.
#include "wizard/TimeDescPage.h"

class CExcelTimeDescSettingPage : public CTimeDescPage {
    Q_OBJECT
public:
    enum : int { IDD = 2289 };
    enum : int { IDC_USE_DATETIME_FORMAT = 319, IDC_USE_TIME_FORMAT = 320, IDC_USE_DATE_FORMAT = 321,
                 IDC_OPTION_DATETIME = 322, IDC_DATETIME_COLUMN = 323, IDC_DATETIME_SPIN = 324,
                 IDC_DATETIME_FORMAT = 325, IDC_OPTION_SAME_DATE = 326, IDC_DATE_VALUE = 327, IDC_TIME_COLUMN = 328,
                 IDC_TIME_SPIN = 329, IDC_TIME_FORMAT = 330, IDC_TIME_VALUE = 331, IDC_DATE_FORMAT = 332,
                 IDC_OPTION_SAME_TIME = 333, IDC_DATE_SPIN = 334, IDC_DATE_COLUMN = 335 };

    explicit CExcelTimeDescSettingPage(QWidget* parent = nullptr);
};
