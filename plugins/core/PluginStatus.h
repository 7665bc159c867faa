// Status codes the reference plug-ins' scorers report beside the library's own.
#ifndef QZPLUGIN_CORE_PLUGINSTATUS_H_
#define QZPLUGIN_CORE_PLUGINSTATUS_H_

namespace QZPlugin_800 {

// A record was refused: an input value is invalid (or missing) and its MiningField asks
// for returnInvalid. The output record's model fields are null.
constexpr long PLUGIN_INVALID_INPUT = 261001;

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_PLUGINSTATUS_H_
