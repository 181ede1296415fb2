/* tst_store: widgets, gadgets, links and the CMPI objects made from them. */
#include "tst_store.h"

#include <pthread.h>
#include <stdio.h>
#include <string.h>
#include <strings.h>

static pthread_mutex_t store_mutex = PTHREAD_MUTEX_INITIALIZER;
static TstWidget widgets[TST_MAX] = {
    {1, "W1", "first", 1, 1},
    {1, "W2", "second", 2, 0},
    {1, "W3", "third", 3, 1},
};

const char *const tst_gadgets[] = {"G1", "G2"};
const int tst_gadget_count = 2;
const TstLink tst_links[] = {{"W1", "G1"}, {"W2", "G1"}, {"W3", "G2"}};
const int tst_link_count = 3;

static int cleanup_calls;
static int terminating_calls;

int tst_cleanup_calls(void) { return cleanup_calls; }
int tst_terminating_calls(void) { return terminating_calls; }

void tst_note_cleanup(CMPIBoolean terminating) {
    pthread_mutex_lock(&store_mutex);
    cleanup_calls++;
    if (terminating) terminating_calls++;
    pthread_mutex_unlock(&store_mutex);
}

void tst_lock(void) { pthread_mutex_lock(&store_mutex); }
void tst_unlock(void) { pthread_mutex_unlock(&store_mutex); }
TstWidget *tst_widgets(void) { return widgets; }

TstWidget *tst_find_widget(const char *id) {
    int i;
    if (id == NULL) return NULL;
    for (i = 0; i < TST_MAX; i++) {
        if (widgets[i].used && strcmp(widgets[i].id, id) == 0) return &widgets[i];
    }
    return NULL;
}

int tst_same(const char *a, const char *b) {
    return a != NULL && b != NULL && strcasecmp(a, b) == 0;
}

const char *tst_key(const CMPIObjectPath *op, const char *name) {
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIData d = CMGetKey(op, name, &rc);
    if (rc.rc != CMPI_RC_OK || d.type != CMPI_string || CMIsNullValue(d)) return NULL;
    return CMGetCharPtr(d.value.string);
}

const char *tst_ns(const CMPIObjectPath *op) {
    CMPIString *ns = CMGetNameSpace(op, NULL);
    return ns == NULL ? "" : CMGetCharsPtr(ns, NULL);
}

CMPIObjectPath *tst_widget_path(const CMPIBroker *b, const char *ns, const char *id) {
    CMPIObjectPath *op = CMNewObjectPath(b, ns, "TST_Widget", NULL);
    if (op != NULL) CMAddKey(op, "InstanceID", id, CMPI_chars);
    return op;
}

CMPIObjectPath *tst_gadget_path(const CMPIBroker *b, const char *ns, const char *tag) {
    CMPIObjectPath *op = CMNewObjectPath(b, ns, "TST_Gadget", NULL);
    if (op != NULL) CMAddKey(op, "Tag", tag, CMPI_chars);
    return op;
}

CMPIInstance *tst_widget_instance(const CMPIBroker *b, const char *ns, const TstWidget *w,
                                  const char **props) {
    static const char *keys[] = {"InstanceID", NULL};
    CMPIObjectPath *op = tst_widget_path(b, ns, w->id);
    CMPIInstance *ci = CMNewInstance(b, op, NULL);
    CMPIArray *tags;
    CMPIDateTime *created;
    CMPIString *label;
    char text[96];
    if (ci == NULL) return NULL;
    if (props != NULL) CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "InstanceID", w->id, CMPI_chars);
    CMSetProperty(ci, "Name", w->name, CMPI_chars);
    CMSetProperty(ci, "Count", &w->count, CMPI_uint16);
    CMSetProperty(ci, "Enabled", &w->enabled, CMPI_boolean);
    tags = CMNewArray(b, 2, CMPI_string, NULL);
    CMSetArrayElementAt(tags, 0, "red", CMPI_chars);
    CMSetArrayElementAt(tags, 1, w->id, CMPI_chars);
    CMSetProperty(ci, "Tags", &tags, CMPI_stringA);
    created = CMNewDateTimeFromChars(b, "20240102030405.000000+000", NULL);
    CMSetProperty(ci, "Created", &created, CMPI_dateTime);
    snprintf(text, sizeof text, "widget %s", w->id);
    label = CMNewString(b, text, NULL);
    CMSetProperty(ci, "Label", &label, CMPI_string);
    CMSetProperty(ci, "Nothing", NULL, CMPI_string);
    return ci;
}

CMPIInstance *tst_gadget_instance(const CMPIBroker *b, const char *ns, const char *tag,
                                  const char **props) {
    static const char *keys[] = {"Tag", NULL};
    CMPIInstance *ci = CMNewInstance(b, tst_gadget_path(b, ns, tag), NULL);
    CMPISint32 weight = -7;
    if (ci == NULL) return NULL;
    if (props != NULL) CMSetPropertyFilter(ci, props, keys);
    CMSetProperty(ci, "Tag", tag, CMPI_chars);
    CMSetProperty(ci, "Weight", &weight, CMPI_sint32);
    return ci;
}
