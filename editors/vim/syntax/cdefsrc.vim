" Vim syntax file
" Language: class definition source of cdgen
" Made by editors/generate.py from the compiler's catalogue; do not edit.

if exists("b:current_syntax")
  finish
endif

syn case match
syn region cdefString start=/"/ end=/"\|$/ contained oneline
syn match cdefNumber /[=,]\@1<=-\?\%(0[xX]\x\+\|\d\+\%(\.\d*\)\?\%([eE][-+]\?\d\+\)\?\)\ze\%([,. \t#]\|$\)/ contained
syn match cdefComment /\%(#\|\/\/\|\/\*\).*$/ contains=@Spell

syn match cdefUnknownStanza /^\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t].*$/ contains=cdefComment
syn match cdefUnknownAttribute /^[ \t]\+\zs\%(\/[\/*]\)\@![^= \t#"]\%(\%(\/[\/*]\)\@![^=#]\)*\ze=\%(""[ \t]*\%(#\|\/[\/*]\|$\)\)\@!/ contained
syn match cdefNoAttribute /^[ \t]\+\zs\%(\/[\/*]\)\@![^= \t#"]\%(\%(\/[\/*]\)\@![^=#"]\)*\ze\%(#\|\/[\/*]\|$\)/ contained
syn match cdefType /\%(DataType=\|VariableType=\)\@13<=\%(Float32Array\|Float64Array\|BinaryArray\|StringArray\|UInt32Array\|UInt64Array\|Int32Array\|Int64Array\|Quantity\|Counter\|Float32\|Float64\|Quantum\|RHArray\|SDArray\|Binary\|String\|UInt32\|UInt64\|Int32\|Int64\|State\|None\|SBS\|RH\|SD\)\ze\%([ \t#]\|$\)/ contained
syn match cdefProperty /\%(Properties=.*\)\@200<=\<\%(QryReqsMonitoring\|CanBatchUndefine\|CanBatchSetAttr\|CanBatchDefine\|HasConstraints\|InvalForDefine\|CanLiveUpdate\|ORBElectCoord\|ReqdForDefine\|HasResources\|OptForDefine\|SupportsMove\|HasIWAccess\|MtypCentral\|MtypDivided\|CanControl\|JoinPhase0\|JoinPhase1\|MtypGlobal\|CanDefine\|ReadOnly\|LongRun\|Public\|Select\)\>/ contained

syn match cdefAttributeControlDefinition /^[ \t]\+\zs\%(FileVersion\)\ze=/ contained
syn region cdefInControlDefinition matchgroup=cdefStanza start=/^ControlDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeControlDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeControlDefinition cdefAttribute

syn match cdefAttributeClassToManagerMapping /^[ \t]\+\zs\%(DescriptiveMessageSet\|ResourceManager\|MessageCatalog\|FirstKey\|LastKey\)\ze=/ contained
syn region cdefInClassToManagerMapping matchgroup=cdefStanza start=/^ClassToManagerMapping\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeClassToManagerMapping,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeClassToManagerMapping cdefAttribute

syn match cdefAttributeResourceVariableClass /^[ \t]\+\zs\%(ObservationInterval\|ReportingInterval\|VariableClass\|Alias\)\ze=/ contained
syn region cdefInResourceVariableClass matchgroup=cdefStanza start=/^ResourceVariableClass\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeResourceVariableClass,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeResourceVariableClass cdefAttribute

syn match cdefAttributeResourceClass /^[ \t]\+\zs\%(ResourcePermTemplate\|ClassPermTemplate\|Description\|DisplayName\|Properties\|Locator\|Name\)\ze=/ contained
syn region cdefInResourceClass matchgroup=cdefStanza start=/^ResourceClass\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeResourceClass,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeResourceClass cdefAttribute

syn match cdefAttributePersistentResourceAttribute /^[ \t]\+\zs\%(ValueDisplayName\|ListActionClass\|ListActionRsrc\|DefaultValue\|VarietyRange\|Description\|DisplayName\|Properties\|ValidValue\|GroupName\|DataType\|GroupID\|Name\|Id\)\ze=/ contained
syn region cdefInPersistentResourceAttribute matchgroup=cdefStanza start=/^PersistentResourceAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributePersistentResourceAttribute,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributePersistentResourceAttribute cdefAttribute

syn match cdefAttributePersistentClassAttribute /^[ \t]\+\zs\%(ValueDisplayName\|ListActionClass\|ListActionRsrc\|DefaultValue\|VarietyRange\|Description\|DisplayName\|Properties\|ValidValue\|GroupName\|DataType\|GroupID\|Name\|Id\)\ze=/ contained
syn region cdefInPersistentClassAttribute matchgroup=cdefStanza start=/^PersistentClassAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributePersistentClassAttribute,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributePersistentClassAttribute cdefAttribute

syn match cdefAttributeDynamicResourceAttribute /^[ \t]\+\zs\%(ExpressionDescription\|ReArmDescription\|ValueDisplayName\|ListActionClass\|ReArmExpression\|ValidStateValue\|ListActionRsrc\|VariableClass\|InitialValue\|VariableType\|VarietyRange\|Description\|DisplayName\|Expression\|Properties\|GroupName\|DataType\|GroupID\|Range\|Name\|Id\)\ze=/ contained
syn region cdefInDynamicResourceAttribute matchgroup=cdefStanza start=/^DynamicResourceAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeDynamicResourceAttribute,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeDynamicResourceAttribute cdefAttribute

syn match cdefAttributeDynamicClassAttribute /^[ \t]\+\zs\%(ExpressionDescription\|ReArmDescription\|ValueDisplayName\|ListActionClass\|ReArmExpression\|ValidStateValue\|ListActionRsrc\|VariableClass\|InitialValue\|VariableType\|VarietyRange\|Description\|DisplayName\|Expression\|Properties\|GroupName\|DataType\|GroupID\|Range\|Name\|Id\)\ze=/ contained
syn region cdefInDynamicClassAttribute matchgroup=cdefStanza start=/^DynamicClassAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeDynamicClassAttribute,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeDynamicClassAttribute cdefAttribute

syn match cdefAttributeClassAction /^[ \t]\+\zs\%(ConfirmationMsg\|VarietyRange\|Description\|DisplayName\|Permission\|Properties\|TimeOut\|Name\|Id\)\ze=/ contained
syn region cdefInClassAction matchgroup=cdefStanza start=/^ClassAction\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeClassAction,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeClassAction cdefAttribute

syn match cdefAttributeResourceAction /^[ \t]\+\zs\%(ConfirmationMsg\|VarietyRange\|Description\|DisplayName\|Permission\|Properties\|TimeOut\|Name\|Id\)\ze=/ contained
syn region cdefInResourceAction matchgroup=cdefStanza start=/^ResourceAction\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeResourceAction,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeResourceAction cdefAttribute

syn match cdefAttributePAttrSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInPAttrSDDefinition matchgroup=cdefStanza start=/^PAttrSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributePAttrSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributePAttrSDDefinition cdefAttribute

syn match cdefAttributeDAttrSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInDAttrSDDefinition matchgroup=cdefStanza start=/^DAttrSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeDAttrSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeDAttrSDDefinition cdefAttribute

syn match cdefAttributeDefineSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInDefineSDDefinition matchgroup=cdefStanza start=/^DefineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeDefineSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeDefineSDDefinition cdefAttribute

syn match cdefAttributeUndefineSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInUndefineSDDefinition matchgroup=cdefStanza start=/^UndefineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeUndefineSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeUndefineSDDefinition cdefAttribute

syn match cdefAttributeOnlineSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInOnlineSDDefinition matchgroup=cdefStanza start=/^OnlineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeOnlineSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeOnlineSDDefinition cdefAttribute

syn match cdefAttributeOfflineSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInOfflineSDDefinition matchgroup=cdefStanza start=/^OfflineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeOfflineSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeOfflineSDDefinition cdefAttribute

syn match cdefAttributeResetSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInResetSDDefinition matchgroup=cdefStanza start=/^ResetSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeResetSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeResetSDDefinition cdefAttribute

syn match cdefAttributeActionInSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInActionInSDDefinition matchgroup=cdefStanza start=/^ActionInSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeActionInSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeActionInSDDefinition cdefAttribute

syn match cdefAttributeActionOutSDDefinition /^[ \t]\+\zs\%(ValueDisplayName\|DefaultValue\|ElementIndex\|Description\|DisplayName\|ElementName\|ValidValue\|DataType\)\ze=/ contained
syn region cdefInActionOutSDDefinition matchgroup=cdefStanza start=/^ActionOutSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/ end=/^\ze\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/ contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttributeActionOutSDDefinition,cdefComment,cdefString,cdefNumber,cdefType,cdefProperty
hi def link cdefAttributeActionOutSDDefinition cdefAttribute

syn sync match cdefSyncControlDefinition grouphere cdefInControlDefinition /^ControlDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncClassToManagerMapping grouphere cdefInClassToManagerMapping /^ClassToManagerMapping\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncResourceVariableClass grouphere cdefInResourceVariableClass /^ResourceVariableClass\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncResourceClass grouphere cdefInResourceClass /^ResourceClass\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncPersistentResourceAttribute grouphere cdefInPersistentResourceAttribute /^PersistentResourceAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncPersistentClassAttribute grouphere cdefInPersistentClassAttribute /^PersistentClassAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncDynamicResourceAttribute grouphere cdefInDynamicResourceAttribute /^DynamicResourceAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncDynamicClassAttribute grouphere cdefInDynamicClassAttribute /^DynamicClassAttribute\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncClassAction grouphere cdefInClassAction /^ClassAction\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncResourceAction grouphere cdefInResourceAction /^ResourceAction\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncPAttrSDDefinition grouphere cdefInPAttrSDDefinition /^PAttrSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncDAttrSDDefinition grouphere cdefInDAttrSDDefinition /^DAttrSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncDefineSDDefinition grouphere cdefInDefineSDDefinition /^DefineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncUndefineSDDefinition grouphere cdefInUndefineSDDefinition /^UndefineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncOnlineSDDefinition grouphere cdefInOnlineSDDefinition /^OnlineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncOfflineSDDefinition grouphere cdefInOfflineSDDefinition /^OfflineSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncResetSDDefinition grouphere cdefInResetSDDefinition /^ResetSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncActionInSDDefinition grouphere cdefInActionInSDDefinition /^ActionInSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncActionOutSDDefinition grouphere cdefInActionOutSDDefinition /^ActionOutSDDefinition\ze\%([ \t#]\|\/[\/*]\|$\)/
syn sync match cdefSyncUnknown grouphere NONE /^\%(\%(PersistentResourceAttribute\|DynamicResourceAttribute\|PersistentClassAttribute\|ActionOutSDDefinition\|ClassToManagerMapping\|DynamicClassAttribute\|ResourceVariableClass\|ActionInSDDefinition\|UndefineSDDefinition\|OfflineSDDefinition\|DefineSDDefinition\|OnlineSDDefinition\|ControlDefinition\|DAttrSDDefinition\|PAttrSDDefinition\|ResetSDDefinition\|ResourceAction\|ResourceClass\|ClassAction\)\%([ \t#]\|\/[\/*]\|$\)\)\@!\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)\@![^ \t]/

hi def link cdefUnknownStanza Error
hi def link cdefUnknownAttribute Error
hi def link cdefNoAttribute Error
hi def link cdefStanza Statement
hi def link cdefAttribute Identifier
hi def link cdefType Type
hi def link cdefProperty Constant
hi def link cdefString String
hi def link cdefNumber Number
hi def link cdefComment Comment

let b:current_syntax = "cdefsrc"
