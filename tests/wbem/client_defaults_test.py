#!/usr/bin/env python3
"""What client libraries send when nobody tells them otherwise, and that a validating parser accepts
each answer."""
import http.client
import os
import shutil
import subprocess
import unittest
from xml.etree import ElementTree

import wbemcli_support as support

DTD = os.path.join(os.path.dirname(os.path.abspath(__file__)), "cim-xml.dtd")
VENDOR = "root/sample"
INTEROP = "root/interop"
running = {}


def setUpModule():
    if shutil.which("xmllint") is None:
        raise RuntimeError("xmllint is not installed; scripts/install-deps installs it")
    running["server"] = support.Server(support.scenario_file("healthy-array"))


def tearDownModule():
    running["server"].end()


def invalidity(text):
    """What the validating parser says of an answer; "" when it is valid."""
    result = subprocess.run(["xmllint", "--noout", "--nonet", "--dtdvalid", DTD, "-"], input=text,
                            capture_output=True, check=False)
    return "" if result.returncode == 0 else result.stderr.decode("utf-8", "replace")


def namespace_path(name_space):
    return "".join(f'<NAMESPACE NAME="{part}" />' for part in name_space.split("/"))


class Status(Exception):
    """An answer with an error; `number` is its code."""

    def __init__(self, error):
        super().__init__(error.get("DESCRIPTION"))
        self.number = int(error.get("CODE"))


