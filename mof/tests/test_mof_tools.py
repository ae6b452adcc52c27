#!/usr/bin/env python3
"""Tests of check_mof.py and gen-registration.sh: each known fault in a copy
of the class tree must be reported, and the generated registrations must
follow the table."""
import os
import shutil
import subprocess
import sys
import tempfile
import unittest

HERE = os.path.dirname(os.path.abspath(__file__))
MOFDIR = os.path.dirname(HERE)
sys.dont_write_bytecode = True       # keep the source tree clean
sys.path.insert(0, MOFDIR)
import check_mof  # noqa: E402

GEN = os.path.join(MOFDIR, 'gen-registration.sh')


class Tree:
    """A scratch copy of the class tree that a test may damage."""

    def __init__(self):
        self.dir = tempfile.mkdtemp(prefix='vexlan-mof-')
        for sub in ('dmtf', 'vexlan'):
            shutil.copytree(os.path.join(MOFDIR, sub), os.path.join(self.dir, sub))
        shutil.copy(os.path.join(MOFDIR, 'classes.tsv'), self.dir)

    def path(self, rel):
        return os.path.join(self.dir, rel)

    def read(self, rel):
        with open(self.path(rel), encoding='utf-8') as f:
            return f.read()

    def write(self, rel, text):
        with open(self.path(rel), 'w', encoding='utf-8') as f:
            f.write(text)

    def replace(self, rel, old, new, count=1):
        text = self.read(rel)
        assert old in text, (rel, old)
        self.write(rel, text.replace(old, new, count))

    def rows(self):
        return [r for r in self.read('classes.tsv').split('\n') if r and not r.startswith('#')]

    def edit_row(self, cls, column, value):
        lines = self.read('classes.tsv').split('\n')
        for i, r in enumerate(lines):
            fields = r.split('\t')
            if fields[0] == cls:
                fields[check_mof.TABLE_FIELDS.index(column)] = value
                lines[i] = '\t'.join(fields)
                break
        else:
            raise AssertionError('no row ' + cls)
        self.write('classes.tsv', '\n'.join(lines))

    def errors(self, generated=None, **kw):
        return check_mof.Checker(self.dir).run(generated, **kw)

    def cleanup(self):
        shutil.rmtree(self.dir, ignore_errors=True)


class TreeTest(unittest.TestCase):
    def setUp(self):
        self.tree = Tree()

    def tearDown(self):
        self.tree.cleanup()

    def assertReported(self, fragment, **kw):
        errors = self.tree.errors(**kw)
        self.assertTrue(any(fragment in e for e in errors),
                        'expected a report containing %r, got:\n%s' % (fragment, '\n'.join(errors) or '(none)'))


class ParserTest(unittest.TestCase):
    def test_class_features(self):
        cls, = check_mof.parse_text('''
            // comment
            #pragma locale ("en_US")
            [Abstract, Description ("two " "parts"), Version ("1") : ToSubclass]
            class A : B {
               [Key, MaxLen (16)] string Name;
               uint8 Data[256];
               uint16 Flags[] = {1, 2};
               /* block */ sint32 Level = -4;
               [Key, Override ("Left")] C REF Left;
               uint32 Go([In] string URI, [In (false), Out] D REF Job, [In] uint16 Options[]);
            };''')
        self.assertEqual((cls.name, cls.superclass), ('A', 'B'))
        self.assertTrue(check_mof.qualifier_true(cls.qualifiers, 'abstract'))
        self.assertEqual(cls.qualifiers['description'], ['two parts'])
        names = [(p.name, p.type, p.array, p.key) for p in cls.properties]
        self.assertEqual(names, [('Name', 'string', False, True), ('Data', 'uint8', True, False),
                                 ('Flags', 'uint16', True, False), ('Level', 'sint32', False, False),
                                 ('Left', 'ref', False, True)])
        self.assertEqual(cls.properties[-1].ref, 'C')
        go, = cls.methods
        self.assertEqual([(p.name, p.signature()) for p in go.params],
                         [('URI', 'string'), ('Job', 'd REF'), ('Options', 'uint16[]')])
        self.assertFalse(check_mof.qualifier_true(go.params[1].qualifiers, 'in'))

    def test_instances(self):
        inst, = check_mof.parse_text('instance of X { A = "a"; B = {2, 3}; C = NULL; };')
        self.assertEqual(inst.values, {'A': 'a', 'B': ['2', '3'], 'C': 'NULL'})

    def test_malformed_text(self):
        for text in ('class A { string Name; ', 'class A { strin Name; };', 'class A { string Name };',
                     'class A { string Name; } ', 'class A { string @Name; };', 'class A : { };',
                     '[Key string Name;', 'class A { B REF R[]; };'):
            with self.subTest(text=text):
                with self.assertRaises(check_mof.MofError):
                    check_mof.parse_text(text)


