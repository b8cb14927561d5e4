// Every public header as a host includes them, compiled with the stricter warnings hosts use.
#include <zv/zv.h>
