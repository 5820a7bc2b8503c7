#include "drv_if.h"
#include "drv_if_pmx.h"

#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"

namespace pmxboard
{
namespace
{

/** The table and tag that a neighbour holds while it calls. */
struct Held
{
    const IPMX* table = nullptr;
    void* tag = nullptr;
};

Held& held()
{
    static Held now;
    return now;
}

template <typename Slot, Slot IPMX::*slot>
struct SlotOf;

/** A slot as an operation on the table that is held. */
template <typename R, typename... A, R (*IPMX::*slot)(A...)>
struct SlotOf<R (*)(A...), slot>
{
    static Operation operation(const char* name, const std::vector<ParameterName>& names)
    {
        R (*const type)(A...) = nullptr;
        Operation made;
        made.name = name;
        made.parameters = parameters_of(type, name, names);
        made.call = [](const Operation& self, const Values& values) {
            if (held().table->*slot == nullptr)
                throw StepFailed("the slot " + self.name + " of the registered table is null");
            return call_function(held().table->*slot, self, values);
        };
        return made;
    }
};

#define SLOT(slot, ...) \
    SlotOf<decltype(IPMX::slot), &IPMX::slot>::operation(#slot, { "pvTag" __VA_OPT__(, ) __VA_ARGS__ })

std::int64_t number_of_tag(void* tag)
{
    return static_cast<std::int64_t>(reinterpret_cast<std::uintptr_t>(tag));
}

} // namespace

const std::vector<Operation>& ipmx_slots()
{
    static const std::vector<Operation> all = {
        SLOT(pi4SetMode, "ucMode", "ucVFreq", "fgOSD5"),
        SLOT(pi4GetMode, "pucMode"),
        SLOT(pi4GetOutSize, "pu4Width", "pu4Height"),
        SLOT(pi4GetAspectRatio, "pu4AspectRatio"),
        SLOT(pi4DisableVideoPlane, "ucVdpId"),
        SLOT(pi4EnableVideoPlane, "ucVdpId"),
        SLOT(pi4OsdEnabled, "i4SrcWidth", "i4SrcHeight", "eSrcColorSpace"),
        SLOT(pi4OsdDisabled),
        SLOT(pi4VdpEnabled, "i4SrcWidth", "i4SrcHeight"),
        SLOT(pi4VdpDisabled),
        SLOT(pi4VdpGetPlanePosition, "ucVdpHwId").returning(board::names::Family::Plane),
    };
    return all;
}

void run_ipmx(Session& session, const Line& line)
{
    if (line.size() < 3)
        throw LineError("write: ipmx SLOT tag|NUMBER [ARGUMENT…]");
    const Operation* const slot = find(ipmx_slots(), line.word(1));
    if (slot == nullptr)
        throw LineError("IPMX has no slot " + line.word(1) + did_you_mean(line.word(1), names_of(ipmx_slots())));
    std::vector<std::string> words(line.words().begin() + 2, line.words().end());
    const bool registered_tag = words[0] == "tag";
    if (registered_tag)
        words[0] = "0";
    Values values = read_arguments(*slot, words);

    void* table = nullptr;
    void* tag = nullptr;
    const INT32 queried = i4ImQueryInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, &table, &tag);
    if (queried < 0)
        throw StepFailed("no IPMX table is registered: i4ImQueryInterface answers " + std::to_string(queried));
    if (table == nullptr)
        throw StepFailed("i4ImQueryInterface answered " + std::to_string(queried) + " without a table");
    held() = { static_cast<const IPMX*>(table), tag };
    if (registered_tag)
        values[0] = board::Value::number(number_of_tag(tag));

    // What is expected of the call is not mixed with what every neighbour does around it.
    session.begin_window();
    try
    {
        session.run(*slot, values);
    }
    catch (const StepFailed&)
    {
        i4ImReleaseInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, tag);
        throw;
    }
    session.end_window();
    const INT32 released = i4ImReleaseInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, tag);
    if (released < 0)
        throw StepFailed("the IPMX table cannot be given back: i4ImReleaseInterface answers " +
                         std::to_string(released));
}

} // namespace pmxboard
