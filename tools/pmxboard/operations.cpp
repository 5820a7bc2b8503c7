#include "drv_pmx.h"

#include "tools/pmxboard/operation.h"
#include "tools/pmxboard/step_error.h"

namespace pmxboard
{
namespace
{

using board::names::Family;

#define OPERATION(function, ...) operation<function>(#function, { __VA_ARGS__ })

/** The first conversion in a format that wants a value; empty when there is none. A percent sign at the end counts. */
std::string conversion_in(std::string_view format)
{
    for (std::size_t i = format.find('%'); i != format.npos; i = format.find('%', i + 2))
    {
        if (i + 1 == format.size() || format[i + 1] != '%')
            return std::string(format.substr(i, 2));
    }
    return {};
}

std::string folded(std::string_view format)
{
    std::string text;
    for (std::size_t i = 0; i < format.size(); ++i)
    {
        text += format[i];
        if (format[i] == '%')
            ++i;
    }
    return text;
}

/** The text is the format. No values go with it, and it is a format a second time when it reaches the console. */
void check_format(const std::string& format)
{
    if (format.find('\0') != format.npos)
        throw LineError("format_string ends at its \\x00; leave it out");
    const std::string first = conversion_in(format);
    if (!first.empty())
        throw LineError("format_string wants a value for \"" + first +
                        "\", and values cannot be given here; write %% for a percent sign");
    const std::string second = conversion_in(folded(format));
    if (!second.empty())
        throw LineError("format_string is formatted twice on its way to the console, and the second time \"" + second +
                        "\" wants a value; write %%%% for a percent sign");
}

Operation printf_operation()
{
    Operation made;
    made.name = "PMX_Printf";
    made.parameters = { Argument<INT32>::describe("PMX_Printf", "level"),
                        { .name = "format_string", .is_output = false, .may_be_null = false, .kind = {} } };
    made.parameters[1].kind.form = Kind::Form::Text;
    made.check = [](const Values& values) { check_format(values[1].string()); };
    made.call = [](const Operation&, const Values& values) {
        // Through a pointer of plain type: the format is checked above, not by the compiler.
        void (*const print)(INT32, const char*, ...) = PMX_Printf;
        print(static_cast<INT32>(values[0].as_number()), values[1].string().c_str());
        return Outcome{};
    };
    return made;
}

const std::vector<Operation> table = {
    OPERATION(PMX_Init),
    OPERATION(PMX_Reset, "ucPmxId"),
    OPERATION(PMX_Uninit),
    OPERATION(i4PMX_Uninit, "u4Case"),
    OPERATION(PMX_Stop),
    OPERATION(i4PMX_Suspend, "param"),
    OPERATION(i4PMX_Resume, "param"),
    OPERATION(i4PmxRegisterIM, "u2CompType", "u2CompId"),
    OPERATION(i4PmxUnregisterIM, "u2CompType", "u2CompId"),

    OPERATION(PMX_GetCap, "ucPmxId", "pu4Cap"),
    OPERATION(PMX_SetEnable, "ucPmxId", "ucEnable"),
    OPERATION(PMX_GetEnable, "ucPmxId", "pucEnable"),
    OPERATION(PMX_EnableVideoPlane, "ucPmxId", "ucVdpId"),
    OPERATION(PMX_DisableVideoPlane, "ucPmxId", "ucVdpId"),
    OPERATION(i4PmxEnableVideoPlane, "pvTag", "ucVdpId"),
    OPERATION(i4PmxDisableVideoPlane, "pvTag", "ucVdpId"),

    OPERATION(PMX_GetHDMIDefaultRes),
    OPERATION(vSetPLLGP_HDMIDDS, "bResIndex"),
    OPERATION(PMX_SetTvType, "ucPmxId", "ucTvType"),
    OPERATION(PMX_GetTvType, "ucPmxId", "pucTvType"),

    printf_operation(),
    OPERATION(PMX_QueryStatus),

    OPERATION(PMX_GetMode, "ucPmxId", "pucMode"),
    OPERATION(i4PmxGetMode, "pvTag", "pucMode"),

    OPERATION(PMX_GetOutSize, "ucPmxId", "pu4Width", "pu4Height"),
    OPERATION(i4PmxGetOutSize, "pvTag", "pu4Width", "pu4Height"),

    OPERATION(PMX_VdpGetPlanePosition, "ucPmxId", "ucVdpHwId").returning(Family::Plane),
    OPERATION(i4PmxGetPlanePosition, "pvTag", "ucVdpHwId").returning(Family::Plane),

    OPERATION(i4PmxOsdEnabled, "pvTag", "i4SrcWidth", "i4SrcHeight", "eSrcColorSpace"),
    OPERATION(i4PmxOsdDisabled, "pvTag"),
    OPERATION(i4PmxVdpEnabled, "pvTag", "i4SrcWidth", "i4SrcHeight"),
    OPERATION(i4PmxVdpDisabled, "pvTag"),

    OPERATION(PMX_GetAspectRatio, "ucPmxId", "pu4AspectRatio"),
    OPERATION(i4PmxGetAspectRatio, "pvTag", "pu4AspectRatio"),
};

} // namespace

const std::vector<Operation>& operations()
{
    return table;
}

} // namespace pmxboard
