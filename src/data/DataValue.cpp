#include "data/DataValue.h"

#include "foundation/TextHeap.h"

void DataValue::Free()
{
    name.Free();
    FreeText(value);
    value = nullptr;
}
