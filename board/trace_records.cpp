// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/trace_call.h"

namespace board
{

Value field_value(std::string_view record, std::string_view field, std::int64_t number)
{
    return Value::number(number, names::name_of(names::family_of(record, field), number));
}

#define FIELD(Record, field) value.add(#field, field_value(#Record, #field, static_cast<std::int64_t>(record.field)))

Value to_value(const CCIR_DRV_INFO_T& record)
{
    Value value;
    FIELD(CCIR_DRV_INFO_T, eDgoMode);
    FIELD(CCIR_DRV_INFO_T, eDgoFmt);
    FIELD(CCIR_DRV_INFO_T, eDgiMode);
    FIELD(CCIR_DRV_INFO_T, eDgiFmt);
    return value;
}

Value to_value(const PMX_SET_HDMI_RES_PARAMETER_T& record)
{
    Value value;
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, u1ScaleMode);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, ucHdmiOutDisplayResolution);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, ucFmtOutResolution);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, ucCCIROutResolution);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, ucHdmiOutMode);
    value.add("eCcirDrvInfo", to_value(record.eCcirDrvInfo));
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, fgOsdMsg);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, ucCCIROutMode);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, fgCCIROutEnable);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, fgHdmiOutEnable);
    FIELD(PMX_SET_HDMI_RES_PARAMETER_T, u2_Vfreq);
    return value;
}

Value to_value(const PMX_SET_TV_SYS_PARAMETER_T& record)
{
    Value value;
    FIELD(PMX_SET_TV_SYS_PARAMETER_T, u2_Vfreq);
    FIELD(PMX_SET_TV_SYS_PARAMETER_T, fgAutoEnable);
    return value;
}

Value to_value(const PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T& record)
{
    Value value;
    FIELD(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T, u4ResCheck);
    FIELD(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T, u2VsyncFreq);
    FIELD(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T, u4ValidAutoRes);
    FIELD(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T, u2ValidAutoVfreq);
    return value;
}

#undef FIELD

} // namespace board
