/* tst_store: the in-memory objects of the host's test provider module — widgets, gadgets and
 * the links between them — shared by its instance, method and association MIs. */
#ifndef TST_STORE_H
#define TST_STORE_H

#include "cmpimacs.h"

#define TST_MAX 16

typedef struct {
    int used;
    char id[32];
    char name[64];
    CMPIUint16 count;
    CMPIBoolean enabled;
} TstWidget;

typedef struct {
    const char *widget;
    const char *gadget;
} TstLink;

extern const char *const tst_gadgets[];
extern const int tst_gadget_count;
extern const TstLink tst_links[];
extern const int tst_link_count;

/* Widgets are shared by request threads; every access happens between lock and unlock. */
void tst_lock(void);
void tst_unlock(void);
TstWidget *tst_widgets(void);
TstWidget *tst_find_widget(const char *id);

/* Cleanup bookkeeping, read by the tests through dlsym. */
void tst_note_cleanup(CMPIBoolean terminating);

/* Key string of an object path, or NULL. */
const char *tst_key(const CMPIObjectPath *op, const char *name);
int tst_same(const char *a, const char *b);

CMPIObjectPath *tst_widget_path(const CMPIBroker *b, const char *ns, const char *id);
CMPIObjectPath *tst_gadget_path(const CMPIBroker *b, const char *ns, const char *tag);
CMPIInstance *tst_widget_instance(const CMPIBroker *b, const char *ns, const TstWidget *w,
                                  const char **props);
CMPIInstance *tst_gadget_instance(const CMPIBroker *b, const char *ns, const char *tag,
                                  const char **props);
/* Namespace of a request path ("" when unreadable). */
const char *tst_ns(const CMPIObjectPath *op);

#endif