class ClientDefaults(unittest.TestCase):
    maxDiff = 2000

    def call(self, method, name_space, **parameters):
        """The elements of the result. Values are XML."""
        values = "".join(f'<IPARAMVALUE NAME="{name}">{value}</IPARAMVALUE>'
                         for name, value in parameters.items())
        body = ('<?xml version="1.0" encoding="utf-8" ?>\n<CIM CIMVERSION="2.0" DTDVERSION="2.0">'
                '<MESSAGE ID="1001" PROTOCOLVERSION="1.0"><SIMPLEREQ>'
                f'<IMETHODCALL NAME="{method}"><LOCALNAMESPACEPATH>{namespace_path(name_space)}'
                f'</LOCALNAMESPACEPATH>{values}</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>')
        connection = http.client.HTTPConnection(running["server"].host, timeout=60)
        self.addCleanup(connection.close)
        connection.request("POST", "/cimom", body.encode("utf-8"), {
            "Content-type": 'application/xml; charset="utf-8"', "CIMOperation": "MethodCall",
            "CIMMethod": method, "CIMObject": name_space, "Accept-Encoding": "identity"})
        response = connection.getresponse()
        self.assertEqual(response.status, 200)
        text = response.read()
        self.assertEqual(invalidity(text), "")
        answer = ElementTree.fromstring(text).find(".//IMETHODRESPONSE")
        self.assertEqual(answer.get("NAME"), method)
        error = answer.find("ERROR")
        if error is not None:
            raise Status(error)
        return list(answer.find("IRETURNVALUE"))

    def class_call(self, method, name_space, name, **parameters):
        return self.call(method, name_space, ClassName=f'<CLASSNAME NAME="{name}" />', **parameters)

    def assert_status(self, number, method, *arguments, **parameters):
        with self.assertRaises(Status) as caught:
            self.call(method, *arguments, **parameters)
        self.assertEqual(caught.exception.number, number)

    @staticmethod
    def xml(element):
        return ElementTree.tostring(element, encoding="unicode")

    @staticmethod
    def properties(element):
        """Name to text of the single properties that have a value."""
        return {node.get("NAME"): node.findtext("VALUE") for node in element.iter("PROPERTY")}

    def test_namespaces_are_found(self):
        self.assert_status(3, "EnumerateInstanceNames", "interop",
                           ClassName='<CLASSNAME NAME="CIM_Namespace" />')
        for name in ("CIM_Namespace", "__Namespace"):
            found = self.class_call("EnumerateInstances", INTEROP, name)
            names = {self.properties(instance)["Name"] for instance in found}
            self.assertEqual(names, {"root/cimv2", INTEROP, VENDOR}, name)

    def test_server_is_found(self):
        found = self.class_call("EnumerateInstances", INTEROP, "CIM_ObjectManager")
        self.assertEqual(len(found), 1)
        self.assertEqual(self.properties(found[0])["ElementName"], "plexor-testbed")
        name = self.xml(found[0].find("INSTANCENAME"))
        again = self.call("GetInstance", INTEROP, InstanceName=name)
        self.assertEqual(self.properties(again[0]), self.properties(found[0]))

    def test_profiles_are_found(self):
        found = self.class_call("EnumerateInstances", INTEROP, "CIM_RegisteredProfile")
        self.assertIn("Host Hardware RAID Controller",
                      [self.properties(profile)["RegisteredName"] for profile in found])

    def test_pull_operations_come_first(self):
        for method in ("OpenEnumerateInstances", "OpenEnumerateInstancePaths"):
            self.assert_status(7, method, "root/cimv2",
                               ClassName='<CLASSNAME NAME="CIM_DiskDrive" />',
                               MaxObjectCount="<VALUE>1000</VALUE>")

    def test_instances_have_all_properties_without_local_only(self):
        drives = self.class_call("EnumerateInstances", VENDOR, "CIM_DiskDrive")
        self.assertEqual(len(drives), 8)
        for drive in drives:
            self.assertTrue(self.properties(drive)["DeviceID"])
            self.assertGreaterEqual(len(self.properties(drive)), 5)

    def test_keys_tell_their_type(self):
        for name in self.class_call("EnumerateInstanceNames", VENDOR, "CIM_DiskDrive"):
            self.assertEqual({key.get("TYPE") for key in name.iter("KEYVALUE")}, {"string"})

    def test_walk_over_all_classes(self):
        for name_space in ("root/cimv2", INTEROP, VENDOR):
            classes = self.call("EnumerateClasses", name_space, DeepInheritance="<VALUE>TRUE</VALUE>",
                                LocalOnly="<VALUE>FALSE</VALUE>",
                                IncludeQualifiers="<VALUE>TRUE</VALUE>",
                                IncludeClassOrigin="<VALUE>TRUE</VALUE>")
            self.assertGreater(len(classes), 50)
            for element in classes:
                self.check_class(element)

    def check_class(self, element):
        name = element.get("NAME")
        qualifiers = {node.get("NAME"): node for node in element.findall("QUALIFIER")}
        references = element.findall("PROPERTY.REFERENCE")
        if references:
            self.assertIn("Association", qualifiers, name)
        for reference in references:
            self.assertTrue(reference.get("REFERENCECLASS"), name)
            self.assertIn("Key", [node.get("NAME") for node in reference.iter("QUALIFIER")], name)
        for node in element.iter():
            if node.tag.startswith("PROPERTY"):
                self.assertTrue(node.get("CLASSORIGIN"), name)

    def test_qualifiers_tell_what_classes_and_numbers_are(self):
        element = self.class_call("GetClass", VENDOR, "CIM_ManagedSystemElement")[0]
        self.assertIn("Abstract", [node.get("NAME") for node in element.findall("QUALIFIER")])
        status = next(node for node in element.iter("PROPERTY.ARRAY")
                      if node.get("NAME") == "OperationalStatus")
        lists = {node.get("NAME"): [value.text for value in node.iter("VALUE")]
                 for node in status.findall("QUALIFIER")}
        self.assertEqual(lists["Values"][lists["ValueMap"].index("5")], "Predictive Failure")

    def test_references_from_an_instance_and_back(self):
        drive = self.class_call("EnumerateInstanceNames", VENDOR, "CIM_DiskDrive")[0]
        references = self.call("References", VENDOR, ObjectName=self.xml(drive))
        self.assertTrue(references)
        for reference in references:
            name = reference.find("INSTANCEPATH/INSTANCENAME")
            class_name = name.get("CLASSNAME")
            again = self.call("GetInstance", VENDOR, InstanceName=self.xml(name))[0]
            self.assertEqual(self.xml(again), self.xml(reference.find("INSTANCE")), class_name)
            listed = self.class_call("EnumerateInstances", VENDOR, class_name)
            self.assertIn(self.xml(again), [self.xml(one.find("INSTANCE")) for one in listed])
            self.assertEqual(len(self.class_call("EnumerateInstanceNames", VENDOR, class_name)),
                             len(listed))
            self.check_far_end(reference, drive)

    def check_far_end(self, reference, near):
        """From the other end of an association one comes back to this one."""
        ends = [self.xml(name) for name in
                reference.findall("INSTANCE/PROPERTY.REFERENCE/VALUE.REFERENCE//INSTANCENAME")]
        self.assertEqual(len(ends), 2)
        far = next(end for end in ends if end != self.xml(near))
        names = self.call("AssociatorNames", VENDOR, ObjectName=far)
        self.assertIn(self.xml(near), [self.xml(path.find("INSTANCEPATH/INSTANCENAME"))
                                       for path in names])

    def test_unknown_classes_of_associations_are_refused(self):
        drive = self.xml(self.class_call("EnumerateInstanceNames", VENDOR, "CIM_DiskDrive")[0])
        nothing = '<CLASSNAME NAME="CIM_Nothing" />'
        for method, parameter in (("Associators", "AssocClass"), ("Associators", "ResultClass"),
                                  ("AssociatorNames", "AssocClass"), ("References", "ResultClass"),
                                  ("AssociatorNames", "ResultClass"),
                                  ("ReferenceNames", "ResultClass")):
            self.assert_status(4, method, VENDOR, ObjectName=drive, **{parameter: nothing})

    def test_invalid_answers_would_be_seen(self):
        self.assertIn("CIM", invalidity(b"<CIM/>"))
        self.assertNotEqual(invalidity(b"<CIM"), "")


if __name__ == "__main__":
    unittest.main(verbosity=2)
