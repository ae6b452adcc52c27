// Vexlan_Adapter_Product: the catalogue view of each adapter of the library,
// one slot per adapter, IdentifyingNumber the adapter's serial.
#ifndef VEXLAN_CLASSES_VEXLAN_ADAPTER_PRODUCT_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_ADAPTER_PRODUCT_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"

struct ProductEntry {
    unsigned char valid;
    char identifyingNumber[128];   // the adapter's serial
    char name[128];                // the adapter's product name
    char version[128];             // the adapter's product version
    std::uint32_t adapterType;
    char elementName[512];         // ElementName, joined at the build
};

extern ClassList<ProductEntry> g_ProductList;

void buildProductList();
void removeProductList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(Product);

#endif
