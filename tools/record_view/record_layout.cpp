// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/record_layout.h"

#include <type_traits>

#include "src/driver/pmx/pmx_if.h"

namespace record_view
{
namespace
{

template <typename T>
Node single(std::string name, std::size_t offset, std::string owner)
{
    static_assert(std::is_integral_v<T> || std::is_enum_v<T> || std::is_pointer_v<T>);
    return { .name = std::move(name),
             .form = std::is_pointer_v<T> ? Node::Form::Pointer : Node::Form::Number,
             .offset = offset,
             .size = sizeof(T),
             .is_signed = std::is_signed_v<T>,
             .owner = std::move(owner),
             .children = {} };
}

Node record(std::string name, std::size_t offset, std::size_t size, std::vector<Node> children)
{
    return { .name = std::move(name),
             .form = Node::Form::Record,
             .offset = offset,
             .size = size,
             .is_signed = false,
             .owner = {},
             .children = std::move(children) };
}

Node list(std::string name, std::size_t offset, std::size_t count, const Node& item)
{
    Node node = record(std::move(name), offset, count * item.size, std::vector<Node>(count, item));
    node.form = Node::Form::List;
    for (std::size_t i = 0; i < count; ++i)
        node.children[i].offset = i * item.size;
    return node;
}

#define FIELD(Record, field) single<decltype(Record::field)>(#field, offsetof(Record, field), #Record)

#define CCIR(field) FIELD(CCIR_DRV_INFO_T, field)
#define OUTPUT(field) FIELD(PMX_RESOLUTION_T, field)

Node output()
{
    Node port_set_up = record("eCcirDrvInfo", offsetof(PMX_RESOLUTION_T, eCcirDrvInfo), sizeof(CCIR_DRV_INFO_T),
                              { CCIR(eDgoMode), CCIR(eDgoFmt), CCIR(eDgiMode), CCIR(eDgiFmt) });
    return record("", 0, sizeof(PMX_RESOLUTION_T),
                  { OUTPUT(fgOutputEnable), OUTPUT(eResMode), OUTPUT(u4VFreq), std::move(port_set_up) });
}

#define PORT(field) FIELD(PMX_PORT_INFO_T, field)

Node port()
{
    return record("", 0, sizeof(PMX_PORT_INFO_T),
                  { PORT(u2CompType), PORT(u2CompId), PORT(fgConnected), PORT(fgEnabled), PORT(eInputColorMode),
                    PORT(eSrcColorSpace), PORT(u4SrcWidth), PORT(u4SrcHeight), PORT(ucLumaKey) });
}

#define CONF(field) FIELD(PMX_CONF_T, field)
#define CONF_LIST(field, item) \
    list(#field, offsetof(PMX_CONF_T, field), std::extent_v<decltype(PMX_CONF_T::field)>, item)

Node configuration()
{
    const Node plane = single<UCHAR>("aucPlaneOrder", 0, "PMX_CONF_T");
    return record("", 0, sizeof(PMX_CONF_T),
                  {
                      CONF(ucEnable),
                      CONF(ucMode),
                      CONF(ucTvType),
                      CONF(ucVfreq),
                      CONF(ucDigitalOut),
                      CONF(u4Phase),
                      CONF(ucProprietaryMode),
                      CONF(ucDigitalBit),
                      CONF(ucDigitalRgb),
                      CONF(ucCAVBlackLv),
                      CONF(ucCVBSBlackLv),
                      CONF(ucGamma),
                      CONF(ucBrightness),
                      CONF(ucContrast),
                      CONF(ucHue),
                      CONF(ucSaturation),
                      CONF(ucCBEnable),
                      CONF(ucMuteEnable),
                      CONF(u4AspectRatio),
                      CONF(u4BgColor),
                      CONF(u4Capability),
                      CONF_LIST(aucPlaneOrder, plane),
                      CONF(ucSharpness),
                      CONF(piVdp1),
                      CONF(pvTag1),
                      CONF(piVdp2),
                      CONF(pvTag2),
                      CONF_LIST(arPortInfo, port()),
                      CONF(eMasterColorSpace),
                      CONF_LIST(arOutputConf, output()),
                      CONF(fgAspNext),
                      CONF(u4AspNext),
                      CONF(fgSetModeCalled),
                      CONF(ucCavYcInputDelay),
                      CONF(ucCavYcOutputDelay),
                      CONF(ucCvbsYcInputDelay),
                      CONF(ucCvbsYcOutputDelay),
                      CONF(ucCavSyncLvl),
                      CONF(ucCvbsSyncLvl),
                      CONF(ucCvbsBurstLvl),
                      CONF(ucCavYLvl),
                      CONF(ucCvbsYLvl),
                      CONF(fgDigestEnable),
                      CONF(u4DigestAsp),
                      CONF(rDrvExtScl),
                      CONF(u4PlaneOrder),
                      CONF(fgForceMode),
                      CONF(fgOSD5),
                  });
}

#define STATUS(field) FIELD(PMX_DISPLAY_PART_STATUS_T, field)

Node handshake()
{
    return record(
        "", 0, sizeof(PMX_DISPLAY_PART_STATUS_T),
        { STATUS(hPMXTimer), STATUS(fgPmxFormatChangeFlag), STATUS(fgPmxEnabeOsdFlag), STATUS(fgTimerAlreadySet) });
}

#define VARIABLE(object)                                              \
    Object                                                            \
    {                                                                 \
#object, "module", single < decltype(object)>(#object, 0, "") \
    }

} // namespace

const std::vector<Object>& objects()
{
    static const std::vector<Object> all = {
        { "_arPmxConf", "record", configuration() },
        { "_arPmxDispPartStatus", "status", handshake() },
        VARIABLE(bComp0OnTop),
        VARIABLE(MutexPMX),
        VARIABLE(_PmxInitiated),
        VARIABLE(_fgBootUp),
        VARIABLE(_PmxTestOsd),
        VARIABLE(_fg2DCap),
        VARIABLE(PMX_debug_level),
    };
    return all;
}

} // namespace record_view
