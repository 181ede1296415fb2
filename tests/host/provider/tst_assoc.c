/* TST_WidgetGadget: association MI (and enumeration-only instance MI) linking widgets to
 * gadgets. associators fetches the far ends through the broker's getInstance up-call. */
#include "tst_store.h"

static const CMPIBroker *_broker;

/* The far end of `link` seen from `op`, or NULL when `op` is not one of its ends or the
 * role and result filters exclude it. */
static CMPIObjectPath *far_end(const CMPIObjectPath *op, const TstLink *link, const char *role,
                               const char *resultClass, const char *resultRole) {
    CMPIString *cls = CMGetClassName(op, NULL);
    const char *cn = cls == NULL ? "" : CMGetCharPtr(cls);
    const char *ns = tst_ns(op);
    if (tst_same(cn, "TST_Widget") && tst_same(tst_key(op, "InstanceID"), link->widget)) {
        if ((role != NULL && !tst_same(role, "Widget")) ||
            (resultRole != NULL && !tst_same(resultRole, "Gadget")) ||
            (resultClass != NULL && !tst_same(resultClass, "TST_Gadget"))) {
            return NULL;
        }
        return tst_gadget_path(_broker, ns, link->gadget);
    }
    if (tst_same(cn, "TST_Gadget") && tst_same(tst_key(op, "Tag"), link->gadget)) {
        if ((role != NULL && !tst_same(role, "Gadget")) ||
            (resultRole != NULL && !tst_same(resultRole, "Widget")) ||
            (resultClass != NULL && !tst_same(resultClass, "TST_Widget"))) {
            return NULL;
        }
        return tst_widget_path(_broker, ns, link->widget);
    }
    return NULL;
}

static CMPIObjectPath *link_path(const char *ns, const TstLink *link) {
    CMPIObjectPath *op = CMNewObjectPath(_broker, ns, "TST_WidgetGadget", NULL);
    CMPIObjectPath *w = tst_widget_path(_broker, ns, link->widget);
    CMPIObjectPath *g = tst_gadget_path(_broker, ns, link->gadget);
    CMAddKey(op, "Widget", &w, CMPI_ref);
    CMAddKey(op, "Gadget", &g, CMPI_ref);
    return op;
}

static CMPIInstance *link_instance(const char *ns, const TstLink *link, const char **props) {
    static const char *keys[] = {"Widget", "Gadget", NULL};
    CMPIObjectPath *op = link_path(ns, link);
    CMPIInstance *ci = CMNewInstance(_broker, op, NULL);
    CMPIObjectPath *w = tst_widget_path(_broker, ns, link->widget);
    CMPIObjectPath *g = tst_gadget_path(_broker, ns, link->gadget);
    if (props != NULL) CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Widget", &w, CMPI_ref);
    CMSetProperty(ci, "Gadget", &g, CMPI_ref);
    return ci;
}

/* ---- association MI ------------------------------------------------------------------- */

static CMPIStatus LinkAssociationCleanup(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                         CMPIBoolean term) {
    tst_note_cleanup(term);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkAssociators(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                  const CMPIResult *rslt, const CMPIObjectPath *op,
                                  const char *assocClass, const char *resultClass,
                                  const char *role, const char *resultRole,
                                  const char **props) {
    int i;
    for (i = 0; i < tst_link_count; i++) {
        CMPIObjectPath *end = far_end(op, &tst_links[i], role, resultClass, resultRole);
        CMPIStatus rc = {CMPI_RC_OK, NULL};
        CMPIInstance *ci;
        if (end == NULL) continue;
        ci = CBGetInstance(_broker, ctx, end, props, &rc);
        if (ci == NULL || rc.rc != CMPI_RC_OK) return rc;
        CMReturnInstance(rslt, ci);
    }
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkAssociatorNames(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const char *assocClass, const char *resultClass,
                                      const char *role, const char *resultRole) {
    int i;
    for (i = 0; i < tst_link_count; i++) {
        CMPIObjectPath *end = far_end(op, &tst_links[i], role, resultClass, resultRole);
        if (end != NULL) CMReturnObjectPath(rslt, end);
    }
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkReferences(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                 const CMPIResult *rslt, const CMPIObjectPath *op,
                                 const char *resultClass, const char *role, const char **props) {
    int i;
    if (resultClass != NULL && !tst_same(resultClass, "TST_WidgetGadget")) CMReturn(CMPI_RC_OK);
    for (i = 0; i < tst_link_count; i++) {
        if (far_end(op, &tst_links[i], role, NULL, NULL) != NULL) {
            CMReturnInstance(rslt, link_instance(tst_ns(op), &tst_links[i], props));
        }
    }
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkReferenceNames(CMPIAssociationMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op,
                                     const char *resultClass, const char *role) {
    int i;
    if (resultClass != NULL && !tst_same(resultClass, "TST_WidgetGadget")) CMReturn(CMPI_RC_OK);
    for (i = 0; i < tst_link_count; i++) {
        if (far_end(op, &tst_links[i], role, NULL, NULL) != NULL) {
            CMReturnObjectPath(rslt, link_path(tst_ns(op), &tst_links[i]));
        }
    }
    CMReturn(CMPI_RC_OK);
}

CMAssociationMIStub(Link, TST_WidgetGadget_Provider, _broker, CMNoHook)

/* ---- instance MI (enumeration only) --------------------------------------------------- */

static CMPIStatus LinkCleanup(CMPIInstanceMI *mi, const CMPIContext *ctx, CMPIBoolean term) {
    tst_note_cleanup(term);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkEnumInstanceNames(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                        const CMPIResult *rslt, const CMPIObjectPath *op) {
    int i;
    for (i = 0; i < tst_link_count; i++) CMReturnObjectPath(rslt, link_path(tst_ns(op), &tst_links[i]));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkEnumInstances(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                    const CMPIResult *rslt, const CMPIObjectPath *op,
                                    const char **props) {
    int i;
    for (i = 0; i < tst_link_count; i++) {
        CMReturnInstance(rslt, link_instance(tst_ns(op), &tst_links[i], props));
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus LinkGetInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                  const CMPIResult *rslt, const CMPIObjectPath *op,
                                  const char **props) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus LinkCreateInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op,
                                     const CMPIInstance *ci) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus LinkModifyInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op,
                                     const CMPIInstance *ci, const char **props) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus LinkDeleteInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus LinkExecQuery(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                const CMPIResult *rslt, const CMPIObjectPath *op,
                                const char *query, const char *lang) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMInstanceMIStub(Link, TST_WidgetGadget_Provider, _broker, CMNoHook)
