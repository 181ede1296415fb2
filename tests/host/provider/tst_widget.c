/* TST_Widget: instance and method MI of the host's test provider module, written against the
 * project's CMPI headers with the standard MI stubs. */
#include <pthread.h>
#include <stdlib.h>
#include <string.h>

#include "tst_store.h"

static const CMPIBroker *_broker;

/* ---- instance MI ---------------------------------------------------------------------- */

static CMPIStatus WidgetCleanup(CMPIInstanceMI *mi, const CMPIContext *ctx, CMPIBoolean term) {
    tst_note_cleanup(term);
    /* A CIMOM that is not terminating is asked to keep the MI. */
    if (!term) CMReturn(CMPI_RC_DO_NOT_UNLOAD);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetEnumInstanceNames(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                          const CMPIResult *rslt, const CMPIObjectPath *op) {
    int i;
    tst_lock();
    for (i = 0; i < TST_MAX; i++) {
        if (tst_widgets()[i].used) {
            CMReturnObjectPath(rslt, tst_widget_path(_broker, tst_ns(op), tst_widgets()[i].id));
        }
    }
    tst_unlock();
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetEnumInstances(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const char **props) {
    int i;
    tst_lock();
    for (i = 0; i < TST_MAX; i++) {
        if (tst_widgets()[i].used) {
            CMReturnInstance(rslt, tst_widget_instance(_broker, tst_ns(op), &tst_widgets()[i], props));
        }
    }
    tst_unlock();
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetGetInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                    const CMPIResult *rslt, const CMPIObjectPath *op,
                                    const char **props) {
    TstWidget *w;
    CMPIInstance *ci = NULL;
    tst_lock();
    w = tst_find_widget(tst_key(op, "InstanceID"));
    if (w != NULL) ci = tst_widget_instance(_broker, tst_ns(op), w, props);
    tst_unlock();
    if (ci == NULL) CMReturnWithChars(_broker, CMPI_RC_ERR_NOT_FOUND, "no such widget");
    CMReturnInstance(rslt, ci);
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

/* Count may arrive as any integer type. */
static int read_count(CMPIData d, CMPIUint16 *out) {
    if (CMIsNullValue(d)) return 0;
    switch (d.type) {
        case CMPI_uint16: *out = d.value.uint16; return 1;
        case CMPI_uint32: *out = (CMPIUint16)d.value.uint32; return 1;
        case CMPI_sint64: *out = (CMPIUint16)d.value.sint64; return 1;
        case CMPI_uint64: *out = (CMPIUint16)d.value.uint64; return 1;
        case CMPI_string: *out = (CMPIUint16)atoi(CMGetCharPtr(d.value.string)); return 1;
        default: return 0;
    }
}

static int wanted(const char **props, const char *name) {
    if (props == NULL) return 1;
    for (; *props != NULL; props++) {
        if (tst_same(*props, name)) return 1;
    }
    return 0;
}

static void apply(TstWidget *w, const CMPIInstance *ci, const char **props) {
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIData d = CMGetProperty(ci, "Name", &rc);
    if (rc.rc == CMPI_RC_OK && d.type == CMPI_string && !CMIsNullValue(d) && wanted(props, "Name")) {
        strncpy(w->name, CMGetCharPtr(d.value.string), sizeof w->name - 1);
    }
    d = CMGetProperty(ci, "Count", &rc);
    if (rc.rc == CMPI_RC_OK && wanted(props, "Count")) read_count(d, &w->count);
    d = CMGetProperty(ci, "Enabled", &rc);
    if (rc.rc == CMPI_RC_OK && d.type == CMPI_boolean && wanted(props, "Enabled")) {
        w->enabled = d.value.boolean;
    }
}

static CMPIStatus WidgetCreateInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                       const CMPIResult *rslt, const CMPIObjectPath *op,
                                       const CMPIInstance *ci) {
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIData id = CMGetProperty(ci, "InstanceID", &rc);
    const char *key;
    int i;
    if (rc.rc != CMPI_RC_OK || id.type != CMPI_string || CMIsNullValue(id)) {
        CMReturnWithChars(_broker, CMPI_RC_ERR_INVALID_PARAMETER, "InstanceID missing");
    }
    key = CMGetCharPtr(id.value.string);
    tst_lock();
    if (tst_find_widget(key) != NULL) {
        tst_unlock();
        CMReturnWithChars(_broker, CMPI_RC_ERR_ALREADY_EXISTS, "widget exists");
    }
    for (i = 0; i < TST_MAX && tst_widgets()[i].used; i++) {
    }
    if (i == TST_MAX) {
        tst_unlock();
        CMReturn(CMPI_RC_ERR_FAILED);
    }
    memset(&tst_widgets()[i], 0, sizeof(TstWidget));
    tst_widgets()[i].used = 1;
    strncpy(tst_widgets()[i].id, key, sizeof tst_widgets()[i].id - 1);
    apply(&tst_widgets()[i], ci, NULL);
    tst_unlock();
    CMReturnObjectPath(rslt, tst_widget_path(_broker, tst_ns(op), key));
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetModifyInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                       const CMPIResult *rslt, const CMPIObjectPath *op,
                                       const CMPIInstance *ci, const char **props) {
    TstWidget *w;
    tst_lock();
    w = tst_find_widget(tst_key(op, "InstanceID"));
    if (w != NULL) apply(w, ci, props);
    tst_unlock();
    if (w == NULL) CMReturn(CMPI_RC_ERR_NOT_FOUND);
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetDeleteInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                       const CMPIResult *rslt, const CMPIObjectPath *op) {
    TstWidget *w;
    tst_lock();
    w = tst_find_widget(tst_key(op, "InstanceID"));
    if (w != NULL) w->used = 0;
    tst_unlock();
    if (w == NULL) CMReturn(CMPI_RC_ERR_NOT_FOUND);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus WidgetExecQuery(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                  const CMPIResult *rslt, const CMPIObjectPath *op,
                                  const char *query, const char *lang) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMInstanceMIStub(Widget, TST_Widget_Provider, _broker, CMNoHook)

/* ---- method MI ------------------------------------------------------------------------ */

static CMPIStatus WidgetMethodCleanup(CMPIMethodMI *mi, const CMPIContext *ctx,
                                      CMPIBoolean term) {
    tst_note_cleanup(term);
    CMReturn(CMPI_RC_OK);
}

/* Platform computer systems seen through a broker up-call. */
static CMPIUint32 count_platform(const CMPIContext *ctx) {
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIObjectPath *op = CMNewObjectPath(_broker, "root/kvlhost", "KVLD_ComputerSystem", NULL);
    CMPIEnumeration *en = CBEnumInstances(_broker, ctx, op, NULL, &rc);
    CMPIUint32 n = 0;
    if (en == NULL || rc.rc != CMPI_RC_OK) return 0;
    while (CMHasNext(en, NULL)) {
        CMPIData d = CMGetNext(en, NULL);
        if (d.type == CMPI_instance && CMClassPathIsA(_broker, CMGetObjectPath(d.value.inst, NULL),
                                                      "CIM_ComputerSystem", NULL)) {
            n++;
        }
    }
    return n;
}

typedef struct {
    CMPIContext *ctx;
    CMPIUint32 count;
    CMPIrc attach;
    CMPIrc detach;
} ThreadJob;

static void *thread_main(void *arg) {
    ThreadJob *job = (ThreadJob *)arg;
    job->attach = CBAttachThread(_broker, job->ctx).rc;
    job->count = count_platform(job->ctx);
    job->detach = CBDetachThread(_broker, job->ctx).rc;
    return NULL;
}

static CMPIStatus WidgetInvokeMethod(CMPIMethodMI *mi, const CMPIContext *ctx,
                                     const CMPIResult *rslt, const CMPIObjectPath *op,
                                     const char *method, const CMPIArgs *in, CMPIArgs *out) {
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIUint32 result = 0;
    if (tst_same(method, "Add")) {
        CMPIUint16 amount = 0;
        TstWidget *w;
        if (!read_count(CMGetArg(in, "Amount", &rc), &amount)) {
            CMReturnWithChars(_broker, CMPI_RC_ERR_INVALID_PARAMETER, "Amount missing");
        }
        tst_lock();
        w = tst_find_widget(tst_key(op, "InstanceID"));
        if (w != NULL) {
            w->count = (CMPIUint16)(w->count + amount);
            result = w->count;
        }
        tst_unlock();
        if (w == NULL) CMReturn(CMPI_RC_ERR_NOT_FOUND);
        CMAddArg(out, "NewCount", &result, CMPI_uint32);
    } else if (tst_same(method, "Echo")) {
        CMPIData text = CMGetArg(in, "Text", &rc);
        if (rc.rc != CMPI_RC_OK || text.type != CMPI_string) CMReturn(CMPI_RC_ERR_INVALID_PARAMETER);
        CMAddArg(out, "Echoed", &text.value.string, CMPI_string);
    } else if (tst_same(method, "CountPlatform")) {
        result = count_platform(ctx);
    } else if (tst_same(method, "SpawnThread")) {
        ThreadJob job = {NULL, 0, CMPI_RC_ERR_FAILED, CMPI_RC_ERR_FAILED};
        pthread_t t;
        job.ctx = CBPrepareAttachThread(_broker, ctx);
        if (job.ctx == NULL || pthread_create(&t, NULL, thread_main, &job) != 0) {
            CMReturn(CMPI_RC_ERR_FAILED);
        }
        pthread_join(t, NULL);
        if (job.attach != CMPI_RC_OK || job.detach != CMPI_RC_OK) CMReturn(CMPI_RC_ERR_FAILED);
        result = job.count;
    } else {
        CMReturnWithChars(_broker, CMPI_RC_ERR_METHOD_NOT_FOUND, method);
    }
    CMReturnData(rslt, &result, CMPI_uint32);
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

CMMethodMIStub(Widget, TST_Widget_Provider, _broker, CMNoHook)
