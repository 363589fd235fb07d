/*
 * The functions of a provider called Probe, in table order: MI_FUNCTION(operation, parameters) for
 * each. The includer says whether to declare or to define them. No guard: it is a list.
 */
#define PROBE_CALL(type) CMPI##type##MI*, const CMPIContext*
#define PROBE_RESULT(type) PROBE_CALL(type), const CMPIResult*
#define PROBE_PATH(type) PROBE_RESULT(type), const CMPIObjectPath*

MI_FUNCTION(Cleanup, PROBE_CALL(Instance), CMPIBoolean)
MI_FUNCTION(EnumInstanceNames, PROBE_PATH(Instance))
MI_FUNCTION(EnumInstances, PROBE_PATH(Instance), const char**)
MI_FUNCTION(GetInstance, PROBE_PATH(Instance), const char**)
MI_FUNCTION(CreateInstance, PROBE_PATH(Instance), const CMPIInstance*)
MI_FUNCTION(ModifyInstance, PROBE_PATH(Instance), const CMPIInstance*, const char**)
MI_FUNCTION(DeleteInstance, PROBE_PATH(Instance))
MI_FUNCTION(ExecQuery, PROBE_PATH(Instance), const char*, const char*)

MI_FUNCTION(AssociationCleanup, PROBE_CALL(Association), CMPIBoolean)
MI_FUNCTION(Associators, PROBE_PATH(Association), const char*, const char*, const char*,
            const char*, const char**)
MI_FUNCTION(AssociatorNames, PROBE_PATH(Association), const char*, const char*, const char*,
            const char*)
MI_FUNCTION(References, PROBE_PATH(Association), const char*, const char*, const char**)
MI_FUNCTION(ReferenceNames, PROBE_PATH(Association), const char*, const char*)

MI_FUNCTION(MethodCleanup, PROBE_CALL(Method), CMPIBoolean)
MI_FUNCTION(InvokeMethod, PROBE_PATH(Method), const char*, const CMPIArgs*, CMPIArgs*)

MI_FUNCTION(PropertyCleanup, PROBE_CALL(Property), CMPIBoolean)
MI_FUNCTION(SetProperty, PROBE_PATH(Property), const char*, CMPIData)
MI_FUNCTION(GetProperty, PROBE_PATH(Property), const char*)
#ifdef CMPI_VER_200
MI_FUNCTION(SetPropertyWithOrigin, PROBE_RESULT(Property), CMPIObjectPath*, const char*, CMPIData,
            const char*)
#endif

MI_FUNCTION(IndicationCleanup, PROBE_CALL(Indication), CMPIBoolean)
MI_FUNCTION(AuthorizeFilter, PROBE_CALL(Indication), const CMPISelectExp*, const char*,
            const CMPIObjectPath*, const char*)
MI_FUNCTION(MustPoll, PROBE_RESULT(Indication), const CMPISelectExp*, const char*,
            const CMPIObjectPath*)
MI_FUNCTION(ActivateFilter, PROBE_CALL(Indication), const CMPISelectExp*, const char*,
            const CMPIObjectPath*, CMPIBoolean)
MI_FUNCTION(DeActivateFilter, PROBE_CALL(Indication), const CMPISelectExp*, const char*,
            const CMPIObjectPath*, CMPIBoolean)
MI_FUNCTION(EnableIndications, PROBE_CALL(Indication))
MI_FUNCTION(DisableIndications, PROBE_CALL(Indication))

#ifdef CMPI_VER_210
MI_FUNCTION(EnumInstancesFiltered, PROBE_PATH(Instance), const char**, const char*, const char*,
            CMPIStatus*)
MI_FUNCTION(AssociatorsFiltered, PROBE_PATH(Association), const char*, const char*, const char*,
            const char*, const char**, const char*, const char*, CMPIBoolean)
MI_FUNCTION(ReferencesFiltered, PROBE_PATH(Association), const char*, const char*, const char**,
            const char*, const char*, CMPIBoolean)
MI_FUNCTION(AuthorizeFilterCollection, PROBE_CALL(Indication), const CMPIInstance*)
MI_FUNCTION(ActivateFilterCollection, PROBE_CALL(Indication), const CMPIInstance*, CMPIBoolean)
MI_FUNCTION(DeActivateFilterCollection, PROBE_CALL(Indication), const CMPIInstance*, CMPIBoolean)
#endif
