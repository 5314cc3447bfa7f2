#pragma once
// The description of one rbx0 item as the toolbox's other tools hand it around: name, item type and
// unit keys, data type and value type.
#include "platform/system/Types.h"

class COkaRbxItem {
public:
    void SetDataType(int dataType) { m_nDataType = dataType; }
    void SetDescrip(const CString& descrip) { m_strDescrip = descrip; }
    void SetRuqType(int typeKey) { m_nRuqType = typeKey; }
    void SetRuqUnit(int unitKey) { m_nRuqUnit = unitKey; }
    void SetValueType(int valueType) { m_nValueType = valueType; }

    const CString& GetDescrip() const { return m_strDescrip; }
    int GetDataType() const { return m_nDataType; }
    int GetRuqType() const { return m_nRuqType; }
    int GetRuqUnit() const { return m_nRuqUnit; }
    int GetValueType() const { return m_nValueType; }

    // The item type and unit names from the unit catalogue; empty for an unknown key.
    CString GetRuqTypeName() const;
    CString GetRuqUnitName() const;

private:
    CString m_strDescrip;
    int m_nDataType = 0;
    int m_nRuqType = 0;
    int m_nRuqUnit = 0;
    int m_nValueType = 0;
};