class ClassFileFaults(TreeTest):
    def test_real_tree_is_consistent(self):
        self.assertEqual(self.tree.errors(), [])

    def test_unknown_type(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_FCPort.mof', 'string VPDData', 'strng VPDData')
        self.assertReported("unknown CIM type 'strng'")

    def test_unbalanced_braces(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_FCPort.mof', '};', '')
        self.assertReported('vexlan/Vexlan_FCHBA_FCPort.mof: line')

    def test_missing_superclass(self):
        os.remove(self.tree.path('dmtf/CIM_FCPort.mof'))
        self.assertReported('superclass CIM_FCPort of Vexlan_FCHBA_FCPort is not declared')

    def test_missing_ancestor_deep_in_the_chain(self):
        os.remove(self.tree.path('dmtf/CIM_LogicalPort.mof'))
        self.assertReported('superclass CIM_LogicalPort of CIM_NetworkPort is not declared')

    def test_missing_reference_class(self):
        os.remove(self.tree.path('dmtf/CIM_ConcreteJob.mof'))
        self.assertReported('reference class CIM_ConcreteJob of')

    def test_file_named_after_another_class(self):
        os.rename(self.tree.path('vexlan/Vexlan_FCHBA_FCPort.mof'), self.tree.path('vexlan/Vexlan_FCHBA_Port.mof'))
        self.assertReported('file name should be Vexlan_FCHBA_FCPort.mof')

    def test_two_classes_in_one_file(self):
        text = self.tree.read('vexlan/Vexlan_NIC_NetworkPort.mof')
        self.tree.write('vexlan/Vexlan_FCHBA_FCPort.mof', self.tree.read('vexlan/Vexlan_FCHBA_FCPort.mof') + text)
        self.assertReported('declares exactly one class')

    def test_inherited_property_redeclared_with_another_type(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_FCPort.mof', 'string VPDData;', 'string VPDData;\n   string PortType;')
        errors = self.tree.errors()
        self.assertTrue(any('without Override' in e for e in errors), errors)
        self.assertTrue(any('is string, but CIM_LogicalPort declares it uint16' in e for e in errors), errors)

    def test_override_of_nothing(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_FCPort.mof', 'string VPDData;', '[Override ("VPDData")] string VPDData;')
        self.assertReported('no superclass has a property of that name')

    def test_reference_narrowed_to_an_unrelated_class(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_ComputerSystemFCPort.mof',
                          'Vexlan_FCHBA_FCPort REF PartComponent', 'Vexlan_Adapter_Product REF PartComponent')
        self.assertReported('narrows CIM_LogicalDevice REF to Vexlan_Adapter_Product')

    def test_method_override_with_other_parameters(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_SoftwareInstallationService.mof', '[In] string URI,', '[In] string Location,')
        self.assertReported('has parameters unlike those of CIM_SoftwareInstallationService')

    def test_association_with_one_reference(self):
        self.tree.write('vexlan/Vexlan_FCHBA_ComputerSystemFCPort.mof',
                        '[Association]\nclass Vexlan_FCHBA_ComputerSystemFCPort : CIM_ManagedElement {\n'
                        '   [Key] Vexlan_FCHBA_FCPort REF PartComponent;\n};\n')
        self.tree.edit_row('Vexlan_FCHBA_ComputerSystemFCPort', 'superclass', 'CIM_ManagedElement')
        self.assertReported('needs two key references')

    def test_references_outside_an_association(self):
        self.tree.replace('vexlan/Vexlan_FCHBA_FCPort.mof', 'string VPDData;', 'Vexlan_FCHBA_FCPort REF Peer;')
        self.assertReported('has references but is no association')


class TableFaults(TreeTest):
    def test_class_file_without_row(self):
        self.tree.write('classes.tsv', '\n'.join(r for r in self.tree.read('classes.tsv').split('\n')
                                                 if not r.startswith('Vexlan_NIC_NetworkPort\t')))
        self.assertReported('Vexlan_NIC_NetworkPort has no row in classes.tsv')

    def test_row_without_class_file(self):
        self.tree.write('classes.tsv', self.tree.read('classes.tsv') +
                        'Vexlan_X\troot/vexlan_cmpi\tCIM_FCPort\tinstance\tDeviceID\tvexlan/Vexlan_X.mof\n')
        self.assertReported('no class file declares Vexlan_X')

    def test_duplicate_row(self):
        row = [r for r in self.tree.rows() if r.startswith('Vexlan_FCHBA_FCPort\t')][0]
        self.tree.write('classes.tsv', self.tree.read('classes.tsv') + row + '\n')
        self.assertReported('Vexlan_FCHBA_FCPort has a row already')

    def test_short_row(self):
        self.tree.write('classes.tsv', self.tree.read('classes.tsv') + 'Vexlan_X\troot/vexlan_cmpi\tCIM_FCPort\n')
        self.assertReported('expected 6 non-empty tab-separated fields')

    def test_superclass_disagrees(self):
        self.tree.edit_row('Vexlan_FCHBA_FCPort', 'superclass', 'CIM_NetworkPort')
        self.assertReported('superclass of Vexlan_FCHBA_FCPort is CIM_FCPort in the class file, CIM_NetworkPort in the row')

    def test_keys_disagree(self):
        self.tree.edit_row('Vexlan_FCHBA_FCPort', 'keys', 'DeviceID')
        self.assertReported('keys of Vexlan_FCHBA_FCPort are CreationClassName,DeviceID,SystemCreationClassName,SystemName')

    def test_unknown_namespace_and_type(self):
        self.tree.edit_row('Vexlan_FCHBA_FCPort', 'namespaces', 'root/vexlan_cmpi root/cimv2')
        self.tree.edit_row('Vexlan_NIC_NetworkPort', 'types', 'instance query')
        errors = self.tree.errors()
        self.assertTrue(any("unknown namespace 'root/cimv2'" in e for e in errors), errors)
        self.assertTrue(any("provider types 'instance query'" in e for e in errors), errors)

    def test_association_registered_as_instance_only(self):
        self.tree.edit_row('Vexlan_FCHBA_ComputerSystemFCPort', 'types', 'instance')
        self.assertReported('Vexlan_FCHBA_ComputerSystemFCPort is an association')

    def test_indication_registered_as_instance(self):
        self.tree.edit_row('Vexlan_NIC_IndicationEthernetPortLinkUp', 'types', 'instance')
        self.assertReported('Vexlan_NIC_IndicationEthernetPortLinkUp is an indication')

    def test_method_provider_without_methods(self):
        self.tree.edit_row('Vexlan_FCHBA_FCPort', 'types', 'instance method')
        self.assertReported('has no methods, yet is registered as method provider')

    def test_association_before_its_end(self):
        lines = self.tree.read('classes.tsv').split('\n')
        assoc = [i for i, r in enumerate(lines) if r.startswith('Vexlan_FCHBA_ComputerSystemFCPort\t')][0]
        end = [i for i, r in enumerate(lines) if r.startswith('Vexlan_FCHBA_FCPort\t')][0]
        row = lines.pop(assoc)
        lines.insert(end, row)
        self.tree.write('classes.tsv', '\n'.join(lines))
        self.assertReported('Vexlan_FCHBA_ComputerSystemFCPort needs Vexlan_FCHBA_FCPort, whose row comes later')

    def test_interop_class_needs_its_ends_in_interop(self):
        self.tree.edit_row('Vexlan_NIC_RegisteredProfile', 'namespaces', 'root/vexlan_cmpi')
        self.assertReported('Vexlan_NIC_ElementConformsToRegisteredProfile needs Vexlan_NIC_RegisteredProfile in interop')


def generate(table, out, *options):
    return subprocess.run(['sh', GEN] + list(options) + [table, out],
                          stdout=subprocess.PIPE, stderr=subprocess.PIPE, universal_newlines=True)


class GeneratedFiles(TreeTest):
    def setUp(self):
        super().setUp()
        self.out = os.path.join(self.tree.dir, 'out')

    def gen(self, *options):
        r = generate(self.tree.path('classes.tsv'), self.out, *options)
        self.assertEqual(r.returncode, 0, r.stderr)

    def test_generated_files_follow_the_table(self):
        self.gen()
        self.assertEqual(self.tree.errors(generated=self.out), [])
        reg = self.tree.read('out/Vexlan_CNA_Provider.reg')
        self.assertIn('[Vexlan_FCHBA_ComputerSystemFCPort]\n   provider: Vexlan_CNA_Provider\n'
                      '   location: Vexlan_CNA_Provider\n   type: instance association\n'
                      '   namespace: root/vexlan_cmpi\n', reg)
        self.assertIn('namespace: root/vexlan_cmpi root/interop', reg)
        pg = self.tree.read('out/Vexlan_CNA_Provider_Registration.mof')
        # OpenPegasus's interop namespace belongs to its own interop provider:
        # the profiles go there as PG_ProviderProfileCapabilities, no class does.
        self.assertNotIn('PG_InterOp"', pg)
        self.assertIn('ClassName = "Vexlan_NIC_RegisteredProfile";\n    Namespaces = {"root/vexlan_cmpi"};', pg)
        self.assertIn('RegisteredProfile = 6;', pg)
        self.assertIn('RegisteredSubProfiles = {1019, 1024};', pg)
        self.assertIn('ConformingElements = {"Vexlan_Adapter_ComputerSystem"};', pg)
        self.assertIn('ProviderType = {2, 5};', pg)
        self.assertIn('ProviderType = {4};', pg)

    def test_unregistered_rows_are_declared_but_not_registered(self):
        self.tree.edit_row('Vexlan_NIC_RemoteServiceAccessPoint', 'types', '-')
        for assoc in ('Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint',
                      'Vexlan_NIC_RemoteServiceAccessPointIPProtocolEndpoint'):
            self.tree.edit_row(assoc, 'types', '-')
        self.gen()
        self.assertNotIn('[Vexlan_NIC_RemoteServiceAccessPoint]', self.tree.read('out/Vexlan_CNA_Provider.reg'))
        self.assertNotIn('"Vexlan_NIC_RemoteServiceAccessPoint"', self.tree.read('out/Vexlan_CNA_Provider_Registration.mof'))
        self.assertIn('class Vexlan_NIC_RemoteServiceAccessPoint ', self.tree.read('out/Vexlan_CNA_Provider.mof'))

    def test_schema_classes_are_registered_but_not_declared(self):
        self.gen()
        self.assertIn('[CIM_InstModification]\n   provider: Vexlan_CNA_Provider\n   location: Vexlan_CNA_Provider\n'
                      '   type: indication\n   namespace: root/vexlan_cmpi\n', self.tree.read('out/Vexlan_CNA_Provider.reg'))
        self.assertIn('ClassName = "CIM_InstCreation";', self.tree.read('out/Vexlan_CNA_Provider_Registration.mof'))
        self.assertNotIn('class CIM_Inst', self.tree.read('out/Vexlan_CNA_Provider.mof'))
        # A class MOF that declares one anyway disagrees with the table.
        self.tree.write('out/Vexlan_CNA_Provider.mof', self.tree.read('out/Vexlan_CNA_Provider.mof') +
                        self.tree.read('dmtf/CIM_InstCreation.mof'))
        self.assertTrue(any('Vexlan_CNA_Provider.mof' in e for e in self.tree.errors(generated=self.out)))

    def test_a_new_row_is_registered(self):
        self.tree.write('vexlan/Vexlan_FCHBA_FCPortTwo.mof', 'class Vexlan_FCHBA_FCPortTwo : Vexlan_FCHBA_FCPort {};\n')
        self.tree.write('classes.tsv', self.tree.read('classes.tsv') +
                        'Vexlan_FCHBA_FCPortTwo\troot/vexlan_cmpi\tVexlan_FCHBA_FCPort\tinstance\t'
                        'SystemCreationClassName,SystemName,CreationClassName,DeviceID\tvexlan/Vexlan_FCHBA_FCPortTwo.mof\n')
        self.gen()
        self.assertEqual(self.tree.errors(generated=self.out), [])
        self.assertIn('[Vexlan_FCHBA_FCPortTwo]', self.tree.read('out/Vexlan_CNA_Provider.reg'))

    def test_interop_names_per_server(self):
        self.gen('--pegasus-interop', 'root/pg_x', '--sfcb-interop', 'root/sfcb_x', '--version', '9.9.9')
        self.assertEqual(self.tree.errors(generated=self.out, pegasus_interop='root/pg_x',
                                          sfcb_interop='root/sfcb_x'), [])
        self.assertIn('Version = "9.9.9";', self.tree.read('out/Vexlan_CNA_Provider_Registration.mof'))
        self.assertTrue(self.tree.errors(generated=self.out))    # the default names no longer match

    def test_tampered_outputs_are_reported(self):
        self.gen()
        self.tree.replace('out/Vexlan_CNA_Provider.reg', '[Vexlan_FCHBA_FCPort]', '[Vexlan_FCHBA_FCPortX]')
        self.tree.replace('out/Vexlan_CNA_Provider_Registration.mof', 'ProviderType = {2, 5};', 'ProviderType = {2};')
        self.tree.replace('out/Vexlan_CNA_Provider_Interop.mof', 'class Vexlan_FCHBA_RegisteredProfile ',
                          'class Vexlan_FCHBA_RegisteredProfileX ')
        self.tree.replace('out/Vexlan_CNA_Provider_Registration.mof', 'ConformingElements = {"Vexlan_NIC_NetworkPort"}',
                          'ConformingElements = {"Vexlan_NIC_NetworkPortX"}')
        errors = self.tree.errors(generated=self.out)
        for fragment in ('Vexlan_FCHBA_FCPort has no section', 'section vexlan_fchba_fcportx has no registered row',
                         'has ProviderType', 'Vexlan_CNA_Provider_Interop.mof: holds',
                         'names Vexlan_NIC_NetworkPortX, which the provider does not serve'):
            self.assertTrue(any(fragment in e for e in errors), (fragment, errors))

    def test_bad_table_stops_the_generator(self):
        self.tree.write('classes.tsv', self.tree.read('classes.tsv') + 'Vexlan_X\troot/vexlan_cmpi\n')
        r = generate(self.tree.path('classes.tsv'), self.out)
        self.assertNotEqual(r.returncode, 0)
        self.assertIn('expected 6 tab-separated fields', r.stderr)

    def test_missing_class_file_stops_the_generator(self):
        os.remove(self.tree.path('vexlan/Vexlan_NIC_NetworkPort.mof'))
        r = generate(self.tree.path('classes.tsv'), self.out)
        self.assertNotEqual(r.returncode, 0)
        self.assertIn('missing class file', r.stderr)

    def test_unknown_provider_type_stops_the_generator(self):
        self.tree.edit_row('Vexlan_FCHBA_FCPort', 'types', 'instance query')
        r = generate(self.tree.path('classes.tsv'), self.out)
        self.assertNotEqual(r.returncode, 0)
        self.assertIn('unknown provider type query', r.stderr)


if __name__ == '__main__':
    unittest.main(verbosity=1)
