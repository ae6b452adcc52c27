// Vexlan_Adapter_Product as a class module: one slot per adapter, with no
// test for repeated serials (getInstance then finds the first).
#include "classes/Vexlan_Adapter_Product_CMPI.h"

#include <cstdio>

#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"

ClassList<ProductEntry> g_ProductList = {0, nullptr};

namespace {

const char kVendor[] = "Vexlan Corporation";

// The element name joins the entry's own fields, so the build joins it once.
void joinElementName(ProductEntry& e)
{
    JoinFCText(e.elementName, sizeof(e.elementName), {kVendor, "_", e.version, "_", e.name});
}

}  // namespace

void buildProductList()
{
    ClassList<ProductEntry>& list = g_ProductList;
    int capacity = 0;
    _zorap_adapter_list_t* adapters = classmodule::startBuild(list, classmodule::SlotPer::Adapter, capacity);
    if (adapters == nullptr)
        return;
    for (_zorap_adapter_t* a = adapters->firstAdapter; a != nullptr && list.count < capacity; a = a->next) {
        classmodule::buildLine(true, "Product", list.count);
        ProductEntry& entry = list.entries[list.count];
        copyFieldText(entry.identifyingNumber, a->serialNumber);
        copyFieldText(entry.name, a->productName);
        copyFieldText(entry.version, a->productVersion);
        entry.adapterType = AdapterTypeOfKind(a->adapterKind);
        joinElementName(entry);
        entry.valid = 1;
        ++list.count;
        classmodule::buildLine(false, "Product", list.count - 1);
    }
}

void removeProductList()
{
    g_ProductList.remove();
}

namespace {

const PropertyRow<ProductEntry> kProperties[] = {
    {"Name", CMPI_string, CLASS_VALUE(ProductEntry, entryText(e.name))},
    {"IdentifyingNumber", CMPI_string, CLASS_VALUE(ProductEntry, entryText(e.identifyingNumber))},
    {"Vendor", CMPI_string, CLASS_VALUE(ProductEntry, entryText(kVendor))},
    {"Version", CMPI_string, CLASS_VALUE(ProductEntry, entryText(e.version))},
    {"ElementName", CMPI_string, CLASS_VALUE(ProductEntry, entryText(e.elementName))},
    {"AdapterType", CMPI_uint32, CLASS_VALUE(ProductEntry, CmpiData(static_cast<CMPIUint32>(e.adapterType)))},
};

const char* const kKeys[] = {"Name", "IdentifyingNumber", "Vendor", "Version", nullptr};

const ClassModule<ProductEntry> kProduct =
    ClassModule<ProductEntry>("Product")
        .list(g_ProductList, ListKind::Dense)
        .key("IdentifyingNumber", [](const ProductEntry& e) -> const char* { return e.identifyingNumber; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(Product, kProduct)
